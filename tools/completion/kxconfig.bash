# Bash completion for kxconfig. Source it, or install it as bash-completion/completions/kxconfig.

# Sets COMPREPLY to the words of the arguments that begin with what stands before the cursor.
_kxconfig_offer()
{
    local word
    COMPREPLY=()
    for word in "$@"; do
        if [[ $word == "$current"* ]]; then
            # Bash breaks words at these characters and replaces only what follows the last of them.
            COMPREPLY+=("${word#"${current%"${current##*[=@:|&]}"}"}")
        fi
    done
}

_kxconfig()
{
    local line=${COMP_LINE:0:COMP_POINT} words current= verb= file= position=0 i
    read -ra words <<<"$line"
    if [[ $line != *[[:space:]] ]]; then
        current=${words[-1]}
        unset 'words[-1]'
    fi
    for ((i = 1; i < ${#words[@]}; ++i)); do
        case ${words[i]} in
            --log-mask | --output) ((++i)) ;;
            -*) ;;
            *)
                ((++position))
                if [ $position -eq 1 ]; then verb=${words[i]}; fi
                if [ $position -eq 2 ]; then file=${words[i]}; fi
                ;;
        esac
    done
    COMPREPLY=()
    case ${words[-1]} in
        --log-mask) _kxconfig_offer warning error trace value xpath all none; return ;;
        --output) mapfile -t COMPREPLY < <(compgen -f -- "$current"); return ;;
    esac
    if [[ $current == -* ]]; then
        local options=(--help --json --log-mask --trace)
        case $verb in
            "") options+=(--version) ;;
            set) options+=(--dry-run --output) ;;
            explain) options+=(--set) ;;
        esac
        _kxconfig_offer "${options[@]}"
        return
    fi
    case $position-$verb in
        0-*) _kxconfig_offer get set explain check keys find ;;
        1-*) mapfile -t COMPREPLY < <(compgen -f -- "$current") ;;
        2-get | 2-set | 2-explain | *-check)
            local keys
            mapfile -t keys < <("${words[0]}" keys "$file" 2>/dev/null | cut -f1)
            _kxconfig_offer "${keys[@]}"
            ;;
    esac
}

complete -F _kxconfig kxconfig
