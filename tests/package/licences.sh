#!/usr/bin/env bash
# The program prints our licence and the notices, and which parts it has:
#   licences.sh SOURCE_FOLDER VELMORA
set -euo pipefail
diff <("$2" --licenses) <(cat "$1/LICENSE"; echo; cat "$1/THIRD-PARTY-NOTICES"; echo)
said=$("$2" --version)
[[ $said =~ ^velmora\ [0-9.]+$'\n'libobd\ [0-9.]+,\ C\ ABI\ [0-9]+$'\n'outputs:\ .*$'\n'parts:\ .+ ]] || { echo "$said"; exit 1; }
