# bash completion for velmora and obdsim, which know themselves what may stand where.
_velmora()
{
    local cur words cword line trim
    _get_comp_words_by_ref -n := cur words cword || return
    local -a found=()
    while IFS= read -r line; do
        found+=("${line%%$'\t'*}")
    done < <("$1" __complete "${words[@]:1:cword}" 2>/dev/null)
    if [[ ${found[0]} == :files ]]; then
        compopt -o filenames 2>/dev/null
        trim=${cur##*=}
        mapfile -t COMPREPLY < <(compgen -f -- "$trim")
        return
    fi
    # The shell replaces only what stands behind its last word break, such as the colon of sim:VEHICLE.
    trim=$cur
    while [[ -n $trim && $COMP_WORDBREAKS != *"${trim: -1}"* ]]; do
        trim=${trim%?}
    done
    COMPREPLY=("${found[@]#"$trim"}")
    if [[ ${#COMPREPLY[@]} -eq 1 && ${COMPREPLY[0]} == *[:/] ]]; then
        compopt -o nospace 2>/dev/null
    fi
} && complete -F _velmora velmora obdsim
