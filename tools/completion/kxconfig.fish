# Completion of kxconfig for fish. Install it in a directory vendor_completions.d, or in ~/.config/fish/completions.
#
# The program knows its commands, its options and the keys of a file. fish quotes what comes from a file.

function __kxconfig_complete
    set -l words (commandline -opc)
    set -l current (commandline -ct | string unescape)
    set -l offered ($words[1] --complete $words[2..] "$current" 2>/dev/null)
    if string match -q \t'*' -- "$offered[1]"
        set -l before (string sub -s 2 -- "$offered[1]")
        __fish_complete_path (string sub -s (math 1 + (string length -- "$before")) -- "$current") |
            string replace -r '^' -- (string replace -a '\\' '\\\\' -- "$before" | string replace -a '$' '\\$')
    else
        printf '%s\n' $offered
    end
end

complete -c kxconfig -f -a '(__kxconfig_complete)'
