" Vim compiler file
" Compiler: cdef check, which tells all mistakes of a class definition source at once

if exists("current_compiler")
  finish
endif
let current_compiler = "cdef"

CompilerSet makeprg=cdef\ check\ %:S
CompilerSet errorformat=%f:%l:%c:\ %trror:\ %m,%f:%l:%c:\ %tarning:\ %m,%f:%l:%c:\ %tote:\ %m
" What is about a whole line, or a whole file, has no column.
CompilerSet errorformat+=%f:%l:\ %trror:\ %m,%f:%l:\ %tarning:\ %m,%f:%l:\ %tote:\ %m,%f:\ %trror:\ %m
