#!/usr/bin/env python3
"""THIRD-PARTY-NOTICES names all that is linked, included or embedded, and debian/control builds with it.

notices.py SOURCE_FOLDER PROGRAM_OR_LIBRARY...
"""
import pathlib
import re
import subprocess
import sys

source = pathlib.Path(sys.argv[1])
notices = (source / "THIRD-PARTY-NOTICES").read_text()
wrong = []


def told(key: str) -> set[str]:
    return set(re.findall(rf"^{key}: (\S+)$", notices, re.M))


# What every C++ program has, and our own.
plain = re.compile(r"lib(obd|velmora|stdc\+\+|m|gcc_s|c|asan|ubsan|tsan|pthread)\.so|ld-linux")
linked = set()
for file in sys.argv[2:]:
    dynamic = subprocess.run(["readelf", "-d", file], check=True, capture_output=True, text=True).stdout
    linked |= {name for name in re.findall(r"NEEDED.*\[(.*)\]", dynamic) if not plain.match(name)}
wrong += [f"{name} is linked, but no notice names it" for name in linked
          if re.sub(r"\.so.*", ".so", name) not in told("Library")]

included = set()
for folder in ("common", "libobd", "libvelmora", "program", "simulator", "bindings", "tools"):
    for file in (source / folder).rglob("*"):
        if file.suffix in (".h", ".cpp"):
            included |= set(re.findall(r'#include <((?:asio|boost|CLI|fmt|nlohmann|toml\+\+|pybind11|systemd|qrcodegen|'
                                       r'sqlite3|mosquitto|curses|ncurses|curl|openssl|muParser|httplib)[^>/]*)',
                                       file.read_text(errors="replace")))
roots = {re.sub(r"\.hpp$", "", name) for name in included}
wrong += [f"<{name}> is included, but no notice names it" for name in roots if name not in told("Headers")]

# Files of others that are embedded: CMake finds them where their packages have put them.
embedded = set()
for file in [*source.glob("*/CMakeLists.txt"), *source.glob("*/*/CMakeLists.txt"), *source.glob("*/*/*/CMakeLists.txt")]:
    embedded |= set(re.findall(r"^find_file\(\w+ (\S+) PATHS (/usr/\S+) REQUIRED\)", file.read_text(), re.M))
for name, folder in embedded:
    owner = subprocess.run(["dpkg", "-S", f"{folder}/{name}"], capture_output=True, text=True).stdout.split(":")[0]
    if owner not in told("Debian"):
        wrong.append(f"{folder}/{name} of the package \"{owner}\" is embedded, but no notice names it")
    # What a script holds of others begins with a banner of theirs.
    if name.endswith(".js"):
        banners = re.findall(r"/\*!\s*\*?\s*(\S+)", pathlib.Path(folder, name).read_text()) or ["nobody's banner"]
        wrong += [f"{folder}/{name} holds {part}, but no notice names it" for part in banners if f"\n{part}\n" not in notices]

# The packages that the build wants, but for tools.
lists = re.findall(r"^build_packages\+?=\(([^)]*)\)", (source / "scripts/lib.sh").read_text(), re.M)
packages = set(" ".join(lists).split()) - {"g++", "cmake", "ninja-build", "libpython3-dev", "python3-dev"}
wrong += [f"{name} is built with, but no notice names it" for name in packages - told("Debian")]
control = (source / "debian/control").read_text()
depends = set(re.findall(r"[a-z0-9][a-z0-9.+-]+", control[control.index("Build-Depends:"):control.index("Standards-Version")]))
wrong += [f"debian/control does not build with {name}" for name in told("Debian") | packages if name not in depends]

print("\n".join(wrong))
print(f"{len(linked)} libraries, {len(roots)} headers, {len(embedded)} embedded files and {len(packages)} packages looked at")
sys.exit(1 if wrong or len(linked) < 4 or len(roots) < 6 or not embedded else 0)
