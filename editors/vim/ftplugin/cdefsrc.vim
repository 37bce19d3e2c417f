" Vim filetype plugin
" Language: class definition source of cdgen

if exists("b:did_ftplugin")
  finish
endif
let b:did_ftplugin = 1

setlocal comments=:# commentstring=#\ %s noexpandtab

compiler cdef

let b:undo_ftplugin = "setlocal comments< commentstring< expandtab< makeprg< errorformat<"
