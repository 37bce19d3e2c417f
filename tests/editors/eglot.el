;;; eglot.el --- what a user of eglot does, without a screen  -*- lexical-binding: t -*-

(defun wait-until (what condition)
  "Let the server answer until CONDITION holds."
  (let ((end (+ (float-time) 60)))
    (while (not (funcall condition))
      (when (> (float-time) end)
        (error "Waited in vain for %s" what))
      (accept-process-output nil 0.05))))

(defun say-diagnostic ()
  "Print the first diagnostic."
  (princ (format "diagnostic: %s\n"
                 (if (flymake-diagnostics) (car (split-string (flymake-diagnostic-text (car (flymake-diagnostics))) "\n")) "none"))))

(find-file "pump.cdefsrc")
(unless (eq major-mode 'cdefsrc-mode)
  (error "Mode %s" major-mode))
(apply #'eglot (eglot--guess-contact))
(flymake-start)
(wait-until "a diagnostic" #'flymake-diagnostics)
(say-diagnostic)

(goto-char (point-min))
(search-forward "Descr")
(completion-at-point)
(eglot--signal-textDocument/didChange)
(flymake-start)
(wait-until "the diagnostic's end" (lambda () (null (flymake-diagnostics))))
(say-diagnostic)

(search-forward "\tName=")
(eglot-rename "HostName")
(eglot-format-buffer)
(save-buffer)
(eglot-shutdown (eglot-current-server))
