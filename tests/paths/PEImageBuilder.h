// Small synthetic Windows executables for the reader's tests: a DOS header, the PE headers,
// and one section at RVA 0x1000 whose bytes the test lays out.
//
//   PEImageBuilder pe(64);
//   pe.AddExports("x.dll", 1, {{"Open", 0x1000}, {"Alias", 0, "KERNEL32.CloseHandle"}});
//   pe.AddImports({{"a.dll", {"f", "#7"}}});
//   std::vector<unsigned char> bytes = pe.Build();
#pragma once

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string>
#include <utility>
#include <vector>

namespace tekit::testing {

class PEImageBuilder {
public:
    static constexpr std::uint32_t kSectionRva = 0x1000;
    static constexpr std::uint32_t kHeaderSize = 0x200;
    static constexpr std::uint32_t kPeOffset = 0x40;

    struct Export {
        Export(std::string name, std::uint32_t rva = 0x9000, std::string forwarder = {},
               std::uint32_t index = UINT32_MAX)
            : name(std::move(name)), rva(rva), forwarder(std::move(forwarder)), index(index) {}
        std::string name; ///< empty: by ordinal only
        std::uint32_t rva;
        std::string forwarder; ///< "MODULE.Function" instead of an RVA
        std::uint32_t index;   ///< address-table slot; default: the next one
    };
    struct Import {
        std::string dll;
        std::vector<std::string> functions; ///< "#N" imports ordinal N
    };

    explicit PEImageBuilder(int bitness = 64) : bitness(bitness) {
        machine = bitness == 64 ? 0x8664 : 0x14c;
    }

    int bitness;
    std::uint16_t machine;
    std::uint16_t characteristics = 0x2022; // executable, large address aware, DLL
    std::uint16_t subsystem = 3;
    std::uint64_t imageBase = 0x10000000;
    std::uint32_t dirs[16][2] = {};
    std::vector<unsigned char> section = std::vector<unsigned char>(16, 0);

    /// Appends bytes to the section (aligned to 4), returning their RVA.
    std::uint32_t Put(void const* data, std::size_t size) {
        while (section.size() % 4)
            section.push_back(0);
        auto const rva = static_cast<std::uint32_t>(kSectionRva + section.size());
        auto const* bytes = static_cast<unsigned char const*>(data);
        section.insert(section.end(), bytes, bytes + size);
        return rva;
    }
    std::uint32_t PutString(std::string const& text) { return Put(text.c_str(), text.size() + 1); }
    std::uint32_t PutWords(std::vector<std::uint32_t> const& words) {
        std::vector<unsigned char> bytes;
        for (std::uint32_t w : words)
            for (int i = 0; i < 4; ++i)
                bytes.push_back(static_cast<unsigned char>(w >> (8 * i)));
        return Put(bytes.data(), bytes.size());
    }
    /// Writes a 32-bit value at `rva` inside the section.
    void Poke32(std::uint32_t rva, std::uint32_t value) {
        for (int i = 0; i < 4; ++i)
            section.at(rva - kSectionRva + i) = static_cast<unsigned char>(value >> (8 * i));
    }

    /// The export directory (its forwarder texts inside its range); returns its RVA.
    std::uint32_t AddExports(std::string const& module, std::uint32_t base,
                             std::vector<Export> const& exports) {
        std::uint32_t slots = 0;
        for (std::size_t i = 0; i < exports.size(); ++i)
            slots = std::max(
                slots, (exports[i].index == UINT32_MAX ? std::uint32_t(i) : exports[i].index) + 1);
        std::uint32_t const directory = PutWords(std::vector<std::uint32_t>(10, 0));
        std::vector<std::uint32_t> addresses(slots, 0), names;
        std::vector<std::uint16_t> ordinals;
        for (std::size_t i = 0; i < exports.size(); ++i) {
            std::uint32_t const slot =
                exports[i].index == UINT32_MAX ? std::uint32_t(i) : exports[i].index;
            addresses[slot] =
                exports[i].forwarder.empty() ? exports[i].rva : PutString(exports[i].forwarder);
        }
        std::uint32_t const moduleName = PutString(module);
        // The name table is sorted by name, as linkers write it.
        std::vector<std::pair<std::string, std::uint32_t>> sorted;
        for (std::size_t i = 0; i < exports.size(); ++i)
            if (!exports[i].name.empty())
                sorted.push_back({exports[i].name, exports[i].index == UINT32_MAX
                                                       ? std::uint32_t(i)
                                                       : exports[i].index});
        std::sort(sorted.begin(), sorted.end());
        for (auto const& [name, slot] : sorted) {
            names.push_back(PutString(name));
            ordinals.push_back(static_cast<std::uint16_t>(slot));
        }
        std::uint32_t const addressTable = PutWords(addresses);
        std::uint32_t const nameTable = PutWords(names);
        std::uint32_t const ordinalTable = Put(ordinals.data(), ordinals.size() * 2);
        std::uint32_t const end = static_cast<std::uint32_t>(kSectionRva + section.size());
        std::uint32_t const fields[10] = {0,
                                          0,
                                          0,
                                          moduleName,
                                          base,
                                          slots,
                                          std::uint32_t(names.size()),
                                          addressTable,
                                          nameTable,
                                          ordinalTable};
        for (int i = 0; i < 10; ++i)
            Poke32(directory + 4 * i, fields[i]);
        dirs[0][0] = directory;
        dirs[0][1] = end - directory;
        return directory;
    }

    /// The import directory (or, with `delay`, the delay-load directory, new style).
    std::uint32_t AddImports(std::vector<Import> const& imports, bool delay = false) {
        std::vector<std::uint32_t> lists, dllNames;
        for (Import const& import : imports) {
            dllNames.push_back(PutString(import.dll));
            std::vector<std::uint32_t> thunks;
            for (std::string const& f : import.functions) {
                if (f[0] == '#') {
                    std::uint64_t const ordinal = std::stoul(f.substr(1));
                    PushThunk(thunks, ordinal | (bitness == 64 ? std::uint64_t{1} << 63
                                                               : std::uint64_t{0x80000000}));
                } else {
                    std::vector<unsigned char> hintName{7, 0};
                    hintName.insert(hintName.end(), f.begin(), f.end());
                    hintName.push_back(0);
                    PushThunk(thunks, Put(hintName.data(), hintName.size()));
                }
            }
            PushThunk(thunks, 0);
            lists.push_back(PutWords(thunks));
        }
        std::vector<std::uint32_t> table;
        for (std::size_t i = 0; i < imports.size(); ++i) {
            if (delay) // attributes, name, module handle, IAT, INT, bound, unload, stamp
                table.insert(table.end(), {1, dllNames[i], 0, lists[i], lists[i], 0, 0, 0});
            else // lookup table, stamp, forwarder chain, name, address table
                table.insert(table.end(), {lists[i], 0, 0, dllNames[i], lists[i]});
        }
        table.insert(table.end(), delay ? 8 : 5, 0);
        std::uint32_t const directory = PutWords(table);
        int const index = delay ? 13 : 1;
        dirs[index][0] = directory;
        dirs[index][1] = static_cast<std::uint32_t>(table.size() * 4);
        return directory;
    }

    std::vector<unsigned char> Build() const {
        std::uint32_t const optionalSize = (bitness == 64 ? 112 : 96) + 16 * 8;
        std::vector<unsigned char> out(kHeaderSize, 0);
        out[0] = 'M';
        out[1] = 'Z';
        Set32(out, 0x3c, kPeOffset);
        std::memcpy(&out[kPeOffset], "PE\0\0", 4);
        std::size_t const fh = kPeOffset + 4;
        Set16(out, fh, machine);
        Set16(out, fh + 2, 1);
        Set16(out, fh + 16, static_cast<std::uint16_t>(optionalSize));
        Set16(out, fh + 18, characteristics);
        std::size_t const oh = fh + 20;
        Set16(out, oh, bitness == 64 ? 0x20b : 0x10b);
        if (bitness == 64) {
            Set32(out, oh + 24, static_cast<std::uint32_t>(imageBase));
            Set32(out, oh + 28, static_cast<std::uint32_t>(imageBase >> 32));
        } else {
            Set32(out, oh + 28, static_cast<std::uint32_t>(imageBase));
        }
        Set32(out, oh + 60, kHeaderSize);
        Set16(out, oh + 68, subsystem);
        std::size_t const dd = oh + (bitness == 64 ? 112 : 96);
        Set32(out, dd - 4, 16);
        for (int i = 0; i < 16; ++i) {
            Set32(out, dd + 8 * i, dirs[i][0]);
            Set32(out, dd + 8 * i + 4, dirs[i][1]);
        }
        std::size_t const sh = oh + optionalSize;
        std::memcpy(&out[sh], ".data\0\0\0", 8);
        auto const size = static_cast<std::uint32_t>(section.size());
        Set32(out, sh + 8, size);
        Set32(out, sh + 12, kSectionRva);
        Set32(out, sh + 16, size);
        Set32(out, sh + 20, kHeaderSize);
        out.insert(out.end(), section.begin(), section.end());
        return out;
    }

    /// Offsets of header fields in Build()'s output, for tests that spoil them.
    static constexpr std::size_t kFileHeader = kPeOffset + 4;
    static constexpr std::size_t kOptionalHeader = kFileHeader + 20;
    std::size_t SectionHeader() const { return kOptionalHeader + (bitness == 64 ? 112 : 96) + 128; }

    static void Set16(std::vector<unsigned char>& b, std::size_t at, std::uint16_t v) {
        b.at(at) = static_cast<unsigned char>(v);
        b.at(at + 1) = static_cast<unsigned char>(v >> 8);
    }
    static void Set32(std::vector<unsigned char>& b, std::size_t at, std::uint32_t v) {
        for (int i = 0; i < 4; ++i)
            b.at(at + i) = static_cast<unsigned char>(v >> (8 * i));
    }

private:
    void PushThunk(std::vector<std::uint32_t>& words, std::uint64_t value) const {
        words.push_back(static_cast<std::uint32_t>(value));
        if (bitness == 64)
            words.push_back(static_cast<std::uint32_t>(value >> 32));
    }
};

} // namespace tekit::testing
