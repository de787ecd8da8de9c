#!/usr/bin/env python3
"""Compares what `tekit exe --exports --imports --json` reads from Windows executables with
what binutils' `objdump -p` reads from them: machine, bitness, DLL and large-address flags,
subsystem, every export (ordinal, name, forwarder) and every ordinary import (DLL, function
name and hint, or ordinal).

  exe_vs_objdump.py --tool build/dev/tools/tekit/tekit \
      --objdump x86-64=x86_64-w64-mingw32-objdump --objdump i386=i686-w64-mingw32-objdump \
      FILE...

A FILE that does not exist is left out with a note; when no FILE can be compared (no objdump,
no file) the script says why and exits 77, which ctest reports as skipped.
"""
import argparse
import json
import os
import re
import shutil
import subprocess
import sys

SKIPPED = 77
FORMATS = {"pei-i386": "i386", "pei-x86-64": "x86-64", "pei-aarch64-little": "arm64"}
SUBSYSTEMS = {1: "native", 2: "windows-gui", 3: "windows-cui", 9: "windows-ce-gui",
              10: "efi-application"}


def objdump_view(text):
    """The facts of an `objdump -p` dump, in the shape of view()."""
    fmt = re.search(r"file format (\S+)", text).group(1)
    characteristics = int(re.search(r"^Characteristics 0x([0-9a-f]+)", text, re.M).group(1), 16)
    magic = re.search(r"^Magic\s+\S+\s+\((PE32\+?)\)", text, re.M).group(1)
    subsystem = int(re.search(r"^Subsystem\s+([0-9a-f]+)", text, re.M).group(1), 16)

    exports = set()
    base = re.search(r"^Ordinal Base\s+(\d+)", text, re.M)
    if base:
        base = int(base.group(1))
        eat = text.split("Export Address Table -- Ordinal Base", 1)[1]
        eat, names_part = eat.split("[Ordinal/Name Pointer] Table", 1)
        names = {}
        for m in re.finditer(r"^\t\[\s*(\d+)\] (\S+)$", names_part.split("\n\n", 1)[0], re.M):
            names.setdefault(int(m.group(1)), []).append(m.group(2))
        for m in re.finditer(r"^\t\[\s*(\d+)\] \+base\[\s*\d+\] ([0-9a-f]+) (Export|Forwarder) "
                             r"RVA(?: -- (\S+))?$", eat, re.M):
            index, rva = int(m.group(1)), int(m.group(2), 16)
            if rva == 0:
                continue
            for name in names.get(index, [None]):
                exports.add((base + index, name, m.group(4)))

    imports = []
    section = text.split("The Import Tables", 1)
    if len(section) == 2:
        body = re.split(r"\n(?=There is an export table|The Export Tables|PE File Base|"
                        r"The Delay Import|\S)", section[1])[0]
        for block in body.split("DLL Name: ")[1:]:
            lines = block.split("\n")
            functions = []
            for line in lines[1:]:
                m = re.match(r"^\t[0-9a-f]+\t\s*(\d+)\s+(\S+)", line)
                if m:
                    number, name = int(m.group(1)), m.group(2)
                    functions.append(("#%d" % number) if name == "<none>" else (name, number))
            imports.append((lines[0].strip(), functions))
    return {"machine": FORMATS.get(fmt, fmt), "bitness": 64 if magic == "PE32+" else 32,
            "dll": bool(characteristics & 0x2000),
            "largeAddressAware": bool(characteristics & 0x20),
            "subsystem": SUBSYSTEMS.get(subsystem, "unknown"), "exports": exports,
            "imports": imports}


def tool_view(record):
    exports = {(f["ordinal"], f["name"], f["forwarder"]) for f in record["exports"]["functions"]}
    imports = [(m["module"], [("#%d" % f["ordinal"]) if "ordinal" in f else (f["name"], f["hint"])
                              for f in m["functions"]])
               for m in record["imports"] if not m["delayLoaded"]]
    return {key: record[key] for key in ("machine", "bitness", "dll", "largeAddressAware",
                                         "subsystem")} | {"exports": exports, "imports": imports}


def differences(name, ours, theirs):
    problems = []
    for key in ours:
        if ours[key] == theirs[key]:
            continue
        if key == "exports":
            for extra in sorted(ours[key] - theirs[key], key=str)[:10]:
                problems.append("%s: export %s read only by tekit" % (name, extra))
            for missing in sorted(theirs[key] - ours[key], key=str)[:10]:
                problems.append("%s: export %s read only by objdump" % (name, missing))
        else:
            problems.append("%s: %s is %r for tekit, %r for objdump" %
                            (name, key, ours[key], theirs[key]))
    return problems


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("--tool", required=True, nargs="+", help="the tekit program (and emulator)")
    parser.add_argument("--objdump", action="append", default=[], help="MACHINE=PROGRAM")
    parser.add_argument("files", nargs="*")
    args = parser.parse_args()

    objdumps = {}
    for item in args.objdump:
        machine, program = item.split("=", 1)
        if program and shutil.which(program):
            objdumps[machine] = program
    if not objdumps:
        print("skipped: no objdump for Windows executables (binutils-mingw-w64)")
        return SKIPPED

    compared, problems = 0, []
    for path in args.files:
        if not os.path.isfile(path):
            print("left out: %s does not exist" % path)
            continue
        run = subprocess.run(args.tool + ["exe", "--exports", "--imports", "--json", path],
                             capture_output=True, text=True)
        if run.returncode != 0:
            problems.append("%s: tekit exe failed: %s" % (path, run.stderr.strip()))
            continue
        ours = tool_view(json.loads(run.stdout)[0])
        program = objdumps.get(ours["machine"])
        if not program:
            print("left out: %s (%s): no objdump for that machine" % (path, ours["machine"]))
            continue
        dump = subprocess.run([program, "-p", path], capture_output=True, text=True, check=True)
        problems += differences(path, ours, objdump_view(dump.stdout))
        compared += 1
        print("compared %s: %s, %d exports, %d imported DLLs" %
              (path, ours["machine"], len(ours["exports"]), len(ours["imports"])))

    for problem in problems:
        print(problem)
    if compared == 0 and not problems:
        print("skipped: none of the files could be compared")
        return SKIPPED
    print("%d files compared, %d differences" % (compared, len(problems)))
    return 1 if problems else 0


if __name__ == "__main__":
    sys.exit(main())
