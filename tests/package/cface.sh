#!/usr/bin/env bash
# Builds the C example and the test of the C face with nothing but pkg-config and a C compiler, and runs them:
#   cface.sh STAGE WORK_FOLDER SOURCE_FOLDER SANITIZERS [--static]
# With --static, what is installed are static libraries; the example alone is built, and the prefix, which is large, stays.
set -euo pipefail
export XDG_CONFIG_HOME=/proc/nonexistent
work=$2/cface
rm -rf "$work"
mkdir -p "$work"
prefix=$1
if [[ -z ${5:-} ]]; then
    prefix=$work/prefix
    cp -a "$1" "$prefix"
fi

fail() {
    echo "$*" >&2
    exit 1
}

PKG_CONFIG_PATH=$(dirname "$(find "$prefix" -name velmora.pc)")
export PKG_CONFIG_PATH
pkg-config --validate obd velmora
[[ $(pkg-config --variable=libdir velmora) -ef $(dirname "$(find "$prefix" -name 'libvelmora.[as]*' -print -quit)") ]] ||
    fail "velmora.pc tells $(pkg-config --variable=libdir velmora)"
read -ra package < <(pkg-config ${5:-} --cflags --libs velmora)
flags=(-std=c99 -D_POSIX_C_SOURCE=200112L -Wall -Wextra -pedantic -Werror "-Wl,-rpath,$(pkg-config --variable=libdir velmora)")
[[ -z $4 ]] || flags+=("-fsanitize=$4")
cc "${flags[@]}" "$3/examples/c/car.c" "${package[@]}" -o "$work/car"

said=$("$work/car" 'sim:petrol-can11?instant' P0420)
echo "$said"
[[ $said =~ 7E8\ ECM.*Engine\ RPM:\ [1-9][0-9]*\ rpm.*7E8\ P0171\ .*P0420\ Generic:\ Catalyst ]] || fail "car says too little"
status=0
"$work/car" sim:no-such-car 2>"$work/said" || status=$?
[[ $status -eq 3 && -s $work/said ]] || fail "there is no such car, but car ended with $status"

[[ -z ${5:-} ]] || exit 0
cc "${flags[@]}" "$3/tests/package/cface.c" "${package[@]}" -pthread -lm -o "$work/cface"
"$work/cface"
