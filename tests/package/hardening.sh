#!/usr/bin/env bash
# Reads from programs and libraries that they are hardened:
#   hardening.sh FORTIFIED|PLAIN FILE...
# FORTIFIED ones are of an optimised build without sanitizers.
set -euo pipefail
kind=$1
shift
wrong=0

complain() {
    echo "$file: $*"
    wrong=1
}

for file in "$@"; do
    readelf -hW "$file" | grep -qE 'Type: +DYN' || complain "is not position independent"
    dynamic=$(readelf -dW "$file")
    segments=$(readelf -lW "$file")
    symbols=$(nm -D --undefined-only "$file")
    [[ $file == *.so* ]] || grep -qE 'FLAGS_1.*PIE' <<<"$dynamic" || complain "is no position independent program"
    grep -qE '(FLAGS_1.*NOW|BIND_NOW)' <<<"$dynamic" || complain "is not bound at its start"
    grep -q GNU_RELRO <<<"$segments" || complain "has relocations that can be written to"
    grep -qE 'GNU_STACK.* RW ' <<<"$segments" || complain "has a stack that can be executed"
    grep -q __stack_chk_fail <<<"$symbols" || complain "has unguarded stacks"
    [[ $kind == PLAIN ]] || grep -qE '_chk(@|$)' <<<"$(grep -v __stack_chk <<<"$symbols")" || complain "has no fortified call"
done
exit $wrong
