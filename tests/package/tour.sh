#!/usr/bin/env bash
# Each program that the guided tour shows is one that the tests build and run: tour.sh SOURCE_FOLDER
set -euo pipefail
cd "$1"
here=tests/package
wrong=0
mapfile -t programs < <(sed -n 's/^\\include //p' docs/api/tour.md)
[[ ${#programs[@]} -ge 11 ]] || { echo "the tour shows ${#programs[@]} programs"; exit 1; }
for program in "${programs[@]}"; do
    [[ -e examples/$program ]] || { echo "$program is not there"; wrong=1; continue; }
    case $program in
    car/*) name=$(basename "$program" .cpp) && grep -qE '"\$2/'"$name\"" $here/runcar.sh ;;
    c/*) grep -q "examples/$program" $here/cface.sh ;;
    */main.cpp) grep -qE "EXAMPLE=${program%/*} " $here/CMakeLists.txt ;;
    *) false ;;
    esac || { echo "no test runs $program"; wrong=1; }
done
exit $wrong
