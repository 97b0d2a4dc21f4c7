#!/usr/bin/env python3
# SPDX-License-Identifier: MIT
"""Counts phrases that are hard to read, and misspelt words, for each part of the repository."""

import argparse
import collections
import pathlib
import re
import subprocess
import sys

# The highest number of phrases in 1,000 words of a part.
LIMIT = 1.5

START = r"(?:\A\s*|[.;:|!?]\s+|\n[ ]*\n\s*)"
PHRASES = [
    (r"\b(?:comes?|came|coming)\s+of\b", "follows from, is caused by"),
    (r"\b(?:stands?|stood|standing)\s+(?:in|for|beside|below|at|between|behind|on)\b(?!-)", "is in, means"),
    (r"\b(?:stands|stood)\b(?!\s+(?:in|for|beside|below|at|between|behind|on)\b)", "is"),
    (r"\btold\s+(?:in|by|at)\b", "described in, reported by"),
    (r"\btells\b(?!\s+apart)|\btell\s+(?:of|in|by)\b", "describes, reports, returns"),
    (r"\bsave\s+(?:for|that|of|in|where|when|the|by|out)\b", "except"),
    (r"\bwhich\s+is\s+meant\b|\bor\s+is\s+meant\b", "intentionally"),
    (r"\banew\b", "again"),
    (r"\bmay\s+not\s+be\s+(?!a\b|the\b)\w+", "cannot be, must not be"),
    (r"\bat\s+the\s+start\b(?!\s+of\b)", "by default, first"),
    (r"\blikewise\b", "also, in the same way"),
    (r"\bthe\s+same\s+of\b", "the same for"),
    (r"\bas\s+a\s+rule\b", "usually"),
    (r"\bmeanwhile\b", "while ..."),
    (r"\bof\s+the\s+moment\b", "current"),
    (r"\b(?:raises?|raised|raising)\b(?!\s+the\s+(?:\w+\s+)?version)", "throws"),
    (START + r"Of\s+(?:a|an|the|two|what)\b", "the subject first"),
    (START + r"Where\s+(?!is\b|are\b|do\b|does\b)[^.?|:;]{1,120},(?! and\b)", "if"),
    (r"\b[Ww]hat\s+is\s+not\s+so\b", "the subject first"),
    (r"\bis\s+(?:libgit2|git)'s\s+to\s+\w+", "libgit2 decides"),
]

CODE = r".*\.(?:hpp|cpp|h|c)$"
# Parts of the repository: a file belongs to the first part whose pattern matches its name. The last word says
# which text of the file is read.
TEXTS = [
    ("README", r"README\.md$", "prose"),
    ("documents", r".*\.md$", "prose"),
    ("exported headers", r"include/" + CODE, "comments"),
    ("other comments", r"(?:host|error|util|options|main|examples)/" + CODE, "comments"),
    ("comments of tests", r"(?:tests|bench|fuzz)/" + CODE, "comments"),
    ("scripts", r"(?:.*/)?(?:CMakeLists\.txt|[^/]*\.(?:py|bash|sh|cmake|zsh))$", "hashes"),
    ("scripts", r"(?:scripts|\.ci|host/bin/lnxhost)/[^.]*$", "hashes"),
]
MESSAGES = [
    ("messages", r"examples/" + CODE, "literals"),
    ("messages", r".*\.1$", "manual"),
    ("messages", r"host/po/.*\.pot$", "literals"),
    ("messages", r"(?:scripts|\.ci)/[^.]*$", "help"),
]
# Files that are not spelt: German and Japanese, inputs of fuzzing, and words that tests misspell.
NOT_SPELT = r"host/po/|fuzz/corpus/|examples/.*(?:[tT]exts|language)\.cpp$|tests/shell/|tests/scripts/words\.bash|.*\.(?:png|1)$"
IGNORED_WORDS = "commitin,nd"

PIECES = re.compile(r"(?P<comment>//[^\n]*|/\*.*?\*/)|R\"(?P<mark>\w*)\(.*?\)(?P=mark)\""
                    r"|\"(?:\\.|[^\"\\\n])*\"|'(?:\\.|[^'\\\n])+'", re.DOTALL)


def keep(text, spans):
    """Returns the text with blanks for everything outside the spans, so that lines keep their numbers."""
    kept, end = [], 0
    for start, stop in spans:
        kept.append(re.sub(r"[^\n]", " ", text[end:start]))
        kept.append(text[start:stop])
        end = stop
    kept.append(re.sub(r"[^\n]", " ", text[end:]))
    return "".join(kept)


def blank(pattern, text, flags=0):
    return re.sub(pattern, lambda found: re.sub(r"[^\n]", " ", found.group()), text, flags=flags)


def prose(text):
    """Returns Markdown without its code and without what scripts write."""
    text = blank(r"<!-- (\w+):begin -->.*?<!-- \1:end -->", text, re.DOTALL)
    text = blank(r"^[ ]*```.*?^[ ]*```", text, re.DOTALL | re.MULTILINE)
    text = blank(r"\]\([^)]*\)|`[^`]*`", text)
    return re.sub(r"^(\s*)[-*] ", r"\1. ", text, flags=re.MULTILINE)


def comments(text):
    text = keep(text, [m.span() for m in PIECES.finditer(text) if m.group("comment")])
    return blank(r"//+<?|/\*+|\*/|`[^`\n]*`|.*(?:SPDX|NOLINT).*", text)


def literals(text):
    """Returns literals with more than one word."""
    pieces = [m for m in PIECES.finditer(text) if '"' in m.group()[:1] and " " in m.group()]
    return blank(r"\"|\\n", keep(text, [m.span() for m in pieces]))


def hashes(text):
    """Returns comments that begin with a hash, and Python's documentation strings."""
    spans = [m.span(1) for m in re.finditer(r'(?:^|(?<=\s))#(?!!)(\s.*)|"""(?:.*?)"""', text,
                                            re.MULTILINE) if m.group(1)]
    spans += [m.span(1) for m in re.finditer(r'"""(.*?)"""', text, re.DOTALL)]
    return blank(r".*SPDX.*", keep(text, sorted(spans)))


def help_texts(text):
    spans = [m.span(1) for m in re.finditer(r"<<'?END'?[^\n]*\n(.*?)^END$", text, re.DOTALL | re.MULTILINE)]
    return keep(text, spans)


def manual(text):
    return blank(r"^[.'].*", text, re.MULTILINE)


READERS = {"prose": prose, "comments": comments, "literals": literals, "hashes": hashes,
           "help": help_texts, "manual": manual}


def find_files(root):
    listed = subprocess.run(["git", "ls-files", "--cached", "--others", "--exclude-standard", "-z"],
                            cwd=root, check=True, capture_output=True, text=True).stdout
    return sorted({name for name in listed.split("\0") if name and (root / name).is_file()})


def count(root, names):
    """Returns the words of each part, and its phrases: file, line, text and what to write instead."""
    words, found = {}, collections.defaultdict(list)
    for name in names:
        parts = [next(((part, reader) for part, pattern, reader in TEXTS if re.match(pattern, name)), None)]
        parts += [(part, reader) for part, pattern, reader in MESSAGES if re.match(pattern, name)]
        for part, reader in filter(None, parts):
            text = (root / name).read_text(encoding="utf-8", errors="replace")
            # This file lists all phrases itself.
            if name.endswith("lint.d/words.py"):
                continue
            text = READERS[reader](text)
            words[part] = words.get(part, 0) + len(re.findall(r"[A-Za-z][A-Za-z'’-]*", text))
            for pattern, instead in PHRASES:
                for match in re.finditer(pattern, text):
                    where = match.start() + len(match.group()) - len(match.group().lstrip(" \n.;:|!?"))
                    found[part].append((name, text.count("\n", 0, where) + 1,
                                        " ".join(match.group().split()).lstrip(".;:|!? "), instead))
    return words, found


def check_spelling(root, names):
    """Returns true if codespell finds no misspelt word."""
    spelt = [name for name in names if not re.match(NOT_SPELT, name)]
    return not spelt or subprocess.run(
        ["codespell", "--ignore-words-list", IGNORED_WORDS, "--", *spelt], cwd=root).returncode == 0


def main():
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("--list", action="store_true", help="print every place, with what to write instead")
    parser.add_argument("folder", nargs="?", default=".", type=pathlib.Path)
    options = parser.parse_args()
    names = find_files(options.folder)
    words, found = count(options.folder, names)
    failed = False
    for part, number in words.items():
        share = 1000 * len(found[part]) / max(number, 1)
        over = share > LIMIT
        failed |= over
        print(f"   {part}: {share:.2f} in 1,000 of {number:,} words{' (too many)' if over else ''}")
        if over or options.list:
            for name, line, text, instead in sorted(found[part]):
                print(f"{name}:{line}: \"{text}\": {instead}")
    sys.exit(0 if check_spelling(options.folder, names) and not failed else 1)


if __name__ == "__main__":
    main()
