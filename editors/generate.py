#!/usr/bin/env python3
"""Writes the editor files that hold names of the language.

The names come from the compiler itself: the first argument is the program list_names.  The second is the directory to
write to, this one unless given; a test writes to another and compares.
"""

import collections
import json
import pathlib
import subprocess
import sys

HERE = pathlib.Path(__file__).resolve().parent


def read_names(program):
    """Stanzas with their attributes, in the catalogue's order; and the words that some values are made of."""
    stanzas = collections.OrderedDict()
    words = collections.defaultdict(list)
    lines = subprocess.run([program], check=True, capture_output=True, text=True).stdout.splitlines()
    for kind, *rest in map(str.split, lines):
        if kind == "stanza":
            stanzas[rest[0]] = []
        elif kind == "attribute":
            stanzas[rest[0]].append(rest[1])
        elif kind == "property":
            words["property"].append(rest[1])
        elif kind in ("type", "variable", "permission"):
            words[kind].append(rest[0])
    return stanzas, {kind: sorted(set(names)) for kind, names in words.items()}


def longest_first(names):
    """Sorts names so that none hides a longer name that begins with it."""
    return sorted(names, key=lambda name: (-len(name), name))


# The shapes of lines, for Vim and, below, for grammars.
# SKIPPED: empty, or a comment with nothing but blanks and quotes in front; in column 1 too. Behind an odd number of
# quotes only the number sign begins one.
# NAME: of an attribute, with the blanks at its end. WITHOUT_VALUE: what lacks the equals sign, up to a comment.
# VALUED: an equals sign; but a line whose value is "" is not looked at, whatever its name.
VIM_SKIPPED = r"""\%(["\t ]*\%(#\|$\)\|[\t ]*\%("[\t ]*"[\t ]*\)*\/[\/*]\)"""
VIM_HEADER = rf"{VIM_SKIPPED}\@![^ \t]"
VIM_NAME = r"""\%(\/[\/*]\)\@![^= \t#"]\%(\%(\/[\/*]\)\@![^=#]\)*"""
VIM_WITHOUT_VALUE = r"""\%(\/[\/*]\)\@![^= \t#"]\%(\%(\/[\/*]\)\@![^=#"]\)*\ze\%(#\|\/[\/*]\|$\)"""
VIM_VALUED = r"""=\%(""[ \t]*\%(#\|\/[\/*]\|$\)\)\@!"""
VIM_AFTER_HEADER = r"\%([ \t#]\|\/[\/*]\|$\)"

SKIPPED = r"""(?:["\t ]*(?:#|$)|[\t ]*(?:"[\t ]*"[\t ]*)*/[/*])"""
HEADER = rf"(?!{SKIPPED})[^ \t\r\n]"
NAME = r"""(?!/[/*])[^= \t#"](?:(?!/[/*])[^=#])*"""
WITHOUT_VALUE = r"""(?!/[/*])[^= \t\r\n#"](?:(?!/[/*])[^=#"\r\n])*(?=#|/[/*]|$)"""
VALUED = r"""=(?!""[ \t]*(?:#|/[/*]|$))"""
AFTER_HEADER = r"(?=[ \t#]|/[/*]|$)"

VIM_HEAD = '''" Vim syntax file
" Language: class definition source of cdgen
" Made by editors/generate.py from the compiler's catalogue; do not edit.

if exists("b:current_syntax")
  finish
endif

syn case match
syn region cdefString start=/"/ end=/"\\|$/ contained oneline
syn match cdefNumber /[=,]\\@1<=-\\?\\%(0[xX]\\x\\+\\|\\d\\+\\%(\\.\\d*\\)\\?\\%([eE][-+]\\?\\d\\+\\)\\?\\)\\ze\\%([,. \\t#]\\|$\\)/ contained
syn match cdefComment /\\%(#\\|\\/\\/\\|\\/\\*\\).*$/ contains=@Spell
'''

VIM_TAIL = '''
hi def link cdefUnknownStanza Error
hi def link cdefUnknownAttribute Error
hi def link cdefNoAttribute Error
hi def link cdefStanza Statement
hi def link cdefAttribute Identifier
hi def link cdefType Type
hi def link cdefProperty Constant
hi def link cdefString String
hi def link cdefNumber Number
hi def link cdefComment Comment

let b:current_syntax = "cdefsrc"
'''


def vim_syntax(stanzas, words):
    """Attributes are recognised only inside their stanza, so that misspelled and misplaced ones stand out."""
    lines = [VIM_HEAD]
    lines.append(f"syn match cdefUnknownStanza /^{VIM_HEADER}.*$/ contains=cdefComment")
    lines.append(rf"syn match cdefUnknownAttribute /^[ \t]\+\zs{VIM_NAME}\ze{VIM_VALUED}/ contained")
    lines.append(rf"syn match cdefNoAttribute /^[ \t]\+\zs{VIM_WITHOUT_VALUE}/ contained")
    types = r"\|".join(longest_first(words["type"] + words["variable"]))
    lines.append(rf"syn match cdefType /\%(DataType=\|VariableType=\)\@13<=\%({types}\)\ze\%([ \t#]\|$\)/ contained")
    properties = r"\|".join(longest_first(words["property"]))
    lines.append(rf"syn match cdefProperty /\%(Properties=.*\)\@200<=\<\%({properties}\)\>/ contained")
    shared = "cdefComment,cdefString,cdefNumber,cdefType,cdefProperty"
    for stanza, attributes in stanzas.items():
        names = r"\|".join(longest_first(attributes))
        lines.append("")
        lines.append(rf"syn match cdefAttribute{stanza} /^[ \t]\+\zs\%({names}\)\ze=/ contained")
        lines.append(
            rf"syn region cdefIn{stanza} matchgroup=cdefStanza start=/^{stanza}\ze{VIM_AFTER_HEADER}/ "
            rf"end=/^\ze{VIM_HEADER}/ "
            f"contains=cdefUnknownAttribute,cdefNoAttribute,cdefAttribute{stanza},{shared}"
        )
        lines.append(f"hi def link cdefAttribute{stanza} cdefAttribute")
    # In the middle of a file, what is in force is found by the nearest header above: a known one begins its region.
    known = r"\|".join(longest_first(stanzas))
    lines.append("")
    lines += [rf"syn sync match cdefSync{stanza} grouphere cdefIn{stanza} /^{stanza}\ze{VIM_AFTER_HEADER}/"
              for stanza in stanzas]
    lines.append(rf"syn sync match cdefSyncUnknown grouphere NONE /^\%(\%({known}\){VIM_AFTER_HEADER}\)\@!{VIM_HEADER}/")
    return "\n".join(lines) + "\n" + VIM_TAIL


def textmate_stanza(stanza, attributes):
    """A stanza extends from its header to the next header."""
    names = "|".join(longest_first(attributes))
    return {
        "name": f"meta.stanza.{stanza.lower()}.cdefsrc",
        "begin": rf"^({stanza}){AFTER_HEADER}",
        "beginCaptures": {"1": {"name": "keyword.control.stanza.cdefsrc"}},
        "end": rf"^(?={HEADER})",
        "patterns": [
            {"include": "#comment"},
            {"match": rf"^[ \t]+({names})(=)", "captures": {"1": {"name": "variable.other.attribute.cdefsrc"},
                                                             "2": {"name": "keyword.operator.assignment.cdefsrc"}}},
            {"match": rf"^[ \t]+({NAME})(?={VALUED})",
             "captures": {"1": {"name": "invalid.illegal.attribute.cdefsrc"}}},
            {"match": rf"^[ \t]+({WITHOUT_VALUE})", "captures": {"1": {"name": "invalid.illegal.line.cdefsrc"}}},
            {"include": "#value"},
        ],
    }


def textmate_grammar(stanzas, words):
    types = "|".join(longest_first(words["type"] + words["variable"]))
    properties = "|".join(longest_first(words["property"]))
    return {
        "comment": "Made by editors/generate.py from the compiler's catalogue; do not edit.",
        "name": "Class definition source",
        "scopeName": "source.cdefsrc",
        "fileTypes": ["cdefsrc"],
        "patterns": [
            {"include": "#comment"},
            *[{"include": f"#{stanza}"} for stanza in stanzas],
            {"match": rf"^{HEADER}.*$", "name": "invalid.illegal.stanza.cdefsrc"},
        ],
        "repository": {
            "comment": {"match": r"(#|//|/\*).*$", "name": "comment.line.cdefsrc"},
            "value": {
                "patterns": [
                    {"match": r'"[^"]*("|$)', "name": "string.quoted.double.cdefsrc"},
                    {"match": rf"(?:(?<=DataType=)|(?<=VariableType=))({types})(?=[ \t#]|$)", "name": "storage.type.cdefsrc"},
                    {"match": rf"(?<=[=,])({properties})(?=[, \t#]|$)", "name": "constant.language.cdefsrc"},
                    {"match": r"(?<=[=,.])-?(0[xX][0-9a-fA-F]+|[0-9]+)(?=[,. \t#]|$)",
                     "name": "constant.numeric.cdefsrc"},
                ]
            },
            **{stanza: textmate_stanza(stanza, attributes) for stanza, attributes in stanzas.items()},
        },
    }


def main():
    stanzas, words = read_names(sys.argv[1])
    target = pathlib.Path(sys.argv[2]) if len(sys.argv) > 2 else HERE
    files = {
        "vim/syntax/cdefsrc.vim": vim_syntax(stanzas, words),
        "vscode/syntaxes/cdefsrc.tmLanguage.json": json.dumps(textmate_grammar(stanzas, words), indent=2) + "\n",
    }
    for name, text in files.items():
        path = target / name
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_text(text)


if __name__ == "__main__":
    main()
