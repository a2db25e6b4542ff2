#!/usr/bin/env bash
# Shows that floors.sh finds what it is there for: each wrong include is laid into a small tree and must be told.
set -euo pipefail
checker=$(realpath "$(dirname "$0")/floors.sh")
tree=$(mktemp -d)
trap 'rm -rf "$tree"' EXIT
failures=0

fresh() {
    rm -rf "${tree:?}"/*
    mkdir -p "$tree"/{common,libobd/{include/obd,include/tervex,adapter,cellar,value,query},libvelmora,program,simulator,examples}
    printf '%s\n' '1 libobd/include/obd/*' '0 libobd/include/tervex/*' '10 program/' '10 libvelmora/' \
        '3 libobd/value/' '3 libobd/query/' '2 libobd/adapter/' '0 common/' >"$tree/floors.txt"
    echo '#include <string>' >"$tree/libobd/adapter/driver.h"
    echo '#include "libobd/value/unit.h"' >"$tree/libobd/query/query.h"
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

expect 0 libobd/adapter/driver.h '<obd/idevice.h>'
expect 0 libobd/adapter/driver.cpp '"libobd/adapter/driver.h"'
expect 0 libobd/include/obd/idevice.h '<tervex/observer.h>'
expect 1 libobd/include/obd/idevice.h '<common/clock.h>'
expect 1 libobd/include/obd/idevice.h '"libobd/adapter/driver.h"'
expect 1 common/clock.h '<obd/idevice.h>'
expect 1 common/clock.h '"libobd/adapter/driver.h"'
expect 1 libobd/adapter/driver.cpp '<asio.hpp>'
expect 1 libobd/adapter/driver.cpp '<sys/types.h>'
expect 1 libobd/adapter/driver.cpp '"libvelmora/session.h"'
expect 1 libobd/adapter/driver.cpp '"libobd/cellar/unknown.h"'
expect 1 libobd/cellar/unknown.cpp '<obd/idevice.h>'
expect 0 program/main.cpp '<obd/idevice.h>'
expect 0 program/main.cpp '<tervex/observer.h>'
expect 0 program/main.cpp '"simulator/peer.h"'
expect 0 program/main.cpp '<asio.hpp>'
expect 1 program/main.cpp '<common/clock.h>'
expect 0 program/main.cpp '"common/text/text.h"'
expect 1 program/main.cpp '"libobd/adapter/driver.h"'
expect 1 program/main.cpp '"libvelmora/session.h"'
expect 1 program/main.cpp '"tests/support/gate.h"'
expect 1 libobd/adapter/driver.cpp '"libobd/value/unit.h"'
expect 0 libobd/query/query.cpp '"libobd/value/unit.h"'
expect 1 libobd/value/unit.h '"libobd/query/query.h"'
expect 1 libvelmora/session.cpp '"libobd/adapter/driver.h"'
expect 0 libvelmora/session.cpp '<common/clock.h>'
expect 0 libvelmora/session.cpp '"common/text/text.h"'
expect 1 libvelmora/session.cpp '"common/logrecord.h"'
expect 0 simulator/peer.h '"simulator/bytes.h"'
expect 1 simulator/peer.h '<obd/idevice.h>'
expect 1 simulator/peer.h '<tervex/observer.h>'
expect 1 simulator/peer.h '"libobd/adapter/driver.h"'
expect 1 simulator/peer.h '"libvelmora/session.h"'
expect 0 examples/main.cpp '<obd/idevice.h>'
expect 1 examples/main.cpp '"libvelmora/session.h"'
expect 1 examples/main.cpp '"libobd/adapter/driver.h"'

[[ $failures -eq 0 ]]
