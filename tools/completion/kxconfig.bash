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

# Offers the levels of a log mask, of which several are joined by commas, after $1.
_kxconfig_offer_levels()
{
    local levels=(warning error trace value xpath all none) given=${current#"$1"}
    given=$1${given%"${given##*,}"}
    _kxconfig_offer "${levels[@]/#/"$given"}"
}

_kxconfig_offer_options()
{
    local options=(--help --json --log-mask --trace)
    case $1 in
        "") options+=(--version) ;;
        set) options+=(--drop-attributes --dry-run --output --wait) ;;
        keys) options+=(--all) ;;
        explain) options+=(--set) ;;
        check) options+=(--notes --only --ignore --kinds) ;;
        get) options+=(--default --null) ;;
    esac
    _kxconfig_offer "${options[@]}"
}

_kxconfig_offer_keys()
{
    local keys
    if [[ -f $1 ]]; then # from a pipe there might be nothing to read
        mapfile -t keys < <("${words[0]/#\~\//$HOME/}" keys -- "$1" 2>/dev/null | cut -f1)
        _kxconfig_offer "${keys[@]}"
    fi
}

_kxconfig_offer_arguments()
{
    local verb= file= position=0 i
    for ((i = 1; i < ${#words[@]}; ++i)); do
        case ${words[i]} in
            --default | --log-mask | --output | --wait) ((++i)) ;;
            -*) ;;
            *)
                ((++position))
                if [ $position -eq 1 ]; then verb=${words[i]}; fi
                if [ $position -eq 2 ]; then file=${words[i]/#\~\//$HOME/}; fi
                ;;
        esac
    done
    if [[ $current == -* ]]; then
        _kxconfig_offer_options "$verb"
        return
    fi
    case $position-$verb in
        0-*) _kxconfig_offer get set explain check keys find diff ;;
        1-* | 2-diff) _kxconfig_offer_files "" ;;
        *-get | 2-set | 2-explain | *-check) _kxconfig_offer_keys "$file" ;;
    esac
}

_kxconfig()
{
    # Bash replaces $2, the end of the line, which can be less than the word: it breaks words at "=" and the like, and
    # leaves an open quote alone. What it keeps of the word must not be offered again.
    local line=${COMP_LINE:0:COMP_POINT} words quote kept current
    COMPREPLY=()
    if [[ $line != *"$2" ]]; then return; fi
    _kxconfig_split "$line"
    current=${words[-1]}
    _kxconfig_split "${line%"$2"}"
    kept=${words[-1]}
    unset 'words[-1]'
    case ${words[-1]} in
        --log-mask) _kxconfig_offer_levels ""; return ;;
        --output) _kxconfig_offer_files ""; return ;;
    esac
    case $current in
        --log-mask=*) _kxconfig_offer_levels --log-mask= ;;
        --output=*) _kxconfig_offer_files --output= ;;
        *) _kxconfig_offer_arguments ;;
    esac
}

complete -F _kxconfig kxconfig
