#!/usr/bin/env bash
# The manual pages tell the options that --help tells, and are well formed:
#   manual.sh STAGE
set -euo pipefail
export LC_ALL=C.UTF-8
stage=$(realpath "$1")
wrong=0

complain() {
    echo "$*"
    wrong=1
}

# The names of options and what stands first on a line of help, as "--port".
options_of_help() { "$@" --help | grep -oE '^  +(-[a-zA-Z],)?-?-?[a-zA-Z][-a-zA-Z]*' | tr -d ' ' | tr ',' '\n' | grep '^-' | sort -u; }
options_of_page() { man -l -Tutf8 "$1" | col -b | sed -n '/^OPTIONS/,/^[A-Z][A-Z ]*$/p;' | grep -oE '^ {7}-.*' | grep -oE '(^| )--?[a-zA-Z][-a-zA-Z]*' | tr -d ' ' | sort -u; }

check() { # check PAGE PROGRAM [COMMAND]
    local page=$stage/share/man/man1/$1
    shift
    [[ -s $page ]] || { complain "there is no page $page"; return; }
    diff <(options_of_help "$@") <(options_of_page "$page") >/dev/null ||
        complain "$(basename "$page") differs from --help: $(diff <(options_of_help "$@") <(options_of_page "$page") | tr '\n' ' ')"
}

check velmora.1 "$stage/bin/velmora"
check obdsim.1 "$stage/bin/obdsim"
mapfile -t commands < <("$stage/bin/velmora" --help | sed -n '/^Subcommands:/,/^Exit/s/^  \([a-z]*\)  .*/\1/p')
[[ ${#commands[@]} -ge 24 ]] || complain "only ${#commands[@]} commands are found"
for command in "${commands[@]}"; do
    check "velmora-$command.1" "$stage/bin/velmora" "$command"
done
[[ $(find "$stage/share/man/man1" -name 'velmora-*.1' | wc -l) -eq ${#commands[@]} ]] || complain "a page is of no command"

for page in "$stage"/share/man/man[15]/*; do
    said=$(man --warnings -E UTF-8 -l -Tutf8 -Z "$page" 2>&1 >/dev/null) || true
    [[ -z $said ]] || complain "$(basename "$page"): $said"
    lexgrog "$page" >/dev/null || complain "$(basename "$page") has no name"
done
exit $wrong
