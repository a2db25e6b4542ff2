# fish completion for obdsim, which knows itself what may stand where.
function __obdsim_complete
    set -l words (commandline -opc) "$(commandline -ct)"
    set -l found ($words[1] __complete $words[2..-1] 2>/dev/null)
    if test "$found[1]" = ":files"
        __fish_complete_path (string replace -r '^--[^=]*=' '' -- (commandline -ct))
        return
    end
    printf '%s\n' $found
end
complete -c obdsim -f -a '(__obdsim_complete)'
