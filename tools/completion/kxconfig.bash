# Bash completion for kxconfig. Source it, or install it as bash-completion/completions/kxconfig.
#
# Keys come from files that anybody may have written: nothing of them reaches the command line unquoted.

# Sets words to the words of $1 as a command would get them, and quote to the quote that is still open at its end. The
# last word is the one that ends there, be it empty.
_kxconfig_split()
{
    local text=$1 word= inside= character i
    words=() quote=
    for ((i = 0; i < ${#text}; ++i)); do
        character=${text:i:1}
        case $quote$character in
            [\"\'])
                quote=$character inside=1
                ;;
            \"\" | \'\')
                quote=
                ;;
            \"\\)
                if [[ ${text:i+1:1} == [\\\"\$\`] ]]; then ((++i)); fi
                word+=${text:i:1}
                ;;
            \\)
                ((++i))
                word+=${text:i:1} inside=1
                ;;
            [[:space:]])
                if [[ -n $inside ]]; then words+=("$word"); fi
                word= inside=
                ;;
            *)
                word+=$character inside=1
                ;;
        esac
    done
    words+=("$word")
}

# Sets REPLY to $1 as it is written where the quote is open, or none.
_kxconfig_quote()
{
    local character
    REPLY=$1
    case $quote in
        \')
            REPLY=${REPLY//\'/"'\\''"}
            ;;
        \")
            for character in \\ \" \$ \`; do
                REPLY=${REPLY//"$character"/"\\$character"}
            done
            REPLY=${REPLY//!/'"\!"'} # a quote of this kind does not keep it from recalling a command
            ;;
        *)
            if [[ $REPLY == *[![:alnum:]_.,:=@/+-]* ]]; then printf -v REPLY %q "$REPLY"; fi
            ;;
    esac
}

# Offers those of the words that begin with what stands before the cursor.
_kxconfig_offer()
{
    local word
    for word in "$@"; do
        # A control character would have to be written in another way behind each quote.
        if [[ $word == "$current"* && $word != *[[:cntrl:]]* ]]; then
            _kxconfig_quote "${word#"$kept"}"
            COMPREPLY+=("$REPLY")
        fi
    done
}

# Offers the files whose names begin with what stands between $1 and the cursor; bash quotes them and marks folders.
_kxconfig_offer_files()
{
    local name=${current#"$1"} character
    for character in \\ \" \'; do
        name=${name//"$character"/"\\$character"} # compgen takes quotes away
    done
    compopt -o filenames 2>/dev/null
    while IFS= read -r name; do
        name=$1$name
        COMPREPLY+=("${name#"$kept"}")
    done < <(compgen -f -- "$name")
}

_kxconfig()
{
    # Bash replaces $2, the end of the line, which can be less than the word: it breaks words at "=" and the like, and
    # leaves an open quote alone. What it keeps of the word must not be offered again.
    local line=${COMP_LINE:0:COMP_POINT} words quote kept current offered
    COMPREPLY=()
    if [[ $line != *"$2" ]]; then return; fi
    _kxconfig_split "$line"
    current=${words[-1]}
    _kxconfig_split "${line%"$2"}"
    kept=${words[-1]}
    unset 'words[-1]'
    # The program knows its commands, its options and the keys of a file.
    mapfile -t offered < <("${words[0]/#\~\//$HOME/}" --complete "${words[@]:1}" "$current" 2>/dev/null)
    if [[ ${offered[0]-} == $'\t'* ]]; then
        _kxconfig_offer_files "${offered[0]#?}"
    else
        _kxconfig_offer "${offered[@]%%$'\t'*}"
    fi
}

complete -F _kxconfig kxconfig
