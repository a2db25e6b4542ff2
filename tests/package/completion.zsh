#!/usr/bin/env zsh
# What zsh offers: types into a real one on a pseudo-terminal, presses Tab, and notes each word that completion adds.
#   completion.zsh STAGE
zmodload zsh/zpty
stage=${1:A} home=$(mktemp -d) wrong=0
export OFFERED=$home/offered
cat >$home/.zshrc <<END
PATH=$stage/bin:\$PATH fpath=($stage/share/zsh/site-functions \$fpath)
autoload -Uz compinit && compinit -u -D
compadd() { local -a added; builtin compadd -A added "\$@"; print -rl -- \$added >>\$OFFERED; builtin compadd "\$@" }
finished() { : >\$OFFERED.done }
complete-and-tell() { zle expand-or-complete; finished }
zle -N complete-and-tell
bindkey '^I' complete-and-tell
PS1='ready'
END
cd $stage

offers() { # offers EXPECTED LINE
    local seen tries=0
    : >$OFFERED
    rm -f $OFFERED.done
    zpty shell "ZDOTDIR=$home TERM=dumb zsh -i"
    zpty -r shell seen '*ready*'
    zpty -w -n shell "$2"$'\t'
    while [[ ! -e $OFFERED.done ]] && (( ++tries < 200 )); do
        sleep 0.05
    done
    zpty -d shell
    local -a words=("${(@f)$(<$OFFERED)}")
    (( ${words[(Ie)$1]} )) || { print -r -- "$2 offers: $words"; wrong=1; }
}

offers scan 'velmora '
offers sim:petrol-can11 'velmora -p sim:p'
offers auto 'velmora -p a'
offers RPM 'velmora live R'
offers imperial 'velmora --units '
offers petrol-can11 'obdsim --vehicle p'
offers share 'velmora --settings s'
rm -rf $home
exit $wrong
