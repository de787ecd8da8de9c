#!/usr/bin/env python3
"""Writes the small Windows executables that the `tekit exe` transcripts read.

    make_exe_samples.py DIR

DIR/lib64.dll    x86-64 DLL, large-address aware: exports Open (1), Close (2), one by ordinal
                 only (3) and Heap (4), forwarded to KERNEL32.HeapAlloc; imports
                 KERNEL32.dll (CloseHandle) and helper.dll (Help, ordinal 3); delay-loads
                 late.dll (Later)
DIR/app32.exe    i386 program for the GUI subsystem: imports lib64.dll (Open) and helper.dll
DIR/lib/helper.dll  x86-64 DLL that imports nothing
DIR/cut.dll      the first 100 bytes of lib64.dll
DIR/notes.txt    text
"""
import os
import struct
import sys

SECTION_RVA, HEADER_SIZE = 0x1000, 0x200


class Image:
    def __init__(self, bitness, machine, characteristics, subsystem):
        self.bitness, self.machine = bitness, machine
        self.characteristics, self.subsystem = characteristics, subsystem
        self.section = bytearray(16)
        self.dirs = [[0, 0] for _ in range(16)]

    def put(self, data):
        while len(self.section) % 4:
            self.section.append(0)
        rva = SECTION_RVA + len(self.section)
        self.section += data
        return rva

    def string(self, text):
        return self.put(text.encode() + b"\0")

    def words(self, values):
        return self.put(struct.pack("<%dI" % len(values), *values))

    def thunks(self, values):
        fmt = "<%dQ" if self.bitness == 64 else "<%dI"
        return self.put(struct.pack(fmt % len(values), *values))

    def exports(self, module, entries):
        """entries: (name or None, rva or forwarder text), in ordinal order from 1."""
        directory = self.words([0] * 10)
        addresses = [self.string(e[1]) if isinstance(e[1], str) else e[1] for e in entries]
        module_rva = self.string(module)
        named = sorted((e[0], i) for i, e in enumerate(entries) if e[0])
        names = [self.string(name) for name, _ in named]
        table = self.words(addresses)
        name_table = self.words(names)
        ordinals = self.put(struct.pack("<%dH" % len(named), *[i for _, i in named]))
        end = SECTION_RVA + len(self.section)
        fields = [0, 0, 0, module_rva, 1, len(entries), len(named), table, name_table, ordinals]
        at = directory - SECTION_RVA
        self.section[at:at + 40] = struct.pack("<10I", *fields)
        self.dirs[0] = [directory, end - directory]

    def imports(self, modules, delay=False):
        flag = 1 << 63 if self.bitness == 64 else 1 << 31
        rows = []
        for dll, functions in modules:
            name = self.string(dll)
            thunks = [flag | int(f[1:]) if f.startswith("#")
                      else self.put(struct.pack("<H", 0) + f.encode() + b"\0")
                      for f in functions]
            table = self.thunks(thunks + [0])
            rows += [1, name, 0, table, table, 0, 0, 0] if delay else [table, 0, 0, name, table]
        rows += [0] * (8 if delay else 5)
        directory = self.words(rows)
        self.dirs[13 if delay else 1] = [directory, len(rows) * 4]

    def build(self):
        optional_size = (112 if self.bitness == 64 else 96) + 16 * 8
        out = bytearray(HEADER_SIZE)
        out[0:2] = b"MZ"
        struct.pack_into("<I", out, 0x3c, 0x40)
        out[0x40:0x44] = b"PE\0\0"
        struct.pack_into("<HHIIIHH", out, 0x44, self.machine, 1, 0, 0, 0, optional_size,
                         self.characteristics)
        oh = 0x58
        if self.bitness == 64:
            struct.pack_into("<HQ", out, oh, 0x20b, 0)
            struct.pack_into("<Q", out, oh + 24, 0x180000000)
        else:
            struct.pack_into("<H", out, oh, 0x10b)
            struct.pack_into("<I", out, oh + 28, 0x400000)
        struct.pack_into("<I", out, oh + 60, HEADER_SIZE)
        struct.pack_into("<H", out, oh + 68, self.subsystem)
        dd = oh + (112 if self.bitness == 64 else 96)
        struct.pack_into("<I", out, dd - 4, 16)
        for i, (rva, size) in enumerate(self.dirs):
            struct.pack_into("<II", out, dd + 8 * i, rva, size)
        sh = oh + optional_size
        size = len(self.section)
        struct.pack_into("<8sIIII", out, sh, b".data", size, SECTION_RVA, size, HEADER_SIZE)
        return bytes(out + self.section)


def main():
    root = sys.argv[1]
    os.makedirs(os.path.join(root, "lib"), exist_ok=True)

    lib = Image(64, 0x8664, 0x2022, 3)
    lib.exports("lib64.dll", [("Open", 0x9010), ("Close", 0x9020), (None, 0x9030),
                              ("Heap", "KERNEL32.HeapAlloc")])
    lib.imports([("KERNEL32.dll", ["CloseHandle"]), ("helper.dll", ["Help", "#3"])])
    lib.imports([("late.dll", ["Later"])], delay=True)
    lib_bytes = lib.build()

    app = Image(32, 0x14c, 0x0102, 2)
    app.imports([("lib64.dll", ["Open"]), ("helper.dll", ["Help"])])

    helper = Image(64, 0x8664, 0x2022, 3)
    helper.exports("helper.dll", [("Help", 0x9000)])

    files = {"lib64.dll": lib_bytes, "app32.exe": app.build(),
             os.path.join("lib", "helper.dll"): helper.build(), "cut.dll": lib_bytes[:100],
             "notes.txt": b"not an executable\n"}
    for name, data in files.items():
        with open(os.path.join(root, name), "wb") as f:
            f.write(data)
    return 0


if __name__ == "__main__":
    sys.exit(main())
