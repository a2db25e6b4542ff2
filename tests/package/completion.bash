#!/usr/bin/env bash
# What bash offers: completion.bash STAGE
export PATH=$1/bin:$PATH
source /usr/share/bash-completion/bash_completion
source "$1/share/bash-completion/completions/velmora"
wrong=0

# offers EXPECTED LINE WORD...: completes the last word, of which bash has made these; EXPECTED is a pattern of all words.
offers() {
    local expected=$1 line=$2
    shift 2
    COMP_WORDS=("$@") COMP_CWORD=$(($# - 1)) COMP_LINE=$line COMP_POINT=${#line} COMPREPLY=()
    _velmora "$1" "${@: -1}" "${@:$#-1:1}" 2>/dev/null
    # shellcheck disable=SC2053
    [[ " ${COMPREPLY[*]} " == $expected ]] || { echo "$line offers: ${COMPREPLY[*]}"; wrong=1; }
}

offers ' --imperial-not-there ' 'velmora --units=imp' velmora --units = imp >/dev/null
[[ $wrong -eq 1 ]] || { echo "differences are not seen"; exit 1; }
wrong=0
offers '* scan live *' 'velmora ' velmora ''
offers ' imperial imperial-uk ' 'velmora --units=imp' velmora --units = imp
offers '* petrol-can11 *' 'velmora -p sim:pe' velmora -p sim : pe
offers ' auto ' 'velmora -p au' velmora -p au
offers '* RPM *' 'velmora live R' velmora live R
offers '* RPM *' 'velmora live 7E9:R' velmora live 7E9 : R
offers '* --fast *' 'velmora live --f' velmora live --f
offers ' P0420 ' 'velmora dtc P0420' velmora dtc P0420
offers '* Ford *' 'velmora dtc --make F' velmora dtc --make F
offers ' mqtt:// mqtts:// ' 'velmora watch -o mq' velmora watch -o mq
offers ' displacement ' 'velmora settings disp' velmora settings disp
offers ' limit.RPM ' 'velmora settings limit.RP' velmora settings limit.RP
offers ' us-epa us-california ' 'velmora scan --inspection us' velmora scan --inspection us
offers ' pty ' 'velmora simulate --listen p' velmora simulate --listen p
offers '  ' 'velmora dash --listen ' velmora dash --listen ''
offers '  ' 'velmora diff --vehicle ' velmora diff --vehicle ''
offers '* elm327-v1.5 *' 'obdsim --adapter el' obdsim --adapter el
cd "$1" || exit 1
offers '* share *' 'velmora --settings s' velmora --settings s
[[ $(complete -p velmora) == *_velmora* && $(complete -p obdsim) == *_velmora* ]] || wrong=1
exit $wrong
