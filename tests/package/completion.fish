#!/usr/bin/env -S fish --no-config
# What fish offers: completion.fish STAGE
set -x PATH $argv[1]/bin $PATH
source $argv[1]/share/fish/vendor_completions.d/velmora.fish
source $argv[1]/share/fish/vendor_completions.d/obdsim.fish
set wrong 0

function offers # offers EXPECTED LINE
    set -l words (complete -C $argv[2] | string replace -r '\t.*' '')
    if not contains -- $argv[1] $words
        echo "$argv[2] offers: $words"
        set -g wrong 1
    end
end

offers scan 'velmora '
offers sim:petrol-can11 'velmora -p sim:pe'
offers auto 'velmora -p a'
offers RPM 'velmora live R'
offers --units=imperial 'velmora --units=i'
offers --fast 'velmora live --f'
offers petrol-can11 'obdsim --vehicle pe'
cd $argv[1]
offers share/ 'velmora --settings sh'
exit $wrong
