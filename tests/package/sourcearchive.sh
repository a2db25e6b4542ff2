#!/usr/bin/env bash
# The source archive has what the tree has, configures where it was unpacked, and makes the same archive again there:
#   sourcearchive.sh SOURCE_FOLDER BUILD_FOLDER WORK_FOLDER COMPILER
set -euo pipefail
export SOURCE_DATE_EPOCH=1700000000
work=$3/sourcearchive
rm -rf "$work"
mkdir -p "$work/elsewhere"

cpack --config "$2/CPackSourceConfig.cmake" -B "$work/first" >"$work/said" || { cat "$work/said"; exit 1; }
archives=("$work"/first/velmora-*.tar.gz)
tar -xzf "${archives[0]}" -C "$work/elsewhere" --strip-components=1

cd "$work/elsewhere"
[[ -x scripts/test && -s CMakeLists.txt && -s debian/control ]] || { echo "the archive is not whole"; exit 1; }
if [[ -e $1/.git ]]; then
    diff <(cd "$1" && git ls-files --cached --others --exclude-standard | while read -r file; do
        [[ ! -e $file ]] || echo "$file"
    done | sort) <(find . -type f -printf '%P\n' | sort) || { echo "the archive (>) is not the tree (<)"; exit 1; }
fi

find . -exec touch -d @1600000000 {} + # other times than in the archive
cmake -G Ninja -S . -B "$work/build" -D CMAKE_CXX_COMPILER="$4" -D VELMORA_PYTHON=OFF >"$work/said" ||
    { cat "$work/said"; exit 1; }
cpack --config "$work/build/CPackSourceConfig.cmake" -B "$work/second" >"$work/said" || { cat "$work/said"; exit 1; }
cmp "${archives[0]}" "$work/second/$(basename "${archives[0]}")"
