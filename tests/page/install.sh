#!/usr/bin/env bash
# Installs what npm brings for the tests of report and page, as the lockfile names it, into a folder; once for each
# lockfile, however many tests ask for it at a time.
#   install.sh FOLDER
set -euo pipefail
here=$(dirname "$(realpath "$0")")
mkdir -p "$1"
cd "$1"
exec 9>.lock
flock 9
cmp -s "$here/package-lock.json" installed-lock.json && exit 0
cp "$here/package.json" "$here/package-lock.json" .
npm ci --ignore-scripts --no-audit --no-fund
cp package-lock.json installed-lock.json
