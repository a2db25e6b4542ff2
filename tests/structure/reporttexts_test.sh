#!/usr/bin/env bash
# Shows that reporttexts.sh finds what it is there for: a sentence, a label, a text with a place to fill in, and in the
# plain text each word.
set -euo pipefail
here=$(realpath "$(dirname "$0")")
tree=$(mktemp -d)
trap 'rm -rf "$tree"' EXIT
mkdir "$tree/libvelmora" "$tree/program"
cp -r "$here/../../libvelmora/report" "$here/../../libvelmora/history" "$tree/libvelmora"
cp -r "$here/../../program/view" "$tree/program"
"$here/reporttexts.sh" "$tree"
finds() { # finds FILE TEXT
    cp "$here/../../$1" "$tree/$1"
    echo "char const* const added = \"$2\";" >>"$tree/$1"
    if "$here/reporttexts.sh" "$tree" >"$tree/said"; then
        echo "not found in $1: $2"
        exit 1
    fi
    cp "$here/../../$1" "$tree/$1"
}
for text in 'nothing is wrong' 'Findings' '{} codes are stored' '<p>more than a tag</p>'; do
    finds libvelmora/report/document/reportdocument.cpp "$text"
    finds libvelmora/report/plain/codetext.cpp "$text"
done
for text in 'ready' '  {:<14} on\n' "{}'s, by the VIN"; do
    finds libvelmora/report/plain/readinesstext.cpp "$text"
done
