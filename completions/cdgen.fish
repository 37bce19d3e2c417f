# fish completion for cdgen

function __cdgen_suffix
    # The first operand is the source, the second the database.
    set -l operands (string match --invert --regex -- '^-|^[0-9]+$' (commandline -opc)[2..-1])
    switch (count $operands)
        case 0
            echo .cdefsrc
        case 1
            echo .cdef
    end
end

complete -c cdgen -f -k -n 'test -n "$(__cdgen_suffix)"' -a '(__fish_complete_suffix (__cdgen_suffix))'
complete -c cdgen -f
complete -c cdgen -s n -d 'End messages without a newline'
complete -c cdgen -s d -x -a '1 2 3' -d 'Trace, up to this level'
complete -c cdgen -s s -d 'Write the other byte order'
