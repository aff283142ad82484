#compdef kxconfig
# Completion of kxconfig for zsh. Install it as _kxconfig in a directory of $fpath.
#
# The program knows its commands, its options and the keys of a file. compadd quotes what comes from a file.

local -a offered texts descriptions
local line

offered=("${(@f)$("${${(Q)words[1]}/#\~\//$HOME/}" --complete "${(@Q)words[2,CURRENT-1]}" "${(Q)PREFIX}" 2>/dev/null)}")
if [[ $offered[1] == $'\t'* ]]; then
    if [[ $offered[1] == *= ]]; then compset -P '*='; fi # "--output=" is no part of the name
    _files
    return
fi
for line in "${offered[@]}"; do
    [[ -n $line ]] || continue
    texts+=("${line%%$'\t'*}")
    descriptions+=("${line/$'\t'/  -- }")
done
compadd -l -d descriptions -a -- texts
