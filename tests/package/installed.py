"""An installed library, as its users meet it: where pkg-config and CMake find it, and applications
built against it and run."""
import sys
from pathlib import Path

SOURCE = Path(__file__).resolve().parents[2]
sys.path.append(str(SOURCE / "tests/programs"))
from programs import as_windows, run  # noqa: E402  pylint: disable=wrong-import-position

CONSUMER = SOURCE / "tests/package/consumer"
WARNINGS = ["-Wall", "-Wextra", "-Wpedantic", "-Wconversion", "-Wshadow", "-Werror"]


class Installed:
    """The library below `prefix`, or where the system has it when that is None. `root` is a folder
    for what is built; `emulator` runs a Windows program."""

    def __init__(self, root, prefix=None, cc="cc", toolchain=None, emulator=None):
        self.root, self.prefix, self.cc = root, prefix, cc
        # What tells CMake the compiler, and the platform with it.
        self.compiler = ["--toolchain", toolchain] if toolchain else [f"-DCMAKE_C_COMPILER={cc}"]
        self.emulator = [emulator] * bool(emulator)
        root.mkdir(parents=True, exist_ok=True)

    def run_program(self, program, *words):
        env = {"LD_LIBRARY_PATH": str(self.prefix / "lib"),
               "WINEPATH": as_windows(self.prefix / "bin")} if self.prefix else {}
        return run(*self.emulator, program, *words, env=env, cwd=self.root)

    def pkg_config(self, *words):
        env = {"PKG_CONFIG_LIBDIR": str(self.prefix / "lib/pkgconfig")} if self.prefix else None
        return run("sh", "-c", r"""eval "printf '%s\n' $(pkg-config "$@")" """, "sh", *words, "zarvo",
                   env=env).splitlines()

    def compile(self, source, *words):
        """The program that a C99 source becomes with these words at the end of the command."""
        program = self.root / (source.stem + ".exe")
        run(self.cc, "-std=c99", *WARNINGS, source, "-o", program, *words)
        return program

    def build_with_cmake(self, source, *definitions):
        """Builds a project that finds the package; gives its folder of programs."""
        build = self.root / source.name
        place = [f"-DCMAKE_PREFIX_PATH={self.prefix}", f"-DCMAKE_FIND_ROOT_PATH={self.prefix}"]
        run("cmake", "--fresh", "-S", source, "-B", build, "-G", "Ninja", *place * bool(self.prefix),
            *self.compiler, *definitions)
        run("cmake", "--build", build)
        return build / "bin"

    def expect_consumers(self, case):
        """The sample application in each way that it finds the library, inside it or beside it."""
        for inside in ["--static"], []:
            program = self.compile(CONSUMER / "consumer.c", *["-static"] * len(inside),
                                   *self.pkg_config(*inside, "--cflags", "--libs"))
            case.assertEqual(self.run_program(program), "consumer: ok\n")
            if inside:
                case.assertNotRegex(program.read_bytes(), rb"libzarvo\.so|zarvo\.dll")
        self.expect_cmake_consumers(case)

    def expect_cmake_consumers(self, case, *definitions):
        programs = self.build_with_cmake(CONSUMER, *definitions)
        found = [self.run_program(program) for program in programs.iterdir()
                 if program.suffix in ("", ".exe")]
        case.assertEqual(found, ["consumer: ok\n"] * 4)
