#!/usr/bin/env bash
# Every symbol that an installed library exports is named in an installed header:
#   symbols.sh STAGE
set -euo pipefail
shopt -s nullglob
words=$(find "$1/include/velmora" -name '*.h' -exec cat {} + | grep -oE '[A-Za-z_][A-Za-z0-9_]*' | sort -u)
wrong=0
libraries=("$1"/lib*/libobd.so "$1"/lib*/*/libobd.so "$1"/lib*/libvelmora.so "$1"/lib*/*/libvelmora.so)
[[ ${#libraries[@]} -eq 2 ]] || { echo "found ${libraries[*]}"; exit 1; }
for library in "${libraries[@]}"; do
    # The class of each symbol, or the function of a namespace.
    names=$(nm -DC --defined-only "$library" | cut -d' ' -f3- | sed -E 's/^(non-virtual|virtual|covariant) thunk to //; s/^(typeinfo name|typeinfo|vtable|VTT|guard variable) for //; s/\[abi:[a-z0-9]+\]//g' |
        grep -oE '\b(obd|tervex|velmora)::([a-z]+::)?[A-Za-z_][A-Za-z0-9_]*' | sed 's/.*:://' | sort -u)
    [[ $(wc -l <<<"$names") -ge 5 ]] || { echo "$library exports too little"; exit 1; }
    comm -23 <(echo "$names") <(echo "$words") | sed "s|^|${library##*/} exports what no header names: |" >"$1/unnamed"
    cat "$1/unnamed"
    [[ ! -s "$1/unnamed" ]] || wrong=1
    # C functions stand in the header, and in the version script one by one.
    while read -r name; do
        grep -qx "${name%@@*}" <<<"$words" || { echo "${library##*/} exports $name, which no header names"; wrong=1; }
        [[ $name == *@@VELMORA_1 ]] || { echo "$name has no version"; wrong=1; }
    done < <(nm -D --defined-only "$library" | awk '$3 ~ /^velmora_/ {print $3}')
    if nm -D --defined-only "$library" | awk '$2 != "A" && $3 !~ /@@?(OBD_0|VELMORA_1|VELMORA_CXX_0)$/' | grep .; then
        echo "${library##*/} exports that without a version"
        wrong=1
    fi
    if nm -DC --defined-only "$library" | grep -qE ' [A-Za-z] (std|fmt|toml|nlohmann|obdsim|boost)::'; then
        echo "${library##*/} exports what is not its own"
        wrong=1
    fi
done
# What the C header declares is there.
companion=$(nm -D --defined-only "${libraries[1]}" | awk '{sub(/@@.*/, "", $3); print $3}')
declared=$(grep -oE '\bvelmora_[a-z_]+\(' "$1/include/velmora/velmora/velmora.h" | tr -d '(' | sort -u)
[[ $(wc -l <<<"$declared") -ge 20 ]] || { echo "velmora.h declares too little"; exit 1; }
while read -r name; do
    grep -qx "$name" <<<"$companion" || { echo "velmora.h declares $name, which is not exported"; wrong=1; }
done <<<"$declared"
exit $wrong
