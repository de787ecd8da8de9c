#!/usr/bin/env python3
"""Checks that the manual page and the bash completion follow the tool's help.

    check_tool_docs.py tekit.1 tekit.bash-completion PROGRAM

Every command and option that `tekit help` and `tekit help COMMAND` show must appear in the
manual page, and the completion must offer it where it belongs.
"""
import re
import subprocess
import sys


def help_of(program, *command):
    return subprocess.run([program, "help", *command], capture_output=True, text=True,
                          check=True).stdout


def section(text, title):
    """The indented lines under "Title:" up to the next blank line."""
    lines = text.split("\n")
    start = lines.index(title + ":") + 1
    end = next((i for i in range(start, len(lines)) if not lines[i].strip()), len(lines))
    return lines[start:end]


def commands_in(text):
    return [line.split()[0] for line in section(text, "Commands")]


def options_in(text):
    options = []
    for line in section(text, "Options"):
        head = re.split(r"\s{2,}", line.strip())[0]
        options += [word.split()[0] for word in head.split(", ")]
    return options


def completions(script, words):
    """What the completion offers after `words` (the last one being completed)."""
    quoted = " ".join("'" + w + "'" for w in words)
    code = (f"source '{script}'; COMP_WORDS=({quoted}); COMP_CWORD={len(words) - 1}; "
            "_tekit; printf '%s\\n' \"${COMPREPLY[@]}\"")
    out = subprocess.run(["bash", "-c", code], capture_output=True, text=True, check=True).stdout
    return set(out.split())


def main():
    man_file, completion_file, program = sys.argv[1:4]
    man = open(man_file, encoding="utf-8").read()
    man = re.sub(r"\\f[BIRP]", "", man).replace("\\-", "-")
    problems = []

    def expect(condition, what):
        if not condition:
            problems.append(what)

    top = help_of(program)
    expectations = [((), commands_in(top) + options_in(top), ["tekit", ""])]
    for command in commands_in(top):
        if command == "help":
            continue
        text = help_of(program, command)
        if "Commands:" in text:
            expectations.append(((command,), commands_in(text), ["tekit", command, ""]))
            for sub in commands_in(text):
                options = options_in(help_of(program, command, sub))
                expectations.append(((command, sub), options, ["tekit", command, sub, "-"]))
        else:
            expectations.append(((command,), options_in(text), ["tekit", command, "-"]))

    for command, names, words in expectations:
        where = " ".join(("tekit",) + command)
        offered = completions(completion_file, words)
        for name in names:
            expect(name in offered, f"completion of '{where}' does not offer {name}")
            pattern = re.escape(name) + (r"\b" if name[-1].isalnum() else "")
            expect(re.search(pattern, man), f"the manual page does not name {name} ({where})")
    print("\n".join(problems) if problems else f"{len(expectations)} help texts followed")
    return 1 if problems else 0


if __name__ == "__main__":
    sys.exit(main())
