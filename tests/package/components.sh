#!/usr/bin/env bash
# The components of the installed package are found as they are asked for, and those of an installation are apart:
#   components.sh STAGE BUILD_FOLDER WORK_FOLDER COMPILER
set -euo pipefail
work=$3/components
rm -rf "$work"

cmake -G Ninja -S "$(dirname "$0")/components" -B "$work/find" -D CMAKE_PREFIX_PATH="$1" -D CMAKE_CXX_COMPILER="$4" >/dev/null

parts=(Runtime Development Program Sim Python)
for part in "${parts[@]}"; do
    cmake --install "$2" --prefix "$work/$part" --component "$part" >/dev/null
done
list() { (cd "$work/$1" 2>/dev/null && find . ! -type d | sort); }

# Together they are all, and nothing is in two of them.
diff <(cd "$1" && find . ! -type d ! -name unnamed | sort) <(for part in "${parts[@]}"; do list "$part"; done | sort)
! list Runtime | grep -E '\.(h|cmake|pc|so)$' || { echo "that is not for running programs"; exit 1; }
! list Development | grep -E '\.so\.[0-9]|/bin/' || { echo "that is not for building programs"; exit 1; }
[[ $(list Runtime | grep -c '\.so\.') -eq 4 && $(list Development | grep -c '\.so$') -eq 2 ]] ||
    { echo "the libraries are not where they belong"; exit 1; }
[[ $(list Program | grep '/bin/') == ./bin/velmora && $(list Sim | grep '/bin/') == ./bin/obdsim ]] ||
    { echo "the programs are not where they belong"; exit 1; }
