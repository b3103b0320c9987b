"""Builds the README's program as the README says, against an installed tree and the one that the packages have, with
CMake and with pkg-config, and runs both on the virtual console. Argument: the build folder."""
import os
import pathlib
import re
import subprocess
import sys
import tempfile

from tree import ROOT

sys.path.append(str(ROOT / "tests" / "realconsole"))
from picture import read_png  # noqa: E402

# At the frame's inner edge on the left and on the right, one pixel on either side; the diagonal's first pixel.
POINTS = [(15, 16), (16, 16), (623, 463), (624, 463), (32, 32)]
PICTURE = ["2060A0", "000000", "000000", "2060A0", "FFD040"]
CONSOLE_TEST = "enable_testing()\ntessella_add_console_test(NAME shown PROGRAM hello SCRIPT shown.script MODE 640x480x32)"
CLEARED = ["000000"] * len(POINTS)


def block(language, containing=""):
    """The README's one code block of a language that contains a text."""
    blocks = re.findall(rf"^```{language}\n(.*?)^```$", (ROOT / "README.md").read_text(encoding="utf-8"), re.M | re.S)
    found = [text for text in blocks if containing in text]
    assert len(found) == 1, f"{len(found)} {language} blocks with '{containing}' in the README"
    return found[0]


def compare(picture, colours):
    """The colours of a picture at the points."""
    screen = read_png(picture)
    found = [screen.at(y * screen.width + x) for x, y in POINTS]
    assert found == colours, f"{picture}: {found} instead of {colours}"


def run(*command, **options):
    print("+", *command, flush=True)
    subprocess.run(command, check=True, **options)


def installed(build, folder):
    """A tree as the README installs it."""
    run("cmake", "--install", build, "--prefix", folder / "installed", stdout=subprocess.DEVNULL)
    return folder / "installed"


def make_packages(build, folder):
    run("cpack", "--config", build / "CPackConfig.cmake", "-B", folder / "packages", cwd=build, stdout=subprocess.DEVNULL)
    packages = sorted((folder / "packages").glob("*.deb"))
    assert [one.name.split("_")[0] for one in packages] == ["libtessella-dev", "libtessella1", "tessella-tools"]
    return packages


def packaged(build, folder):
    """A tree as the packages have it."""
    for package in make_packages(build, folder):
        run("dpkg-deb", "--extract", package, folder / "root")
    return folder / "root" / "usr"


def check(prefix, here):
    """Builds and runs the program in an empty folder, against the tree."""
    here.mkdir()
    for name in ("common", "file"):
        assert not (prefix / "include" / name).exists(), f"{name} is not for applications"
    for tool in (prefix / "bin").iterdir():
        assert (prefix / "share" / "man" / "man1" / f"{tool.name}.1").exists(), f"{tool.name} has no manual page"

    (here / "hello.cpp").write_text(block("cpp"), encoding="utf-8")
    (here / "CMakeLists.txt").write_text(block("cmake") + CONSOLE_TEST, encoding="utf-8")
    (here / "shown.script").write_text("expect shown.png\nkeys 1c\n", encoding="utf-8")
    strict = "-Wall -Wextra -Wpedantic -Wshadow -Werror"
    run("cmake", "-G", "Ninja", "-S", here, "-B", here / "by_cmake", f"-DCMAKE_PREFIX_PATH={prefix}",
        f"-DCMAKE_CXX_FLAGS={strict}", "-DCMAKE_FIND_USE_PACKAGE_REGISTRY=OFF", stdout=subprocess.DEVNULL)
    for target in ("all", "shown-bless", "test"):
        run("cmake", "--build", here / "by_cmake", "--target", target, stdout=subprocess.DEVNULL)

    environment = dict(os.environ, PKG_CONFIG_PATH=str(next(prefix.glob("lib*/**/pkgconfig"))))
    run("sh", "-ec", block("sh", "pkg-config"), cwd=here, env=environment)

    libraries = next(prefix.glob("lib*/**/libtessella.so.1")).parent
    for program, extra in ((here / "by_cmake" / "hello", {}), (here / "hello", {"LD_LIBRARY_PATH": str(libraries)})):
        (here / "script").write_text("settle\nscreenshot shown.png\nkeys 1c\n", encoding="utf-8")
        run(prefix / "bin" / "tessella-console", "--mode", "640x480x32", "--screenshot", "left.png",
            "--script", "script", "--", program, cwd=here, env=dict(os.environ, **extra))
        compare(here / "shown.png", PICTURE)
        compare(here / "left.png", CLEARED)


if __name__ == "__main__":
    with tempfile.TemporaryDirectory() as temporary:
        base = pathlib.Path(temporary)
        for tree in (installed, packaged):
            check(tree(pathlib.Path(sys.argv[1]), base), base / f"hello_{tree.__name__}")
