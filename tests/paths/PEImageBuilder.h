// Small synthetic Windows executables for the reader's tests: a DOS header, the PE headers,
// and one section at RVA 0x1000 whose bytes the test lays out, e.g.
//   pe.AddExports("x.dll", 1, {{"Open", 0x1000}, {"Alias", 0, "KERNEL32.CloseHandle"}});
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
    static constexpr std::uint32_t kSectionRva = 0x1000, kHeaderSize = 0x200, kPeOffset = 0x40;
    /// Offsets of header fields in Build()'s output, for tests that spoil them.
    static constexpr std::size_t kFileHeader = kPeOffset + 4, kOptionalHeader = kFileHeader + 20;

    struct Export {
        std::string name; ///< empty: by ordinal only
        std::uint32_t rva = 0x9000;
        std::string forwarder = {};       ///< "MODULE.Function" instead of an RVA
        std::uint32_t index = UINT32_MAX; ///< address-table slot; default: the next one
    };
    struct Import {
        std::string dll;
        std::vector<std::string> functions; ///< "#N" imports ordinal N
    };

    explicit PEImageBuilder(int bitness = 64)
        : bitness(bitness), machine(bitness == 64 ? 0x8664 : 0x14c) {}

    int bitness;
    std::uint16_t machine;
    std::uint16_t characteristics = 0x2022; // executable, large address aware, DLL
    std::uint16_t subsystem = 3;
    std::uint64_t imageBase = 0x10000000;
    std::uint32_t dirs[16][2] = {};
    std::vector<unsigned char> section = std::vector<unsigned char>(16, 0);

    /// Appends bytes to the section (aligned to 4), returning their RVA.
    std::uint32_t Put(void const* data, std::size_t size) {
        section.resize((section.size() + 3) / 4 * 4);
        auto const rva = static_cast<std::uint32_t>(kSectionRva + section.size());
        auto const* bytes = static_cast<unsigned char const*>(data);
        section.insert(section.end(), bytes, bytes + size);
        return rva;
    }
    std::uint32_t PutString(std::string const& text) { return Put(text.c_str(), text.size() + 1); }
    std::uint32_t PutWords(std::vector<std::uint32_t> const& words) {
        std::vector<unsigned char> bytes(words.size() * 4);
        for (std::size_t i = 0; i < words.size(); ++i)
            Set(bytes, 4 * i, words[i]);
        return Put(bytes.data(), bytes.size());
    }
    void Poke32(std::uint32_t rva, std::uint32_t value) { Set(section, rva - kSectionRva, value); }

    /// The export directory (its forwarder texts inside its range); returns its RVA.
    std::uint32_t AddExports(std::string const& module, std::uint32_t base,
                             std::vector<Export> const& exports) {
        auto const slot = [&](std::size_t i) {
            return exports[i].index == UINT32_MAX ? std::uint32_t(i) : exports[i].index;
        };
        std::uint32_t slots = 0;
        for (std::size_t i = 0; i < exports.size(); ++i)
            slots = std::max(slots, slot(i) + 1);
        std::uint32_t const directory = PutWords(std::vector<std::uint32_t>(10, 0));
        std::vector<std::uint32_t> addresses(slots, 0), names;
        std::vector<std::pair<std::string, std::uint32_t>> sorted; // by name, as linkers write
        for (std::size_t i = 0; i < exports.size(); ++i) {
            auto const& e = exports[i];
            addresses[slot(i)] = e.forwarder.empty() ? e.rva : PutString(e.forwarder);
            if (!e.name.empty())
                sorted.push_back({e.name, slot(i)});
        }
        std::uint32_t const moduleName = PutString(module);
        std::sort(sorted.begin(), sorted.end());
        std::vector<std::uint16_t> ordinals;
        for (auto const& [name, index] : sorted) {
            names.push_back(PutString(name));
            ordinals.push_back(static_cast<std::uint16_t>(index));
        }
        // Name, ordinal base, counts, then the address, name and ordinal tables.
        std::uint32_t const fields[] = {moduleName,
                                        base,
                                        slots,
                                        std::uint32_t(names.size()),
                                        PutWords(addresses),
                                        PutWords(names),
                                        Put(ordinals.data(), ordinals.size() * 2)};
        for (int i = 0; i < 7; ++i)
            Poke32(directory + 12 + 4 * i, fields[i]);
        dirs[0][0] = directory;
        dirs[0][1] = static_cast<std::uint32_t>(kSectionRva + section.size()) - directory;
        return directory;
    }

    /// The import directory (or, with `delay`, the delay-load directory, new style).
    std::uint32_t AddImports(std::vector<Import> const& imports, bool delay = false) {
        std::vector<std::uint32_t> table;
        for (Import const& import : imports) {
            std::uint32_t const dllName = PutString(import.dll);
            std::vector<std::uint32_t> thunks;
            for (std::string const& f : import.functions) {
                std::string const hintName = std::string("\7\0", 2) + f;
                PushThunk(thunks, f[0] == '#' ? std::stoull(f.substr(1)) |
                                                    (bitness == 64 ? 1ull << 63 : 0x80000000ull)
                                              : Put(hintName.c_str(), hintName.size() + 1));
            }
            PushThunk(thunks, 0);
            std::uint32_t const list = PutWords(thunks);
            if (delay) // attributes, name, module handle, IAT, INT, bound, unload, stamp
                table.insert(table.end(), {1, dllName, 0, list, list, 0, 0, 0});
            else // lookup table, stamp, forwarder chain, name, address table
                table.insert(table.end(), {list, 0, 0, dllName, list});
        }
        table.insert(table.end(), delay ? 8 : 5, 0);
        int const index = delay ? 13 : 1;
        dirs[index][0] = PutWords(table);
        dirs[index][1] = static_cast<std::uint32_t>(table.size() * 4);
        return dirs[index][0];
    }

    std::size_t SectionHeader() const { return kOptionalHeader + (bitness == 64 ? 112 : 96) + 128; }

    std::vector<unsigned char> Build() const {
        std::size_t const oh = kOptionalHeader, dd = SectionHeader() - 128, sh = SectionHeader();
        std::vector<unsigned char> out(kHeaderSize, 0);
        std::memcpy(&out[0], "MZ", 2);
        std::memcpy(&out[kPeOffset], "PE", 2);
        std::memcpy(&out[sh], ".data", 5);
        auto const size = static_cast<std::uint32_t>(section.size());
        // Each: offset, value, width.
        std::uint64_t const fields[][3] = {{0x3c, kPeOffset, 4},
                                           {kFileHeader, machine, 2},
                                           {kFileHeader + 2, 1, 2},
                                           {kFileHeader + 16, sh - oh, 2},
                                           {kFileHeader + 18, characteristics, 2},
                                           {oh, 0x10bu + (bitness == 64) * 0x100u, 2},
                                           {oh + 60, kHeaderSize, 4},
                                           {oh + 68, subsystem, 2},
                                           {dd - 4, 16, 4},
                                           {sh + 8, size, 4},
                                           {sh + 16, size, 4},
                                           {sh + 12, kSectionRva, 4},
                                           {sh + 20, kHeaderSize, 4}};
        for (auto const& f : fields)
            Set(out, f[0], f[1], static_cast<int>(f[2]));
        Set(out, oh + (bitness == 64 ? 24 : 28), imageBase, bitness / 8);
        for (int i = 0; i < 16; ++i) {
            Set(out, dd + 8 * i, dirs[i][0]);
            Set(out, dd + 8 * i + 4, dirs[i][1]);
        }
        out.insert(out.end(), section.begin(), section.end());
        return out;
    }

    /// Writes the `width` low bytes of `value` at `at`, least significant first.
    static void Set(std::vector<unsigned char>& b, std::size_t at, std::uint64_t value,
                    int width = 4) {
        for (int i = 0; i < width; ++i)
            b.at(at + i) = static_cast<unsigned char>(value >> (8 * i));
    }

private:
    void PushThunk(std::vector<std::uint32_t>& words, std::uint64_t value) const {
        words.push_back(static_cast<std::uint32_t>(value));
        if (bitness == 64)
            words.push_back(static_cast<std::uint32_t>(value >> 32));
    }
};

} // namespace tekit::testing
