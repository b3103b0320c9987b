"""The archive is the same whenever and in whatever order it is packed, and the library carries it in a section that is
not loaded, also when it is installed and stripped. Arguments: the build folder, the packer, the library's file name."""
import os
import pathlib
import re
import subprocess
import sys
import tempfile
import zipfile

build, packer, library = pathlib.Path(sys.argv[1]), *sys.argv[2:]
archive = (build / "resources" / "archive.zip").read_bytes()
with tempfile.TemporaryDirectory() as folder, zipfile.ZipFile(build / "resources" / "archive.zip") as entries:
    here = pathlib.Path(folder)
    for info in entries.infolist():
        assert info.compress_type == (zipfile.ZIP_DEFLATED if info.file_size else zipfile.ZIP_STORED), info
    files = [name for name in reversed(entries.namelist()) if not name.endswith("/")]
    for name in files:
        os.utime(entries.extract(name, here), (10**9, 10**9))
    subprocess.run([packer, here / "again.zip", *(f"{name}={here / name}" for name in files)], check=True)
    assert (here / "again.zip").read_bytes() == archive, "packed again, it is another archive"

    subprocess.run(["cmake", "--install", build, "--prefix", here, "--strip"], check=True, stdout=subprocess.DEVNULL)
    installed = next(here.glob(f"lib*/**/{library}"))
    subprocess.run(["objcopy", "--dump-section", f".zip={here / 'section.zip'}", installed, here / "copy"], check=True)
    assert (here / "section.zip").read_bytes() == archive, "the section is not the archive"
    sections = subprocess.run(["readelf", "-SW", installed], check=True, stdout=subprocess.PIPE, text=True).stdout
    assert re.search(r"\.zip +PROGBITS +0+( [0-9a-f]+){3} +0 +0 +1$", sections, re.M), "the section may be loaded"
