"""Programs as the tests run them: on this machine or, with an emulator in front, as on Windows."""
import os
import subprocess
import tempfile


def start(*command, cwd=None, env=None):
    """Exit code, output and messages of a command, line ends as on Linux. Both texts go to files: a
    pipe would stay open as long as the emulator's own processes, which outlive the program."""
    with tempfile.TemporaryFile() as output, tempfile.TemporaryFile() as messages:
        done = subprocess.run([str(word) for word in command], stdin=subprocess.DEVNULL,
                              stdout=output, stderr=messages, cwd=cwd, timeout=200, check=False,
                              env={**os.environ, "LC_ALL": "C.UTF-8", **(env or {})})
        texts = []
        for file in (output, messages):
            file.seek(0)
            texts.append(file.read().decode().replace("\r\n", "\n"))
    return (done.returncode, *texts)


def run(*command, **more):
    """The output of a command that must succeed."""
    code, output, messages = start(*command, **more)
    if code != 0:
        raise AssertionError(f"{' '.join(map(str, command))}: {code}\n{output}{messages}")
    return output


def as_windows(path):
    """A path of this machine as the emulator's programs name it."""
    return "Z:" + str(path).replace("/", "\\")


def write_files(folder, texts):
    """Files by their names below the folder."""
    for name, text in texts.items():
        (folder / name).parent.mkdir(parents=True, exist_ok=True)
        (folder / name).write_text(text)
