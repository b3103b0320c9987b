"""Installs the packages in a Debian that has nothing but its base, one after the other, so that what one fails to ask
for is missed; builds the README's program there as the README says, and runs it. Arguments: the build folder, a folder
that the picture is left in."""
import pathlib
import subprocess
import sys
import tempfile

from readme import PICTURE, block, compare, make_packages

# Debian's sources as this machine has them.
SOURCES = ["apt-get", "indextargets", "--format", "deb $(REPO_URI) $(RELEASE) $(COMPONENT)", "Origin: Debian",
           "Created-By: Packages"]
INSIDE = f"""
install() {{
    echo "clean_root: installing $*"
    apt-get install -qq --no-install-recommends "$@" >log 2>&1 || {{ cat log; exit 1; }}
}}
whole() {{ ! ldd "$@" | grep "not found"; }}

install ./libtessella1_*
whole /usr/lib/libtessella.so.1 /usr/lib/libbundle.so.1
install ./tessella-tools_*
whole /usr/bin/tessella-*
for tool in /usr/bin/tessella-*; do $tool --version; done
tessella-console -- tessella-doctor
install ./libtessella-dev_* g++ cmake make pkg-config
{block("sh", "pkg-config")}
{block("sh", "hello.script").replace("1024x768x16", "640x480x32")}
rm hello
cmake -S . -B built
cmake --build built
tessella-console --mode 640x480x32 --script hello.script -- built/hello
install man-db
for tool in /usr/bin/tessella-*; do man -l /usr/share/man/man1/${{tool##*/}}.1 >page; test -s page; done
apt-get purge -qq libtessella1 >log 2>&1
! find /usr -name '*tessella*' | grep .
"""

build, keep = (pathlib.Path(word).resolve() for word in sys.argv[1:])
sources = subprocess.run(SOURCES, stdout=subprocess.PIPE, text=True, check=True).stdout
with tempfile.TemporaryDirectory() as temporary:
    here = pathlib.Path(temporary)
    here.chmod(0o755)  # the base's root may be another user than we
    work = here / "work"
    work.mkdir()
    for package in make_packages(build, here):
        package.rename(work / package.name)
    (work / "hello.cpp").write_text(block("cpp"), encoding="utf-8")
    (work / "CMakeLists.txt").write_text(block("cmake"), encoding="utf-8")
    (work / "inside").write_text(INSIDE, encoding="utf-8")
    print("clean_root: installing Debian's base", flush=True)
    done = subprocess.run(["mmdebstrap", "--quiet", "--variant=minbase", f"--customize-hook=copy-in {work} /",
                           '--customize-hook=chroot "$1" sh -ec "cd /work; . ./inside"',
                           f"--customize-hook=copy-out /work/hello.png {keep}", "", "/dev/null", "-"],
                          input=sources, text=True, check=False)
    if done.returncode != 0:
        sys.exit("clean_root: failed, see above")
compare(keep / "hello.png", PICTURE)
