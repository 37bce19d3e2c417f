# bash completion for cdgen

_cdgen() {
    local word operands=0 taken=
    for word in "${COMP_WORDS[@]:1:COMP_CWORD-1}"; do
        if [[ $taken ]]; then
            taken= # the level
        elif [[ $word == -*d ]]; then
            taken=1
        elif [[ $word != -* ]]; then
            ((++operands))
        fi
    done
    local files="!*.cdef" # the database
    ((operands == 0)) && files="!*.cdefsrc"
    if [[ $taken ]]; then
        mapfile -t COMPREPLY < <(compgen -W "1 2 3" -- "$2")
    elif [[ $2 == -* ]]; then
        mapfile -t COMPREPLY < <(compgen -W "-n -d -s" -- "$2")
    elif ((operands < 2)); then
        compopt -o filenames 2>/dev/null
        mapfile -t COMPREPLY < <(compgen -f -X "$files" -- "$2"; compgen -d -- "$2")
    fi
}

complete -F _cdgen cdgen
