;;; cdef.el --- class definition sources, with the help of "cdef lsp"  -*- lexical-binding: t -*-

;; Emacs 28 with the package eglot, or a later Emacs.  Load it in the init file.

(define-derived-mode cdefsrc-mode conf-unix-mode "Class definition"
  "Class definition sources of cdgen."
  (setq-local indent-tabs-mode t
              tab-width 8))

(add-to-list 'auto-mode-alist '("\\.cdefsrc\\'" . cdefsrc-mode))

(with-eval-after-load 'eglot
  (add-to-list 'eglot-server-programs '(cdefsrc-mode . ("cdef" "lsp"))))

(when (require 'eglot nil t)
  (add-hook 'cdefsrc-mode-hook #'eglot-ensure))

(provide 'cdef)
;;; cdef.el ends here
