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

said=$("$2/readiness" "$car")
[[ $said =~ 7E8\ ECM.*:\ complete ]] || fail "readiness tells no monitors: $said"
said=$("$2/info" "$car")
[[ $said =~ 7E8\ ECM.*[A-Z0-9]{17} ]] || fail "info tells no VIN: $said"
[[ $("$2/explain" P0420) == P0420\ Generic:\ Catalyst* ]] || fail "explain tells no meaning"
status=0
"$2/explain" nonsense 2>/dev/null || status=$?
[[ $status -eq 2 ]] || fail "nonsense is no code, but explain ended with $status"

status=0
"$2/read" sim:no-such-car RPM 2>/dev/null || status=$?
[[ $status -ne 0 ]] || fail "there is no such car, but read succeeded"

# A server that the socket and the watch reach; its address comes in $address.
serve() {
    coproc SIMULATOR { exec "$velmora" simulate --listen "$1" --vehicle petrol-can11; }
    server=$SIMULATOR_PID
    read -r address <&"${SIMULATOR[0]}"
}
end_server() {
    kill "$server"
    wait "$server" || true
}
velmora=$1
watch=
said=$2/watch.said
trap 'kill "$server" $watch 2>/dev/null || true' EXIT

# Waits for a line of the watch; half a minute is no measure but an end.
await() {
    for _ in $(seq 300); do
        grep -q "$1" "$said" && return
        kill -0 "$watch" 2>/dev/null || break
        sleep 0.1
    done
    fail "the watch never says \"$1\": $(<"$said")"
}

serve tcp://127.0.0.1:0
port=${address##*:}
text=$("$2/transport" 127.0.0.1 "$port")
[[ $text =~ Engine\ RPM:\ [1-9][0-9]*\ rpm ]] || fail "transport tells no engine speed: $text"

# The watch goes on over a loss of the link, until it has shown so many values.
: >"$said"
"$2/watch" "127.0.0.1:$port" 100 >>"$said" &
watch=$!
await 'Engine RPM: [1-9]'
end_server
await 'The link is lost'
serve "tcp://127.0.0.1:$port"
await 'The link is returned'
wait "$watch" || fail "watch ended with $?: $(<"$said")"
watch=
[[ $(grep -c ': ' "$said") -ge 100 ]] || fail "watch tells too little: $(<"$said")"
sed '1,/The link is returned/d' "$said" | grep -q 'Engine RPM: [1-9]' || fail "watch tells nothing behind the return"

end_server
status=0
"$2/transport" 127.0.0.1 "$port" 2>/dev/null || status=$?
[[ $status -eq 3 ]] || fail "nobody listens, but transport ended with $status"
