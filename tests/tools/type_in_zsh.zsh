#!/usr/bin/env zsh
# Types the beginning of a command into an interactive zsh, and the tab key, as a user would; prints the line then.
# usage: type_in_zsh.zsh DIRECTORY_OF_COMPLETION ANSWER BEGINNING     kxconfig is found in PATH
zmodload zsh/zpty
zpty shell zsh -f -i
zpty -w shell "PROMPT='>'; TERM=dumb; fpath=(${(q)1} \$fpath); autoload -Uz compinit; compinit -u -D
show() { print -r -- \"\$BUFFER\" >${(q)2}.new; mv ${(q)2}.new ${(q)2} }
zle -N show; bindkey '^T' show; print READY\$((1 + 1))"
zpty -r -m shell shown '*READY2*'
zpty -w -n shell "$3"$'\t\x14'
for i in {1..600}; do
    [[ -s $2 ]] && break
    sleep 0.05
done
zpty -d shell
cat $2
