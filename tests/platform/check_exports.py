#!/usr/bin/env python3
"""Checks a built library's flat exports against the export list, src/tekit.exports.

The flat exports are those that are not C++ symbols (mangled "_Z..."). The check fails when
  - a listed name is not exported under its plain, undecorated name;
  - a flat name is exported that the list does not hold;
  - an export carries a standard-call decoration ("Foo@8");
  - with --include: an `extern "C"` declaration marked TEKIT_API in the public headers names a
    function the list does not hold (the Linux version script would hide it);
  - a class named with --class has no C++ export.

  check_exports.py --library tekit.dll --tool build/dev/tools/tekit/tekit --format tekit \
                   --exports src/tekit.exports --include include --class DynamicString

The export table of a DLL is read by the library itself, through the host's `tekit exe
--exports --json` (--format tekit), or by binutils' objdump (--format pe); that of a shared
object by nm (--format elf).
"""
import argparse
import json
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
    if fmt == "tekit":
        dump = subprocess.run([tool, "exe", "--exports", "--json", library], check=True,
                              capture_output=True, text=True)
        return {f["name"] for f in json.loads(dump.stdout)[0]["exports"]["functions"]
                if f["name"]}
    if fmt == "pe":
        dump = subprocess.run([tool, "-p", library], check=True, capture_output=True, text=True)
        table = dump.stdout.split("[Ordinal/Name Pointer] Table", 1)
        if len(table) < 2:
            return set()
        return set(re.findall(r"^\s*\[\s*\d+\]\s+(\S+)\s*$", table[1], re.M))
    dump = subprocess.run([tool, "-D", "--defined-only", library], check=True,
                          capture_output=True, text=True)
    # "Foo@@VERSION" would be a symbol version, not a decoration: ELF has none of those.
    return {line.split()[-1].split("@")[0] for line in dump.stdout.splitlines()
            if len(line.split()) >= 3}


# Symbols the ELF linker defines in every shared object; they are not the library's interface.
ELF_LINKER_SYMBOLS = {"_init", "_fini", "__bss_start", "_edata", "_end"}


def read_export_list(path):
    names = []
    for number, line in enumerate(pathlib.Path(path).read_text(encoding="utf-8").splitlines(), 1):
        line = line.strip()
        if not line or line.startswith("#"):
            continue
        if not re.fullmatch(r"[A-Za-z_]\w*", line):
            raise SystemExit("%s:%d: %r is not a plain C name" % (path, number, line))
        names.append(line)
    return names


def compare(listed, exports, fmt):
    """The differences between the list and the library's export table."""
    failures = []
    decoration = re.compile(r"_?([A-Za-z_]\w*)@\d+")
    decorated = {e for e in exports if decoration.fullmatch(e)}
    flat = {e for e in exports - decorated
            if not e.startswith("_Z") and not (fmt == "elf" and e in ELF_LINKER_SYMBOLS)}
    for name in sorted(set(listed) - flat):
        forms = sorted(e for e in decorated if decoration.fullmatch(e).group(1) == name)
        hint = " (exported only as %s)" % ", ".join(forms) if forms else ""
        failures.append("%s is listed but not exported%s" % (name, hint))
    for name in sorted(flat - set(listed)):
        failures.append("%s is exported but not listed" % name)
    for name in sorted(decorated):
        failures.append("%s carries a standard-call decoration" % name)
    return failures


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("--library", required=True)
    parser.add_argument("--tool", required=True,
                        help="the host's tekit program for tekit, objdump for PE, nm for ELF")
    parser.add_argument("--format", choices=["tekit", "pe", "elf"], required=True)
    parser.add_argument("--exports", required=True, help="the export list")
    parser.add_argument("--include", help="public headers whose flat declarations must be listed")
    parser.add_argument("--class", dest="classes", action="append", default=[])
    args = parser.parse_args()

    listed = read_export_list(args.exports)
    exports = exported_names(args.tool, args.library, args.format)
    if not exports:
        print("no export table found in %s" % args.library)
        return 1

    failures = compare(listed, exports, args.format)
    if args.include:
        for header in sorted(pathlib.Path(args.include).rglob("*.h")):
            text = header.read_text(encoding="utf-8", errors="replace")
            for name in flat_declarations(text):
                if name not in listed:
                    failures.append("%s, declared in %s, is not listed" % (name, header))
    for cls in args.classes:
        if not any(e.startswith("_Z") and cls in e for e in exports):
            failures.append("no C++ export of class %s" % cls)

    for failure in failures:
        print(failure)
    print("%d listed names, %d exports, %d failures" % (len(listed), len(exports), len(failures)))
    return 1 if failures else 0


if __name__ == "__main__":
    sys.exit(main())
