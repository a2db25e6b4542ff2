#!/usr/bin/env bash
# The manual pages tell the options that --help tells, and are well formed:
#   manual.sh STAGE
set -euo pipefail
export LC_ALL=C.UTF-8
stage=$(realpath "$1")
source=$(realpath "$(dirname "$0")/../..")
wrong=0

complain() {
    echo "$*"
    wrong=1
}

# The names of options and what stands first on a line of help, as "--port".
options_of_help() { "$@" --help | grep -oE '^  +(-[a-zA-Z],)?-?-?[a-zA-Z][-a-zA-Z]*' | tr -d ' ' | tr ',' '\n' | grep '^-' | sort -u; }
options_of_page() { man -l -Tutf8 "$1" | col -b | sed -n '/^OPTIONS/,/^[A-Z][A-Z ]*$/p;' | grep -oE '^ {7}-.*' | grep -oE '(^| )--?[a-zA-Z][-a-zA-Z]*' | tr -d ' ' | sort -u; }

# The same of a command of a command, and of its part of that page.
options_of_part() {
    man -l -Tutf8 "$1" | col -bx | sed -n '/^COMMANDS/,$p' | sed -nE "/^ {7}$2( |\$)/,/^( {7})?[a-zA-Z]/p" |
        grep -oE '^ {14}-.*' | grep -oE '(^| )--?[a-zA-Z][-a-zA-Z]*' | tr -d ' ' | sort -u
}

check() { # check PAGE PROGRAM [COMMAND]
    local page=$stage/share/man/man1/$1
    shift
    [[ -s $page ]] || { complain "there is no page $page"; return; }
    diff <(options_of_help "$@") <(options_of_page "$page") >/dev/null ||
        complain "$(basename "$page") differs from --help: $(diff <(options_of_help "$@") <(options_of_page "$page") | tr '\n' ' ')"
}

check velmora.1 "$stage/bin/velmora"
check obdsim.1 "$stage/bin/obdsim"
commands_of() { "$@" --help | sed -n '/^Subcommands:/,/^Exit/s/^  \([a-z]*\)  .*/\1/p'; }
mapfile -t commands < <(commands_of "$stage/bin/velmora")
parts=0
[[ ${#commands[@]} -ge 24 ]] || complain "only ${#commands[@]} commands are found"
for command in "${commands[@]}"; do
    page=$stage/share/man/man1/velmora-$command.1
    check "${page##*/}" "$stage/bin/velmora" "$command"
    for part in $(commands_of "$stage/bin/velmora" "$command"); do
        parts=$((parts + 1))
        differences=$(diff <(options_of_help "$stage/bin/velmora" "$command" "$part") <(options_of_part "$page" "$part")) ||
            complain "${page##*/} on $part differs from --help: $differences"
    done
done
[[ $parts -ge 8 ]] || complain "only $parts commands of commands are found"
[[ $(find "$stage/share/man/man1" -name 'velmora-*.1' | wc -l) -eq ${#commands[@]} ]] || complain "a page is of no command"

for page in "$stage"/share/man/man[15]/*; do
    said=$(man --warnings -E UTF-8 -l -Tutf8 -Z "$page" 2>&1 >/dev/null) || true
    [[ -z $said ]] || complain "$(basename "$page"): $said"
    lexgrog "$page" >/dev/null || complain "$(basename "$page") has no name"
done

# The examples of the pages on files are such files.
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
export XDG_CONFIG_HOME=/proc/nonexistent
example() { # example PAGE N FILE: writes its Nth example
    awk -v wanted="$2" '/^\.nf/ {seen++; next} /^\.fi/ {if (seen == wanted) exit} seen == wanted' "$stage/share/man/man5/$1.5" |
        sed 's/\\e/\\/g; s/\\-/-/g' >"$work/$3"
    [[ -s $work/$3 ]] || complain "$1 has no example $2"
}
works() { # works TEXT ARGUMENT...: what the program says then
    local said
    said=$("$stage/bin/velmora" -q "${@:2}" 2>&1) && [[ $said == *"$1"* ]] || complain "velmora ${*:2} says: $said"
}
example obdsim-files 1 car.toml
example obdsim-files 2 drive.csv
example obdsim-files 3 scenario
works P0133 -p "sim:$work/car.toml?instant&drive=$work/drive.csv&scenario=$work/scenario" codes --confirmed
example velmora-recordings 1 rounds.csv
works 786 live --play "$work/rounds.csv"
example velmora-recordings 2 readings.csv
works 786 live --play "$work/readings.csv"
example velmora-signals 1 gearbox.toml
works GEARBOX_TEMP signals list "$work/gearbox.toml"
example velmora-watch 1 watch.toml
works '' watch --config "$work/watch.toml" --check-config
example velmora-dialogue 1 van
works '' -p "replay:$work/van" info
example velmora-settings 1 settings.toml
works 1280 --settings "$work/settings.toml" settings
works '..6000' --settings "$work/settings.toml" settings

# They tell all keys that the program knows, and so does the example of the watch.
tells() { # tells FILE KEY...: which of the keys it does not tell
    local key text
    text=$([[ $1 == *.5 ]] && man -l -Tutf8 "$1" | col -b || sed 's/^#//' "$1")
    [[ $# -gt 8 ]] || complain "only $(($# - 1)) keys are found"
    for key in "${@:2}"; do
        grep -qE "^ *(\[*$key\b|[a-z_, ]*\b$key\b)" <<<"$text" || complain "${1##*/} does not tell $key"
    done
}
printf 'nonsense = 1\n[battery]\nnonsense = 1\n' >"$work/nonsense.toml"
mapfile -t keys < <("$stage/bin/velmora" watch --config "$work/nonsense.toml" --check-config 2>&1 |
    sed -n 's/.*not known here; \(.*\) are$/\1/p' | tr -s ', ' '\n')
tells "$stage/share/man/man5/velmora-watch.5" "${keys[@]}"
tells "$stage/share/doc/velmora/examples/watch.toml" "${keys[@]}"
sed 's/^#\([a-z\[]\)/\1/' "$stage/share/doc/velmora/examples/watch.toml" >"$work/whole.toml"
works '' watch --config "$work/whole.toml" --check-config
mapfile -t keys < <(python3 -c 'import json, sys
print(*json.load(open(sys.argv[1]))["definitions"]["signal"]["properties"], sep="\n")' "$source/docs/signals.schema.json")
tells "$stage/share/man/man5/velmora-signals.5" "${keys[@]}"
mapfile -t keys < <("$stage/bin/velmora" --json settings | sed -n 's#.*"key": *"[a-z]*/\([a-z]*\)".*#\1#p')
tells "$stage/share/man/man5/velmora-settings.5" "${keys[@]}"
exit $wrong
