#!/usr/bin/env bash
# Shows that reporttexts.sh finds what it is there for: a sentence, a label, a text with a place to fill in.
set -euo pipefail
here=$(realpath "$(dirname "$0")")
tree=$(mktemp -d)
trap 'rm -rf "$tree"' EXIT
mkdir "$tree/libvelmora"
cp -r "$here/../../libvelmora/report" "$here/../../libvelmora/history" "$tree/libvelmora"
"$here/reporttexts.sh" "$tree"
for text in 'nothing is wrong' 'Findings' '{} codes are stored' '<p>more than a tag</p>'; do
    cp "$here/../../libvelmora/report/document/reportdocument.cpp" "$tree/libvelmora/report/document/"
    echo "char const* const added = \"$text\";" >>"$tree/libvelmora/report/document/reportdocument.cpp"
    if "$here/reporttexts.sh" "$tree" >"$tree/said"; then
        echo "not found: $text"
        exit 1
    fi
done
