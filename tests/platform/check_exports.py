#!/usr/bin/env python3
"""Checks a built library's export table against the flat interface of the public headers.

Every `extern "C"` declaration marked TEKIT_API under the include folder must be exported under
its plain, undecorated name (callers find these with GetProcAddress / dlsym), no export may carry
a standard-call decoration ("Foo@8"), and each class named with --class must have C++ exports.

  check_exports.py --library tekit.dll --tool x86_64-w64-mingw32-objdump --format pe \
                   --include include --class DynamicString
"""
import argparse
import pathlib
import re
import subprocess
import sys

# Conditions as they read on Windows; anything else counts as possibly true.
TRUE_CONDITIONS = {"TEKIT_HAS_OLE", "defined(_WIN32)", "defined _WIN32", "_WIN32"}


def strip_comments(text):
    """Removes comments, keeping string literals (extern "C") and line structure."""
    pattern = re.compile(r'//[^\n]*|/\*.*?\*/|"(?:\\.|[^"\\\n])*"|\'(?:\\.|[^\'\\\n])*\'', re.S)

    def keep(match):
        s = match.group(0)
        if s.startswith("/"):
            return "\n" * s.count("\n")
        return s

    return pattern.sub(keep, text)


def condition_value(condition):
    """True, False, or None when the condition's value on Windows is not known here."""
    c = re.sub(r"\s+", " ", condition.strip())
    negated = c.startswith("!")
    if negated:
        c = c[1:].strip()
    if c in TRUE_CONDITIONS:
        return not negated
    return None


def drop_inactive(text):
    """Drops preprocessor lines and the branches that are known to be off on Windows."""
    out = []
    stack = []  # per #if: [branch active?, some earlier branch was known true]
    lines = text.replace("\\\n", " ").split("\n")
    for line in lines:
        stripped = line.strip()
        m = re.match(r"#\s*(if|ifdef|ifndef|elif|else|endif)\b(.*)", stripped)
        if m:
            kind, rest = m.group(1), m.group(2)
            if kind == "ifdef":
                kind, rest = "if", "defined(%s)" % rest.strip()
            elif kind == "ifndef":
                kind, rest = "if", "!defined(%s)" % rest.strip()
            if kind == "if":
                value = condition_value(rest)
                stack.append([value is not False, value is True])
            elif kind == "elif" and stack:
                value = condition_value(rest)
                taken = stack[-1][1]
                stack[-1] = [not taken and value is not False, taken or value is True]
            elif kind == "else" and stack:
                stack[-1] = [not stack[-1][1], True]
            elif kind == "endif" and stack:
                stack.pop()
            out.append("")
            continue
        if stripped.startswith("#") or not all(active for active, _ in stack):
            out.append("")
        else:
            out.append(line)
    return "\n".join(out)


def split_statements(block):
    """Splits declarations at ';' and at the end of bodies, skipping the bodies themselves."""
    statements, current, depth = [], [], 0
    for ch in block:
        if ch == "{":
            if depth == 0:
                statements.append("".join(current))
                current = []
            depth += 1
        elif ch == "}":
            depth -= 1
        elif depth == 0:
            if ch == ";":
                statements.append("".join(current))
                current = []
            else:
                current.append(ch)
    statements.append("".join(current))
    return statements


def matching_brace(text, start):
    depth = 0
    for i in range(start, len(text)):
        if text[i] == "{":
            depth += 1
        elif text[i] == "}":
            depth -= 1
            if depth == 0:
                return i
    return len(text)


def declared_name(statement):
    """The name a flat declaration gives: the function before its '(' or the variable."""
    if "TEKIT_API" not in statement:
        return None
    head = statement.split("(", 1)[0] if "(" in statement else re.split(r"[\[=]", statement)[0]
    words = re.findall(r"[A-Za-z_]\w*", head)
    return words[-1] if words else None


def flat_declarations(header_text):
    text = drop_inactive(strip_comments(header_text))
    names = []
    for m in re.finditer(r'extern\s+"C"\s*', text):
        rest = m.end()
        if rest < len(text) and text[rest] == "{":
            end = matching_brace(text, rest)
            statements = split_statements(text[rest + 1:end])
        else:
            statements = split_statements(text[rest:])[:1]
        names += [n for n in map(declared_name, statements) if n]
    return names


def exported_names(tool, library, fmt):
    if fmt == "pe":
        dump = subprocess.run([tool, "-p", library], check=True, capture_output=True, text=True)
        table = dump.stdout.split("[Ordinal/Name Pointer] Table", 1)
        if len(table) < 2:
            return set()
        return set(re.findall(r"^\s*\[\s*\d+\]\s+(\S+)\s*$", table[1], re.M))
    dump = subprocess.run([tool, "-D", "--defined-only", library], check=True,
                          capture_output=True, text=True)
    return {line.split()[-1].split("@")[0] for line in dump.stdout.splitlines()
            if len(line.split()) >= 3}


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("--library", required=True)
    parser.add_argument("--tool", required=True, help="objdump for PE, nm for ELF")
    parser.add_argument("--format", choices=["pe", "elf"], required=True)
    parser.add_argument("--include", required=True)
    parser.add_argument("--class", dest="classes", action="append", default=[])
    args = parser.parse_args()

    declared = {}
    for header in sorted(pathlib.Path(args.include).rglob("*.h")):
        for name in flat_declarations(header.read_text(encoding="utf-8", errors="replace")):
            declared.setdefault(name, header)
    exports = exported_names(args.tool, args.library, args.format)
    if not exports:
        print("no export table found in %s" % args.library)
        return 1

    failures = []
    for name, header in sorted(declared.items()):
        if name not in exports:
            decorated = sorted(e for e in exports if re.fullmatch(r"_?%s@\d+" % name, e))
            hint = " (exported only as %s)" % ", ".join(decorated) if decorated else ""
            failures.append("%s, declared in %s, is not exported%s" % (name, header, hint))
    if args.format == "pe":
        for name in sorted(e for e in exports if re.fullmatch(r"_?[A-Za-z_]\w*@\d+", e)):
            failures.append("%s carries a standard-call decoration" % name)
    for cls in args.classes:
        if not any(e.startswith("_Z") and cls in e for e in exports):
            failures.append("no C++ export of class %s" % cls)

    for failure in failures:
        print(failure)
    print("%d flat declarations, %d exports, %d failures" %
          (len(declared), len(exports), len(failures)))
    return 1 if failures else 0


if __name__ == "__main__":
    sys.exit(main())
