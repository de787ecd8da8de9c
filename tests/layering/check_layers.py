#!/usr/bin/env python3
"""Checks that each subsystem includes headers only from its own layer or the layers below.

    check_layers.py --root <source dir> --layers "platform" "strings,errors" "paths" ...

A subsystem's files are src/<name>/ and include/tekit/<name>/. Its includes of
"tekit/<other>/..." and "<other>/..." name another subsystem; that subsystem's layer must not be
above the includer's. Prints each offending include as file:line and exits 1 when there is one.
"""
import argparse
import pathlib
import re
import sys

INCLUDE = re.compile(r'^\s*#\s*include\s+"(?:tekit/)?([A-Za-z_]+)/')


def layer_of(layers):
    ranks = {}
    for rank, layer in enumerate(layers):
        for name in layer.split(","):
            ranks[name.strip()] = rank
    return ranks


def subsystem_files(root, name):
    for folder in (root / "src" / name, root / "include" / "tekit" / name):
        if folder.is_dir():
            yield from (p for p in sorted(folder.rglob("*")) if p.suffix in (".h", ".cpp", ".inc", ".def"))


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--root", required=True, type=pathlib.Path)
    parser.add_argument("--layers", required=True, nargs="+")
    args = parser.parse_args()
    ranks = layer_of(args.layers)

    problems = []
    folders = {p.name for p in (args.root / "src").iterdir() if p.is_dir()}
    for unknown in sorted(folders - set(ranks)):
        problems.append(f"src/{unknown}: subsystem has no layer in TEKIT_LAYERS")
    for name, rank in ranks.items():
        for path in subsystem_files(args.root, name):
            for number, line in enumerate(path.read_text(errors="replace").splitlines(), 1):
                match = INCLUDE.match(line)
                if not match or match.group(1) not in ranks:
                    continue
                included = match.group(1)
                if ranks[included] > rank:
                    where = path.relative_to(args.root)
                    problems.append(f"{where}:{number}: {name} includes {included}, a layer above it")
    for problem in problems:
        print(problem)
    if problems:
        return 1
    print(f"layering: {len(ranks)} subsystems in {len(args.layers)} layers, no include goes up")
    return 0


if __name__ == "__main__":
    sys.exit(main())
