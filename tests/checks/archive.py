"""The archive is the same whenever and in whatever order it is packed, and the library carries it in a section that is
not loaded, also when it is installed and stripped. Arguments: the build folder, the packer, the library's file name."""
import os
import pathlib
import re
import subprocess
import sys
import tempfile
import zipfile




def run(*command):
    return subprocess.run(command, check=True, stdout=subprocess.PIPE, text=True).stdout


build, packer, library = pathlib.Path(sys.argv[1]), *sys.argv[2:]
archive = build / "resources" / "archive.zip"
with tempfile.TemporaryDirectory() as folder:
    here = pathlib.Path(folder)
    with zipfile.ZipFile(archive) as entries:
        names = entries.namelist()
        assert names == sorted(names) and len(set(names)) == len(names), names
        for info in entries.infolist():
            assert info.compress_type == (zipfile.ZIP_DEFLATED if info.file_size else zipfile.ZIP_STORED), info
        assert entries.read("tessella.msg") == b""
        languages = entries.read("locales").decode()
        assert languages == "en,cs,da,de,es_ES,fr,ko,it,hu,nl,ja,pl,pt,pt_BR,ru,tr,zh,zh_TW", languages
        folders = {name.split("/")[0] for name in names if "/" in name}
        assert folders <= set(languages.split(",")[1:]) and {f"{name}/" for name in folders} <= set(names), names
        entries.extractall(here)

    files = [name for name in names if not name.endswith("/")]
    for name in files:
        os.utime(here / name, (10**9, 10**9))
    run(packer, here / "again.zip", *(f"{name}={here / name}" for name in reversed(files)))
    assert (here / "again.zip").read_bytes() == archive.read_bytes(), "packed again, it is another archive"

    run("cmake", "--install", build, "--prefix", here / "prefix", "--strip")
    installed = next((here / "prefix").glob(f"lib*/**/{library}"))
    run("objcopy", "--dump-section", f".zip={here / 'section.zip'}", installed, here / "copy.so")
    assert (here / "section.zip").read_bytes() == archive.read_bytes(), "the section is not the archive"
    section = re.search(r"^ *\[ *\d+\] \.zip +PROGBITS +0+ (.*)$", run("readelf", "-SW", installed), re.M)
    assert section and len(section[1].split()) == 6, "the section has flags, so that it may be loaded"
print(f"{len(files)} files")
