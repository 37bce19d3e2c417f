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

complete -c cdef -f
complete -c cdef -n 'test -z "$(__cdef_subcommand)"' -a '(__cdef_subcommands)'
complete -c cdef -k -n 'test -n "$(__cdef_subcommand)"' -a '(__fish_complete_suffix .cdef)'
complete -c cdef -n 'string match --quiet -- "-*" (commandline -ct)' -a '(__cdef_options)'
