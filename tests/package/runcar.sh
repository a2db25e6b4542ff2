#!/usr/bin/env bash
# Runs the companion's examples against simulated cars, and against nobody:
#   runcar.sh VELMORA EXAMPLES_FOLDER
set -euo pipefail
export XDG_CONFIG_HOME=/proc/nonexistent
car=sim:petrol-can11?instant

fail() {
    echo "$*" >&2
    exit 1
}

said=$("$2/read" "$car" RPM COOLANT_TEMP)
echo "$said"
[[ $said =~ Engine\ RPM:\ [1-9][0-9]*\ rpm.*°C ]] || fail "read tells no values"

said=$("$2/codes" "$car")
echo "$said"
[[ $said =~ 7E8\ confirmed\ P0171\ .+ && $said =~ 7E8\ ECM.P0133\ .+ ]] || fail "codes tells no codes or no frame"

"$2/json" "$car" | python3 -c 'import json, sys; assert len(json.load(sys.stdin)["modules"]) == 2' ||
    fail "json prints no report of both modules"

said=$("$2/watch" "$car" 6)
[[ $(grep -c ': ' <<<"$said") -ge 6 ]] || fail "watch tells too little: $said"

status=0
"$2/read" sim:no-such-car RPM 2>/dev/null || status=$?
[[ $status -ne 0 ]] || fail "there is no such car, but read succeeded"

# One server for the socket, cut for the watch once it has been served so far.
coproc SIMULATOR { exec "$1" simulate --listen tcp://127.0.0.1:0 --vehicle petrol-can11; }
server=$SIMULATOR_PID
trap 'kill "$server" 2>/dev/null || true' EXIT
read -r address <&"${SIMULATOR[0]}"
said=$("$2/transport" 127.0.0.1 "${address##*:}")
[[ $said =~ Engine\ RPM:\ [1-9][0-9]*\ rpm ]] || fail "transport tells no engine speed: $said"
kill "$server"
wait "$server" || true
status=0
"$2/transport" 127.0.0.1 "${address##*:}" 2>/dev/null || status=$?
[[ $status -eq 3 ]] || fail "nobody listens, but transport ended with $status"
