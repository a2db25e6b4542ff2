#!/usr/bin/env bash
# Installs the Python package by pip into a fresh environment, without the network, from what is built already:
#   pip.sh SOURCE BUILD LIBRARIES PYTHON WORK_FOLDER
# With an empty BUILD, pip builds all of it, which takes minutes; nothing beside the package is needed then.
set -euo pipefail
unset PYTHONPATH
work=$5/pip
rm -rf "$work"
env -u LD_PRELOAD "$4" -m venv "$work"
env -u LD_PRELOAD VELMORA_BUILD_FOLDER="$2" "$work/bin/pip" install -q --no-index --disable-pip-version-check "$1"
cd "$work"
said=$(LD_LIBRARY_PATH=$3 "$work/bin/python" -c 'import velmora; print(velmora.__file__, velmora.explain("P0420"))')
echo "$said"
[[ $said == "$work"/*velmora/__init__.py\ P0420\ Catalyst* ]]

# What the same sources make is the same: all in the archives has the time that is told.
if git -C "$1" rev-parse --git-dir >/dev/null 2>&1; then
    PYTHONPATH=$1/bindings/python SOURCE_DATE_EPOCH=1700000000 env -u LD_PRELOAD "$4" -B -c 'import struct, sys, tarfile, wheel_of_cmake
name = wheel_of_cmake.build_sdist(sys.argv[1])
assert struct.unpack("<I", open(name, "rb").read(8)[4:])[0] == 1700000000
entries = tarfile.open(name).getmembers()
assert len(entries) > 1000 and {(each.mtime, each.uid, each.uname) for each in entries} == {(1700000000, 0, "")}
names = [each.name for each in entries[:-1]]
assert names == sorted(names) and entries[-1].name.endswith("/PKG-INFO")' .
fi
[[ $(env -u LD_PRELOAD "$work/bin/pip" list --format=freeze --disable-pip-version-check) == *velmora==* ]]
