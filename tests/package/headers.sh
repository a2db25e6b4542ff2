#!/usr/bin/env bash
# Every installed header compiles as the only one of a file, with nothing else of this tree in reach.
#   headers.sh INCLUDE_FOLDER WORK_FOLDER COMPILER
# What compiled once is not tried again until a header changes.
set -euo pipefail
stamp=$(realpath "$2")/headers.passed
cd "$1"

mapfile -t headers < <(find . -name '*.h' -printf '%P\n' | sort)
[[ ${#headers[@]} -ge 50 ]] || { echo "only ${#headers[@]} headers are installed in $1"; exit 1; }

seen=$(echo "$3"; sha256sum "${headers[@]}")
if [[ ! -e $stamp || $(<"$stamp") != "$seen" ]]; then
    printf '%s\0' "${headers[@]}" | xargs -0 -P "$(nproc)" -I '{}' sh -c \
        'echo "#include <{}>" | '"'$3'"' -std=c++20 -x c++ -fsyntax-only -Wall -Wextra -Wpedantic -Werror -I . -'
    echo "$seen" >"$stamp"
fi
echo "${#headers[@]} headers stand alone"
