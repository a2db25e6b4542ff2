#!/usr/bin/env bash
# The program prints our licence and the notices, and which parts it has:
#   licences.sh SOURCE_FOLDER BUILD_FOLDER VELMORA
set -euo pipefail
diff <("$3" --licenses) <(cat "$1/LICENSE"; echo; cat "$1/THIRD-PARTY-NOTICES"; echo)
said=$("$3" --version)
[[ $said =~ ^velmora\ [0-9.]+$'\n'libobd\ [0-9.]+,\ C\ ABI\ [0-9]+$'\n'outputs:\ .*$'\n'parts:\ .+ ]] || { echo "$said"; exit 1; }

# Each option that is on is a part or an output, and none that is off.
declare -A told=(
    [BLUETOOTH_SERVICE]='parts:.*Bluetooth service' [DASH]='parts:.* dash' [HISTORY]='parts:.* history'
    [OUTPUT_CSV]='outputs:.* csv, csv-long' [OUTPUT_INFLUX]='outputs:.* influx' [OUTPUT_MQTT]='outputs:.* mqtt, mqtts'
    [OUTPUT_NDJSON]='outputs:.* ndjson' [OUTPUT_PROMETHEUS]='outputs:.* prometheus' [OUTPUT_SQLITE]='outputs:.* sqlite'
)
for option in "${!told[@]}"; do
    value=$(sed -n "s/^VELMORA_$option:BOOL=//p" "$2/CMakeCache.txt")
    [[ -n $value ]] || { echo "there is no option VELMORA_$option"; exit 1; }
    seen=OFF
    ! grep -E "^${told[$option]}(,|\$)" <<<"$said" >/dev/null || seen=ON
    [[ $seen == "$value" ]] || { echo "VELMORA_$option is $value, but --version tells: $said"; exit 1; }
done
