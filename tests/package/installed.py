"""An installed library, as its users meet it: where pkg-config and CMake find it, and applications
built against it and run."""
import sys
from pathlib import Path

SOURCE = Path(__file__).resolve().parents[2]
sys.path.append(str(SOURCE / "tests/programs"))
from programs import as_windows, run, start  # noqa: E402  pylint: disable=wrong-import-position

CONSUMER = SOURCE / "tests/package/consumer"
WARNINGS = ["-Wall", "-Wextra", "-Wpedantic", "-Wconversion", "-Wshadow", "-Werror"]


class Installed:
    """The library below `prefix`, or where the system has it when that is None. `root` is a folder
    for what is built; `emulator` runs a Windows program."""

    def __init__(self, root, prefix=None, cc="cc", toolchain=None, emulator=None):
        self.root, self.prefix, self.cc = root, prefix, cc
        self.toolchain, self.emulator = toolchain, emulator
        root.mkdir(parents=True, exist_ok=True)

    def run_program(self, program, *words, **more):
        env = {}
        if self.prefix:
            env = {"LD_LIBRARY_PATH": str(self.prefix / "lib"),
                   "WINEPATH": as_windows(self.prefix / "bin")}
        emulator = [self.emulator] if self.emulator else []
        return run(*emulator, program, *words, env=env, **{"cwd": self.root, **more})

    def pkg_config(self, *words):
        env = {"PKG_CONFIG_LIBDIR": str(self.prefix / "lib/pkgconfig")} if self.prefix else None
        return run("pkg-config", *words, "zarvo", env=env).split()

    def compile(self, source, *words):
        """The program that a C99 source becomes with these words at the end of the command."""
        program = self.root / (source.stem + ".exe")
        run(self.cc, "-std=c99", *WARNINGS, source, "-o", program, *words)
        return program

    def compiler(self):
        """What tells CMake the compiler, and the platform with it."""
        return ["--toolchain", self.toolchain] if self.toolchain else \
            [f"-DCMAKE_C_COMPILER={self.cc}"]

    def build_with_cmake(self, source, *definitions):
        """Builds a project that finds the package; gives its folder of programs."""
        build = self.root / source.name
        place = [f"-DCMAKE_PREFIX_PATH={self.prefix}", f"-DCMAKE_FIND_ROOT_PATH={self.prefix}"] \
            if self.prefix else []
        run("cmake", "--fresh", "-S", source, "-B", build, "-G", "Ninja", *place,
            *self.compiler(), *definitions)
        run("cmake", "--build", build)
        return build / "bin"

    def expect_all_consumers(self, case):
        """The sample application in each way that it finds the library, inside it or beside it."""
        inside = self.compile(CONSUMER / "consumer.c", "-static",
                              *self.pkg_config("--static", "--cflags", "--libs"))
        case.assertNotRegex(inside.read_bytes(), rb"libzarvo\.so|zarvo\.dll")
        case.assertEqual(self.run_program(inside), "consumer: ok\n")
        beside = self.compile(CONSUMER / "consumer.c", *self.pkg_config("--cflags", "--libs"))
        case.assertEqual(self.run_program(beside), "consumer: ok\n")
        self.expect_cmake_consumers(case)

    def expect_cmake_consumers(self, case, *definitions):
        programs = self.build_with_cmake(CONSUMER, *definitions)
        found = [self.run_program(program) for program in programs.iterdir()
                 if program.suffix in ("", ".exe")]
        case.assertEqual(found, ["consumer: ok\n"] * 4)
