#!/usr/bin/env bash
# Shows that floors.sh finds what it is there for: each wrong include is laid into a small tree and must be told.
set -euo pipefail
checker=$(realpath "$(dirname "$0")/floors.sh")
tree=$(mktemp -d)
trap 'rm -rf "$tree"' EXIT
failures=0

fresh() {
    rm -rf "${tree:?}"/*
    mkdir -p "$tree"/{common,libobd/include/obd,libobd/src,velmora,simulator,examples}
    echo 'install(FILES common/observer.h)' >"$tree/libobd/install.cmake"
    printf '2 libobd/src/driver\n1 libobd/include/obd/*\n0 common/*\n' >"$tree/floors.txt"
    echo '#include <string>' >"$tree/libobd/src/driver.h"
}

# expect STATUS FILE INCLUDE: what the checker says of a tree with this one include more.
expect() {
    fresh
    echo "#include $3" >>"$tree/$2"
    local status=0
    "$checker" "$tree" "$tree/floors.txt" >"$tree/said" || status=$?
    if [[ $status -ne $1 ]]; then
        echo "$2 with $3: status $status, expected $1"
        cat "$tree/said"
        failures=$((failures + 1))
    fi
}

expect 0 libobd/src/driver.h '<obd/idevice.h>'
expect 0 libobd/src/driver.cpp '"libobd/src/driver.h"'
expect 0 libobd/include/obd/idevice.h '<common/observer.h>'
expect 1 libobd/include/obd/idevice.h '<common/clock.h>'
expect 1 libobd/include/obd/idevice.h '"libobd/src/driver.h"'
expect 1 common/clock.h '<obd/idevice.h>'
expect 1 common/clock.h '"libobd/src/driver.h"'
expect 1 libobd/src/driver.cpp '<asio.hpp>'
expect 1 libobd/src/driver.cpp '<sys/types.h>'
expect 1 libobd/src/driver.cpp '"velmora/session.h"'
expect 1 libobd/src/driver.cpp '"libobd/src/unknown.h"'
expect 1 libobd/src/unknown.cpp '<obd/idevice.h>'
expect 0 velmora/main.cpp '<obd/idevice.h>'
expect 0 velmora/main.cpp '<common/observer.h>'
expect 0 velmora/main.cpp '"simulator/peer.h"'
expect 0 velmora/main.cpp '<asio.hpp>'
expect 1 velmora/main.cpp '<common/clock.h>'
expect 1 velmora/main.cpp '"libobd/src/driver.h"'
expect 1 velmora/main.cpp '"tests/support/gate.h"'
expect 0 simulator/peer.h '"simulator/bytes.h"'
expect 1 simulator/peer.h '<obd/idevice.h>'
expect 1 simulator/peer.h '<common/observer.h>'
expect 1 simulator/peer.h '"libobd/src/driver.h"'
expect 1 simulator/peer.h '"velmora/session.h"'
expect 0 examples/main.cpp '<obd/idevice.h>'
expect 1 examples/main.cpp '"velmora/session.h"'
expect 1 examples/main.cpp '"libobd/src/driver.h"'

[[ $failures -eq 0 ]]
