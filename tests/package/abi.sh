#!/usr/bin/env bash
# The guard of the ABI stops what breaks programs, and only that:
#   abi.sh SOURCE_FOLDER WORK_FOLDER COMPILER
# It looks at stand-ins for the two libraries: to build those with debug information takes minutes.
set -euo pipefail
guard=$1/scripts/abi
work=$2/abi
compiler=$3
version=$(sed -n 's/^project(velmora VERSION \([0-9.]*\).*/\1/p' "$1/CMakeLists.txt")
wrong=0
rm -rf "$work"
mkdir -p "$work/include" "$work/dumps"

cat >"$work/include/shown.h" <<'END'
class Hidden;
struct Shown {
    int first;
    Hidden* hidden;
};
struct __attribute__((visibility("default"))) Base {
    virtual ~Base();
    virtual int told() const;
};
namespace room {
class Passed {
public:
    virtual ~Passed() = default;
    virtual int asked() = 0;
};
} // namespace room
END
cat >"$work/plain.cpp" <<'END'
#include "shown.h"
#define SHOWN __attribute__((visibility("default")))
class Hidden {
public:
    int inner;
};
Base::~Base() = default;
int Base::told() const { return 1; }
SHOWN int sum(Shown const& shown) { return shown.first + shown.hidden->inner; }
SHOWN room::Passed* passed(room::Passed* passed) { return passed; }
SHOWN int twice(int number) { return 2 * number; }
END

# make NAME LIBRARY [FLAG...]: that library of the stand-in NAME, of its own header and source where these are there.
make() {
    local folder=$work/$1 name=$2
    shift 2
    mkdir -p "$folder/$name"
    [[ -e $folder/include/shown.h ]] || cp -r "$work/include" "$folder/"
    [[ -e $folder/plain.cpp ]] || cp "$work/plain.cpp" "$folder/"
    "$compiler" -std=c++20 -O1 -fPIC -shared -fvisibility=hidden "${@:--g}" -I "$folder/include" "$folder/plain.cpp" \
        -o "$folder/$name/$name.so.$version"
}

# changed NAME FILE EXPRESSION: a stand-in whose companion is made with that change of a file.
changed() {
    mkdir -p "$work/$1/include"
    cp "$work/include/shown.h" "$work/$1/include/"
    cp "$work/plain.cpp" "$work/$1/"
    sed -i -E "$3" "$work/$1/$2"
    ! cmp -s "$work/$1/$2" "$work/$2" || { echo "$1 changes nothing"; exit 1; }
    make "$1" libvelmora
    cp -r "$work/plain/libobd" "$work/$1/"
}

# guards STATUS NAME [TEXT]: how the guard ends over a stand-in, and what it says.
guards() {
    local status=0
    "$guard" --dumps "$work/dumps" --headers "$work/$2/include" "$work/$2" >"$work/said" 2>&1 || status=$?
    [[ $status -eq $1 ]] && grep -qF -- "${3:-}" "$work/said" && return
    echo "$2 ends with $status, not $1 and \"${3:-}\":"
    cat "$work/said"
    wrong=1
}

make plain libobd
make plain libvelmora
guards 1 plain 'headers.abi.xz'
"$guard" --renew --dumps "$work/dumps" --headers "$work/include" "$work/plain"
[[ $(cd "$work/dumps" && echo *) == "headers.abi.xz libobd.abi.xz libvelmora.abi.xz" ]] || { ls "$work/dumps"; wrong=1; }
guards 0 plain 'the ABI is that of'

changed added plain.cpp '$a SHOWN int thrice(int number) { return 3 * number; }'
guards 0 added 'the ABI is that of'
changed private plain.cpp 's/int inner;/long before; int inner;/'
guards 0 private 'the ABI is that of'

changed removed plain.cpp '/int twice/d'
guards 1 removed 'twice(int)'
changed parameter plain.cpp 's/twice\(int /twice(long /'
guards 1 parameter 'twice(int)'
changed member include/shown.h 's/int first;/int first; int second;/'
guards 1 member 'second'
changed virtual include/shown.h 's/(virtual int told.*)/\1 virtual int more() const { return 2; }/'
guards 1 virtual 'more'

changed passed include/shown.h 's/(virtual int asked.*)/virtual void more() = 0; \1/'
guards 1 passed 'more'

cp -r "$work/member" "$work/nodebug"
make nodebug libvelmora -g0
guards 1 nodebug 'no debug information'
rm -r "$work/nodebug/libvelmora"
guards 1 nodebug 'is not there'
exit $wrong
