# Completion for the programs of simgp. The words come from what the program says of itself.
_simgp() {
    local program=$1 word=${COMP_WORDS[COMP_CWORD]} before=${COMP_WORDS[COMP_CWORD - 1]} help words
    if [ "$word" = = ]; then
        word=
    elif [ "$before" = = ]; then
        before=${COMP_WORDS[COMP_CWORD - 2]}
    fi
    help=$("$program" --help 2>/dev/null) || return
    COMPREPLY=()
    case $before in
        -t | --to | -f | --format)
            words=$("$program" --list 2>/dev/null | sed -n 2p)
            ;;
        -*) # The words that the option takes, if it takes but some; nothing if it takes others.
            words=$(sed -nE "s/^ *([^ ]+,)?$before(,[^ ]+)? [A-Z]+:\{([^}]*)\}.*/\3/p" <<<"$help" | tr , ' ')
            if [ -z "$words" ] && grep -qE -- "^ *([^ ]+,)?$before(,[^ ]+)? (INT|UINT|FLOAT)" <<<"$help"; then
                return
            fi
            ;;
    esac
    if [ -z "$words" ] && [[ $word == -* ]]; then
        words=$(grep -E '^  -' <<<"$help" | grep -oE '^  [^ {]+' | grep -oE -- '--[a-z0-9-]+')
    fi
    if [ -n "$words" ]; then
        mapfile -t COMPREPLY < <(compgen -W "$words" -- "$word")
    else
        compopt -o filenames 2>/dev/null
        mapfile -t COMPREPLY < <(compgen -f -- "$word") # names may have spaces in them
    fi
}
# Bash reads this file under the name of the program that is completed.
complete -F _simgp "$(basename "${BASH_SOURCE[0]}")"
