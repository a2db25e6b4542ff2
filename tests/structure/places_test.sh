#!/usr/bin/env bash
# places.sh finds what is not there, and lets pass what is.
set -euo pipefail
places=$(dirname "$(realpath "$0")")/places.sh
tree=$(mktemp -d)
trap 'rm -rf "$tree"' EXIT
mkdir -p "$tree/libobd/adapter" "$tree/libobd/include/obd"
touch "$tree/libobd/adapter/elm.cpp" "$tree/libobd/include/obd/car.h"
cat >"$tree/good.md" <<'END'
`libobd/adapter/`, `libobd/adapter/elm.cpp`, <obd/car.h>, and `Car::read` is no place
END
cat >"$tree/bad.md" <<'END'
`libobd/adapter/gone.cpp` and <obd/gone.h>
END
echo "nothing" >"$tree/empty.md"
"$places" "$tree" good.md
said=$("$places" "$tree" bad.md) && { echo "it passes what is not there"; exit 1; }
[[ $said == *adapter/gone.cpp* && $said == *obd/gone.h* ]] || { echo "said: $said"; exit 1; }
"$places" "$tree" empty.md >/dev/null && { echo "it passes a guide without a place"; exit 1; }
exit 0
