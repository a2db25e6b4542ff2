#!/usr/bin/env bash
# Checks what the rooms include, by the floors of floors.txt. Prints each include that should not be.
#   floors.sh SOURCE_FOLDER [FLOORS]
set -euo pipefail
floors=$(realpath "${2:-$(dirname "$0")/floors.txt}")
cd "$1"

# Every include of a folder's C++ files as "file:including line".
includes() { grep -rHE '^ *# *include' --include='*.h' --include='*.cpp' "$@" || true; }

# The headers of the common room that are installed beside the public face.
installed=$(grep -oE 'common/[a-z]+\.h' libobd/install.cmake | tr '\n' ' ')

includes common libobd velmora simulator $([[ -d examples ]] && echo examples) |
    awk -v installed="$installed" -v floorFile="$floors" '
    function wrong(why) { print file ": " target ": " why; failures++ }

    function matches(path, pattern) {
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

    # The path of an included file of the library, or nothing.
    function libraryPath() {
        if (target ~ /^obd\//) {
            return "libobd/include/" target
        }
        return target ~ /^(common|libobd)\// ? target : ""
    }

    function isStandard() { return target ~ /^[a-z_]+$/ }

    function checkLibrary(   path) {
        path = libraryPath()
        if (path == "") {
            if (!isStandard()) {
                wrong("the library includes only itself and the standard library")
            }
            return
        }
        if (floorOf(file) < 0) {
            wrong(file " has no floor")
        } else if (floorOf(path) < 0) {
            wrong(path " has no floor")
        } else if (floorOf(path) > floorOf(file)) {
            wrong("floor " floorOf(path) " seen from floor " floorOf(file))
        }
        if (file ~ /^libobd\/include\// && target ~ /^common\// && !(target in faceOfCommon)) {
            wrong("is not installed with the public face")
        }
        if (file ~ /^libobd\/include\// && target ~ /^libobd\//) {
            wrong("is private to the library")
        }
    }

    function checkUser() {
        if (target ~ /^libobd\// || target ~ /^tests\//) {
            wrong("is private to the library")
        } else if (target ~ /^common\// && !(target in faceOfCommon)) {
            wrong("is private to the library")
        }
    }

    function checkExample() {
        checkUser()
        if (target ~ /^(velmora|simulator)\//) {
            wrong("is not in the installed package")
        }
    }

    function checkSimulator() {
        if (target ~ /^(obd|common|libobd|velmora|tests)\//) {
            wrong("the simulator shares nothing with the library")
        }
    }

    BEGIN {
        split(installed, list, " ")
        for (i in list) {
            faceOfCommon[list[i]] = 1
        }
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
    file ~ /^(common|libobd)\// { checkLibrary() }
    file ~ /^velmora\// { checkUser() }
    file ~ /^examples\// { checkExample() }
    file ~ /^simulator\// { checkSimulator() }

    END {
        print checked + 0 " includes looked at, " failures + 0 " wrong"
        exit failures > 0 || checked == 0
    }'
