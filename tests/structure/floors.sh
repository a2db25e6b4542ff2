#!/usr/bin/env bash
# Checks what the rooms include, by the floors of floors.txt. Prints each include that should not be, and each circle
# between rooms of one floor.
#   floors.sh SOURCE_FOLDER [FLOORS]
set -euo pipefail
floors=$(realpath "${2:-$(dirname "$0")/floors.txt}")
cd "$1"

# Every include of a folder's C++ files as "file:including line".
includes() { grep -rHE '^ *# *include' --include='*.h' --include='*.cpp' "$@" || true; }

includes common libobd libvelmora program simulator $([[ -d bindings ]] && echo bindings) $([[ -d examples ]] && echo examples) |
    awk -v floorFile="$floors" '
    function wrong(why) { print file ": " target ": " why; failures++ }

    # A row that ends in a slash is a room, any other a pattern of files.
    function matches(path, pattern) {
        if (pattern ~ /\/$/) {
            return index(path, pattern) == 1
        }
        gsub(/[.]/, "[.]", pattern)
        gsub(/[*]/, ".*", pattern)
        return path ~ ("^" pattern "$")
    }

    function floorOf(path,   i) {
        if (path in known) {
            return known[path]
        }
        sub(/[.](h|cpp)$/, "", path)
        for (i = 1; i <= rows; i++) {
            if (matches(path, patterns[i])) {
                return known[path] = floorNumbers[i]
            }
        }
        return known[path] = -1
    }

    # The folder of a file; both parts of the public face are of every room.
    function roomOf(path) {
        sub(/\/[^\/]*$/, "", path)
        return path
    }

    # The path in the tree of what is included, or nothing.
    function treePath() {
        if (target ~ /^(obd|tervex)\//) {
            return "libobd/include/" target
        }
        if (target ~ /^velmora\// && !(target in generated)) {
            return "libvelmora/include/" target
        }
        return target ~ /^(bindings|common|libobd|libvelmora|program)\// ? target : ""
    }

    function isStandard() { return target ~ /^[a-z_]+$/ }

    function checkFloor(   path) {
        path = treePath()
        if (path == "") {
            return
        }
        if (floorOf(file) < 0) {
            wrong(file " has no floor")
        } else if (floorOf(path) < 0) {
            wrong(path " has no floor")
        } else if (floorOf(path) > floorOf(file)) {
            wrong("floor " floorOf(path) " seen from floor " floorOf(file))
        } else if (floorOf(path) == floorOf(file) && (path file) !~ /\/include\// && file ~ /^lib(obd|velmora)\//) {
            noteRooms(roomOf(file), roomOf(path))
        }
    }

    function noteRooms(from, to) {
        if (from != to) {
            seen[from, to] = file
            rooms[from] = rooms[to] = 1
        }
    }

    function checkLibrary() {
        if (treePath() == "" && !isStandard()) {
            wrong("the library includes only itself and the standard library")
        }
        if (file ~ /^libobd\/include\// && target ~ /^(libobd|common)\//) {
            wrong("is private to the library")
        }
    }

    function checkUser() {
        if (target ~ /^(libobd|tests)\//) {
            wrong("is private to the library")
        }
    }

    # Of the floor that knows nothing of cars, texts are for all of the house; the rest is the core'"'"'s, which brings it.
    function isCoresOwn() { return target ~ /^common\// && target !~ /^common\/text\// }

    function checkCompanion() {
        checkUser()
        if (file ~ /^libvelmora\/include\// && target ~ /^(libvelmora|common|simulator)\//) {
            wrong("is private to the companion")
        } else if (isCoresOwn() && target !~ /^common\/(clock|outputfile)[.]h$/) {
            wrong("is private to the library")
        }
    }

    function checkProgram() {
        checkUser()
        if (isCoresOwn()) {
            wrong("is private to the library")
        } else if (target ~ /^libvelmora\// && file ~ /^program\//) {
            wrong("is private to the companion: what the program lacks in its face is added there")
        }
    }

    function checkExample() {
        checkUser()
        if (target ~ /^(common|libvelmora|program|simulator)\//) {
            wrong("is not in the installed package")
        }
    }

    function checkSimulator() {
        if (target ~ /^(obd|tervex|velmora|common|libobd|libvelmora|program|tests)\//) {
            wrong("the simulator shares nothing with the library")
        }
    }

    # Ways through the rooms of one floor; one that comes back to its start is a circle.
    function checkCircles(   pair, between, from, to, grew, parts) {
        for (grew = 1; grew;) {
            grew = 0
            for (pair in seen) {
                split(pair, parts, SUBSEP)
                for (to in rooms) {
                    if ((parts[2], to) in seen && !((parts[1], to) in seen)) {
                        seen[parts[1], to] = seen[parts[2], to]
                        grew = 1
                    }
                }
            }
        }
        for (from in rooms) {
            if ((from, from) in seen) {
                print from ": stands in a circle of rooms, by " seen[from, from]
                failures++
            }
        }
    }

    BEGIN {
        generated["velmora/version.h"] = 1
        while ((getline line < floorFile) > 0) {
            if (line ~ /^[0-9]/) {
                split(line, words, " ")
                floorNumbers[++rows] = words[1] + 0
                patterns[rows] = words[2]
            }
        }
    }

    {
        file = $0
        sub(/:.*/, "", file)
        if (!match($0, /[<"][^>"]+[>"]/)) {
            next
        }
        target = substr($0, RSTART + 1, RLENGTH - 2)
        checked++
    }
    file ~ /^(bindings|common|libobd|libvelmora|program)\// { checkFloor() }
    file ~ /^(common|libobd)\// { checkLibrary() }
    file ~ /^libvelmora\// { checkCompanion() }
    file ~ /^(bindings|program)\// { checkProgram() }
    file ~ /^examples\// { checkExample() }
    file ~ /^simulator\// { checkSimulator() }

    END {
        checkCircles()
        print checked + 0 " includes looked at, " failures + 0 " wrong"
        exit failures > 0 || checked == 0
    }'
