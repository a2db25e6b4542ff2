#!/usr/bin/env bash
# Runs the example against a simulated car, and against nobody:
#   runexample.sh VELMORA EXAMPLE
set -euo pipefail

fail() {
    echo "$*" >&2
    exit 1
}

coproc SIMULATOR { exec "$1" simulate --listen tcp://127.0.0.1:0 --vehicle petrol-can11; }
server=$SIMULATOR_PID
trap 'kill "$server" 2>/dev/null || true' EXIT
read -r address <&"${SIMULATOR[0]}"
port=${address##*:}

said=$("$2" 127.0.0.1 "$port") || fail "the example failed: $said"
echo "$said"
[[ $said =~ Engine\ RPM:\ [1-9][0-9]*\ rpm ]] || fail "no engine speed"
[[ $said =~ Trouble\ code:\ P[0-9A-F]{4}\ .+ ]] || fail "no trouble code"

kill "$server"
wait "$server" || true
"$2" 127.0.0.1 "$port" 2>/dev/null && fail "nobody listens, but the example succeeded"
"$2" 2>/dev/null && fail "no arguments, but the example succeeded"
exit 0
