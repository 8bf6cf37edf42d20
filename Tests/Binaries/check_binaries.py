"""Checks the programs and libraries of a build tree, and of an installation made from it.

Usage: check_binaries.py BUILD_DIR DOCUMENT [--hardened]

No library path has an empty or relative entry: the loader would take libraries from the current directory. The
installed files are those that the document lists. With --hardened, each binary has what Docs/Architecture.md promises
for optimized builds.
"""

import pathlib
import re
import subprocess
import sys
import tempfile

PRODUCT = {"zorvatouch", "zorvatouchd", "ZorvaTouchHIDService.so", "libzorvahost.so"}


def readelf(option, file):
    return subprocess.run(["readelf", "-W", option, file], check=True, capture_output=True, text=True).stdout


def is_elf(file):
    with open(file, "rb") as stream:
        return stream.read(4) == b"\x7fELF"


def binaries(folder):
    return sorted(
        file for place in ("bin", "lib") for file in (folder / place).rglob("*")
        if file.is_file() and not file.is_symlink() and is_elf(file))


def path_faults(dynamic):
    """Entries of the library path that are not absolute or relative to the file itself."""
    for path in re.findall(r"\((?:RPATH|RUNPATH)\).*\[(.*)\]", dynamic):
        for entry in path.split(":"):
            if not entry.startswith(("/", "$ORIGIN/")) and entry != "$ORIGIN":
                yield f"library path [{path}] has the entry '{entry}'"


def hardening_faults(file, dynamic):
    if "GNU_RELRO" not in readelf("-l", file):
        yield "has no RELRO segment"
    if not re.search(r"\(FLAGS\).*BIND_NOW|\(FLAGS_1\).*NOW", dynamic):
        yield "binds symbols lazily"
    if "DYN (" not in readelf("-h", file):
        yield "is not position-independent"
    if "__stack_chk_fail" not in readelf("--dyn-syms", file):
        yield "has no stack protector"


def calls_fortified_functions(file):
    return re.search(r"__\w+_chk\b", readelf("--dyn-syms", file)) is not None


def list_faults(document, prefix):
    """Differences between the document's list, a block of paths with what they are for, and what is installed."""
    text = document.read_text(encoding="utf-8")
    listed = re.findall(r"^((?:bin|include|lib)/\S+)  ", text, re.MULTILINE)
    installed = [str(file.relative_to(prefix)) for file in prefix.rglob("*") if not file.is_dir()]
    yield from (f"{document}: {name} is not installed" for name in listed if not (prefix / name).exists())
    for name in installed:
        if not any(name == place or name.startswith((place if place.endswith("/") else place + ".")) for place in listed):
            yield f"{document}: {name} is installed and not listed"


def self_test():
    """The checks find what they are for."""
    line = " 0x000000000000001d (RUNPATH)            Library runpath: [%s]\n"
    assert list(path_faults(line % "$ORIGIN/../lib")) == []
    assert len(list(path_faults(line % "$ORIGIN/../lib:"))) == 1
    assert len(list(path_faults(line % "lib:/usr/lib"))) == 1


def main():
    self_test()
    build, document = map(pathlib.Path, sys.argv[1:3])
    faults = []
    with tempfile.TemporaryDirectory() as prefix:
        subprocess.run(["cmake", "--install", build, "--prefix", prefix], check=True, capture_output=True)
        built, installed = binaries(build), binaries(pathlib.Path(prefix))
        faults += list_faults(document, pathlib.Path(prefix))
        names = {file.name.split(".so.")[0] + (".so" if ".so." in file.name else "") for file in installed}
        if names != PRODUCT:
            faults.append(f"installed: {sorted(names)}, expected {sorted(PRODUCT)}")
        for file in built + installed:
            dynamic = readelf("-d", file)
            faults += [f"{file}: {fault}" for fault in path_faults(dynamic)]
            if "--hardened" in sys.argv and file in installed:
                faults += [f"{file}: {fault}" for fault in hardening_faults(file, dynamic)]
        # The plug-in alone copies nothing whose size FORTIFY could check.
        if "--hardened" in sys.argv and not any(calls_fortified_functions(file) for file in installed):
            faults.append("no installed file calls a function that FORTIFY checks")
    print("\n".join(faults) or f"{len(built)} built and {len(installed)} installed files.")
    sys.exit(1 if faults else 0)


main()
