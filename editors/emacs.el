;;; emacs.el --- Tries `vtsym lsp' in Emacs with Eglot as a user does  -*- lexical-binding: t -*-

;; emacs --batch -l emacs.el, in a folder with radio.h and model.json.  VTSYM_SETUP is a file with the lines of
;; docs/editor.md; the program is on the PATH.  Opens files, reads diagnostics and a hover, types, applies actions.

;;; Code:

(package-initialize)
(require 'eglot)
(load (getenv "VTSYM_SETUP") nil t t)
(unless (fboundp 'js-json-mode) ; since Emacs 29
  (define-derived-mode js-json-mode js-mode "JSON"))

(defun try-wait (what test)
  "Wait a minute at most until TEST holds; WHAT is waited for."
  (let ((last (+ (float-time) 60)))
    (while (not (funcall test))
      (when (> (float-time) last)
        (error "Waited for %s in vain: %s" what (try-messages)))
      (accept-process-output nil 0.05))))

(defun try-messages ()
  "The diagnostics of the buffer, a line each."
  (mapconcat (lambda (each)
               (format "%d: %s" (line-number-at-pos (flymake-diagnostic-beg each)) (flymake-diagnostic-text each)))
             (flymake-diagnostics) "\n"))

(defun try-wait-for (line text)
  "Wait for a diagnostic in LINE with TEXT, after whatever Eglot puts before it."
  (let ((pattern (format "^%d: .*%s" line (regexp-quote text))))
    (try-wait pattern (lambda () (string-match-p pattern (try-messages))))))

(defun try-line (number)
  "The text of the line NUMBER."
  (save-excursion
    (goto-char (point-min))
    (forward-line (1- number))
    (buffer-substring-no-properties (line-beginning-position) (line-end-position))))

(defun try-is (got expected)
  "Demand that GOT is EXPECTED."
  (unless (equal got expected)
    (error "It is %S rather than %S" got expected)))

(defun try-open (file mode)
  "Open FILE in MODE with its server."
  (find-file file)
  (funcall mode)
  (apply #'eglot (eglot--guess-contact))
  (flymake-start))

(defun try-action (number title)
  "Apply the action TITLE of the line NUMBER."
  (goto-char (point-min))
  (forward-line (1- number))
  (let* ((actions (eglot-code-actions (line-beginning-position) (line-end-position) "quickfix"))
         (action (seq-find (lambda (each) (equal (plist-get each :title) title)) actions)))
    (unless action
      (error "There is no action %s but %S" title actions))
    (eglot--apply-workspace-edit (plist-get action :edit))))

(defun try-hover ()
  "The hover at point."
  (plist-get (plist-get (jsonrpc-request (eglot--current-server-or-lose) :textDocument/hover
                                         (eglot--TextDocumentPositionParams))
                        :contents)
             :value))

(let ((eglot-confirm-server-initiated-edits nil)
      (make-backup-files nil))
  (try-open "radio.h" #'c-mode)
  (try-wait-for 4 "'#if PROTOCOL >= 2 && defined(CRC)' can be '#if defined(CRC)'")
  (try-wait-for 9 "'#elif defined(LEGACY) && PROTOCOL > 2' is dead")
  (goto-char (point-min))
  (forward-line 4)
  (unless (string-match-p "Built where `?PROTOCOL >= 3 && defined(CRC)" (try-hover))
    (error "The hover is %s" (try-hover)))
  (try-action 4 "Write 'defined(CRC)'")
  (try-is (try-line 4) "#if defined(CRC)   /* checksums came with protocol 2 */")

  ;; What is typed, with characters that are several bytes and several code units.
  (goto-char (point-max))
  (insert "/* \U0001F600\n\U0001F600 \u00e4 */ #if LEGACY && !LEGACY\n#endif\n")
  (eglot--signal-textDocument/didChange)
  (try-wait-for 15 "'#if LEGACY && !LEGACY' is dead")
  (save-buffer)

  (try-open "model.json" #'js-json-mode)
  (try-wait-for 12 "Engine/Hydrogen is never active")
  (try-action 9 "Write 'FUEL==1'")
  (try-is (and (string-match-p "\"condition\": \"FUEL==1\"" (try-line 9)) t) t)
  (save-buffer)
  (eglot-shutdown-all))

;;; emacs.el ends here
