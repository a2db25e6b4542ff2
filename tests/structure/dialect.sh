#!/usr/bin/env bash
# Checks what the formatter can't of how C++ is written here: const stands behind what it is of. Prints each line where it
# stands before.
#   dialect.sh SOURCE_FOLDER
set -euo pipefail
cd "$1"
mapfile -t folders < <(ls -d bench bindings common examples fuzz libobd libvelmora program simulator tests tools 2>/dev/null)
# Behind what can't be the end of a type; a line of text or comment may say what it likes.
before='^[^"]*?(?:^|[({<,;]|\b(?:static|constexpr|inline|return|mutable|thread_local))\s*\Kconst (?!override\b|noexcept\b|final\b)[A-Za-z_:]'
found=$(grep -rnP --include='*.cpp' --include='*.h' --include='*.inc' "$before" "${folders[@]}" | grep -vE '^[^:]*:[0-9]+: *(//|\*)' |
    grep -vE '//.*\bconst ' || true)
[[ -z $found ]] || { echo "$found"; echo "const stands behind the type here: T const&"; exit 1; }
