# bash completion for cdef; what it understands is taken from its own help

_cdef() {
    local word subcommand='' values='' option=$3 current=$2 is=''
    for word in "${COMP_WORDS[@]:1:COMP_CWORD-1}"; do
        [[ $word != -* ]] && subcommand=$word && break
    done
    # A value after "=" may be optional; the shell takes "=" for a word.
    if [[ $3 == = ]]; then
        option=${COMP_WORDS[COMP_CWORD-2]} is='\[='
    elif [[ $2 == = ]]; then
        current='' is='\[='
    fi
    if [[ $option == --warn || $option == --no-warn ]]; then
        values="all $("$1" explain 2>/dev/null | sed -nE 's/^(S[0-9]+) .* \[([^]]+)\]$/\1 \2/p')"
    elif [[ $option == --* ]]; then
        values=$("$1" ${subcommand:+"$subcommand"} --help 2>/dev/null |
            sed -nE "s/^  $option $is[A-Z]+:\{([^}]*)\}.*/\1/p" | tr , ' ')
    fi
    if [[ $values ]]; then
        mapfile -t COMPREPLY < <(compgen -W "$values" -- "$current")
    elif [[ $2 == -* ]]; then
        local options
        options=$("$1" ${subcommand:+"$subcommand"} --help 2>/dev/null | sed -n 's/^  \(-[^ ]*\).*/\1/p' | tr , ' ')
        mapfile -t COMPREPLY < <(compgen -W "$options" -- "$2")
    elif [[ ! $subcommand ]]; then
        local subcommands
        subcommands=$("$1" --help 2>/dev/null | sed -n '/^Subcommands:/,$ s/^  \([a-z][^ ]*\).*/\1/p')
        mapfile -t COMPREPLY < <(compgen -W "$subcommands" -- "$2")
    elif [[ $subcommand == explain ]]; then
        mapfile -t COMPREPLY < <(compgen -W "$("$1" explain 2>/dev/null | sed 's/ .*//')" -- "$2")
    else
        compopt -o filenames 2>/dev/null
        mapfile -t COMPREPLY < <(compgen -f -X '!*.cdef*' -- "$2"; compgen -d -- "$2")
    fi
}

complete -F _cdef cdef
