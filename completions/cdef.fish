# fish completion for cdef; what it understands is taken from its own help

function __cdef_subcommand
    string match --invert --regex -- '^-' (commandline -opc)[2..-1] | head -n 1
end

function __cdef_subcommands
    cdef --help 2>/dev/null | sed -nE '/^Subcommands:/,$ s/^  ([a-z][^ ]*) */\1\t/p'
end

function __cdef_options
    cdef (__cdef_subcommand) --help 2>/dev/null | sed -nE -e '/^  -/!d' -e 's/ (Excludes|Needs):( -[^ ]*)*//' -e h \
        -e 's/^  ([^, ]*),?[^ ]* */\1\t/p' -e g -e 's/^  [^, ]*,([^, ]*) */\1\t/p'
end

function __cdef_values
    set -l option (commandline -opc)[-1]
    if contains -- $option --warn --no-warn
        echo all
        cdef explain 2>/dev/null | sed -nE 's/^(S[0-9]+) .* \[([^]]+)\]$/\1 \2/p' | string split ' '
        return
    end
    string match --quiet -- '--*' $option
    and cdef (__cdef_subcommand) --help 2>/dev/null | sed -nE "s/^  $option [A-Z]+:\{([^}]*)\}.*/\1/p" | string split ,
end

# Values that are optional: --option=value.
function __cdef_joined_values
    set -l option (string split -f 1 = -- (commandline -ct))
    cdef (__cdef_subcommand) --help 2>/dev/null | sed -nE "s/^  $option \[=[A-Z]+:\{([^}]*)\}.*/\1/p" | string split , |
        string replace -r '^' -- "$option="
end

complete -c cdef -f
complete -c cdef -n 'string match --quiet -- "--*=*" (commandline -ct)' -a '(__cdef_joined_values)'
complete -c cdef -n 'test -n "$(__cdef_values)"' -a '(__cdef_values)'
complete -c cdef -n 'test -z "$(__cdef_subcommand)"' -a '(__cdef_subcommands)'
complete -c cdef -k -n 'test -n "$(__cdef_subcommand)"; and test "$(__cdef_subcommand)" != explain; and test -z "$(__cdef_values)"; and not string match --quiet -- "--*=*" (commandline -ct)' -a '(__fish_complete_suffix .cdef)'
complete -c cdef -k -n 'test "$(__cdef_subcommand)" = explain; and test -z "$(__cdef_values)"' -a '(cdef explain 2>/dev/null | sed -E "s/ +/\t/")'
complete -c cdef -n 'string match --quiet -- "-*" (commandline -ct)' -a '(__cdef_options)'
