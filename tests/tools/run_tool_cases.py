#!/usr/bin/env python3
"""Runs the transcript cases of one file against the tekit program.

    run_tool_cases.py [--windows] CASES.txt -- PROGRAM [EMULATOR...]

A case file reads like a terminal session. Each case is:

    $ tekit path check - 'C:\\a\\\\b'       the command line, quoted as in sh; $'..' takes
                                          C escapes (\\t, \\n, \\xHH); a final "> /dev/full"
                                          sends standard output there
    < C:\\data\\report.ini                  a line of standard input ("< $'..'" with escapes,
                                          "<" alone an empty line)
    C:\\data\\report.ini: valid             expected standard output, line by line
    2> tekit: 1 of 2 paths is not valid    expected standard error, line by line
    [exit 1]                              the exit status; ends the case

The cases of a file run in order, in an empty temporary directory of their own, so a case
may write a file that later cases read. The files of the directory named by the environment
variable TEKIT_CASE_FILES, when set, are copied into it first.
Between cases, blank lines and lines starting with "#" are comments. A line
"[not on windows: <reason>]" before a case skips it on the Windows leg, saying why.
Output of a case run with --json must parse as JSON. A mismatch prints a diff; the script
exits 1 when any case failed.
"""
import difflib
import json
import os
import re
import shutil
import subprocess
import sys
import tempfile

ESCAPES = {"t": "\t", "n": "\n", "r": "\r", "\\": "\\", "'": "'", "0": "\0"}


def c_unescape(text):
    def one(m):
        s = m.group(1)
        if s[0] != "x":
            return ESCAPES[s]
        value = int(s[1:], 16)  # a byte: above 0x7F it travels as itself, not as UTF-8
        return chr(value) if value < 0x80 else chr(0xDC00 + value)
    return re.sub(r"\\(x[0-9A-Fa-f]{2}|[tnr\\'0])", one, text)


def split_words(line):
    """sh-like words: bare (backslash escapes), '..', "..", $'..' (C escapes)."""
    words, i, n = [], 0, len(line)
    while i < n:
        if line[i].isspace():
            i += 1
            continue
        word = ""
        while i < n and not line[i].isspace():
            if line.startswith("$'", i):
                end = i + 2
                while line[end] != "'":
                    end += 2 if line[end] == "\\" else 1
                word += c_unescape(line[i + 2:end])
                i = end + 1
            elif line[i] == "'":
                end = line.index("'", i + 1)
                word += line[i + 1:end]
                i = end + 1
            elif line[i] == '"':
                i += 1
                while line[i] != '"':
                    if line[i] == "\\" and line[i + 1] in '\\"$`':
                        i += 1
                    word += line[i]
                    i += 1
                i += 1
            elif line[i] == "\\":
                word += line[i + 1]
                i += 2
            else:
                word += line[i]
                i += 1
        words.append(word)
    return words


class Case:
    def __init__(self, line_number, command, skip):
        self.line_number, self.command, self.skip = line_number, command, skip
        self.stdin, self.stdout, self.stderr, self.exit = [], [], [], None


def parse(path):
    cases, case, skip = [], None, None
    with open(path, encoding="utf-8") as f:
        for number, raw in enumerate(f, 1):
            line = raw.rstrip("\n")
            if case is None:
                if line.startswith("$ "):
                    case, skip = Case(number, line[2:], skip), None
                elif line.startswith("[not on windows:"):
                    skip = line[len("[not on windows:"):].rstrip("]").strip()
                elif line.strip() and not line.startswith("#"):
                    sys.exit(f"{path}:{number}: expected '$ command', got: {line}")
                continue
            exit_match = re.fullmatch(r"\[exit (\d+)\]", line)
            if exit_match:
                case.exit = int(exit_match.group(1))
                cases.append(case)
                case = None
            elif (line == "<" or line.startswith("< ")) and not case.stdout and not case.stderr:
                text = line[2:]
                if text.startswith("$'") and text.endswith("'"):
                    text = c_unescape(text[2:-1])
                case.stdin.append(text + "\n")
            elif line.startswith("2> ") or line == "2>":
                case.stderr.append(line[3:])
            else:
                case.stdout.append(line)
    if case is not None:
        sys.exit(f"{path}:{case.line_number}: case has no [exit N] line")
    return cases


def run(case, program, windows, directory):
    words = split_words(case.command)
    if not words or words[0] != "tekit":
        sys.exit(f"line {case.line_number}: a command starts with 'tekit'")
    stdout_file = None
    if len(words) >= 3 and words[-2] == ">":
        stdout_file = open(os.path.join(directory, words[-1]), "wb")
        words = words[:-2]
    try:
        result = subprocess.run(program + words[1:], input="".join(case.stdin).encode("utf-8", "surrogateescape"),
                                stdout=stdout_file or subprocess.PIPE,
                                stderr=subprocess.PIPE, timeout=300, cwd=directory)
    finally:
        if stdout_file:
            stdout_file.close()
    out = (result.stdout or b"").decode("utf-8", "backslashreplace")
    err = result.stderr.decode("utf-8", "backslashreplace")
    if windows:  # a Windows program writes text with CR LF line ends
        out, err = out.replace("\r\n", "\n"), err.replace("\r\n", "\n")
    return out, err, result.returncode


def lines_of(text):
    return text[:-1].split("\n") if text.endswith("\n") else (text.split("\n") if text else [])


def check(case, out, err, status):
    problems = []
    for name, expected, actual in (("stdout", case.stdout, lines_of(out)),
                                   ("stderr", case.stderr, lines_of(err))):
        if expected != actual:
            diff = difflib.unified_diff(expected, actual, "expected " + name, "actual " + name,
                                        lineterm="")
            problems.append("\n".join(diff))
    if status != case.exit:
        problems.append(f"exit status {status}, expected {case.exit}")
    if "--json" in split_words(case.command) and out.strip() and case.exit != 2:
        try:
            json.loads(out)
        except ValueError as e:
            problems.append(f"standard output is not JSON: {e}")
    return problems


def main():
    args = sys.argv[1:]
    windows = args[0] == "--windows"
    if windows:
        args = args[1:]
    case_file, program = args[0], args[2:]
    # The cases run in a directory of their own: a program given by a relative path is found
    # from here.
    program = [os.path.abspath(word) if os.path.exists(word) else word for word in program]
    failed = 0
    directory = tempfile.TemporaryDirectory(prefix="tekit-tool-case-")
    # Files the cases read (sample executables, ...), copied in before the first case.
    if os.environ.get("TEKIT_CASE_FILES"):
        shutil.copytree(os.environ["TEKIT_CASE_FILES"], directory.name, dirs_exist_ok=True)
    for case in parse(case_file):
        if windows and case.skip:
            print(f"{case_file}:{case.line_number}: skipped on the Windows leg: {case.skip}")
            continue
        problems = check(case, *run(case, program, windows, directory.name))
        if problems:
            failed += 1
            print(f"{case_file}:{case.line_number}: $ {case.command}")
            print("\n".join(problems) + "\n")
    print(f"{case_file}: {failed} failed" if failed else f"{case_file}: all cases passed")
    return 1 if failed else 0


if __name__ == "__main__":
    sys.exit(main())
