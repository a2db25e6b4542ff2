#!/usr/bin/env bash
# Checks that the files, folders and headers that the guides name are there. Prints each that is not.
#   places.sh SOURCE_FOLDER GUIDE...
set -euo pipefail
cd "$1"
shift
wrong=0
for guide in "$@"; do
    found=0
    # Paths from the root, which begin with one of its folders.
    while read -r path; do
        found=$((found + 1))
        [[ -e ${path%%\**} ]] || { echo "$guide names $path, which is not there"; wrong=1; }
    done < <(grep -oE '`(bindings|common|docs|examples|fuzz|libobd|libvelmora|program|scripts|simulator|tests|tools)/[^` ]*`' "$guide" | tr -d '\`')
    # Public headers; what is generated or stands with the C face is elsewhere.
    while read -r header; do
        found=$((found + 1))
        compgen -G "lib*/include/$header" >/dev/null || compgen -G "bindings/c/include/$header" >/dev/null ||
            [[ -e lib${header%%/*}/version.h.in && $header == */version.h ]] ||
            { echo "$guide names <$header>, which is not there"; wrong=1; }
    done < <(grep -oE '<(obd|tervex|velmora)/[a-z]+\.h>' "$guide" | tr -d '<>')
    [[ $found -gt 0 ]] || { echo "$guide names no place"; wrong=1; }
done
exit $wrong
