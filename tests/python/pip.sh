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
[[ $(env -u LD_PRELOAD "$work/bin/pip" list --format=freeze --disable-pip-version-check) == *velmora==* ]]
