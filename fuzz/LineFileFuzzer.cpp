// Fuzzes the line reader against a plain reference splitter of its documented rules, over
// chunk reads of random short sizes, in LineFile_Read and LineFile_ReadNonEmpty modes.
//
// Input: byte 0 the longest line kept (0 to 255), byte 1 bit 0 the non-empty mode, byte 2 the
// seed of the chunk sizes, then the source bytes.
#include "tekit/toolbox/LineFile.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

bool IsLineEnd(unsigned char c) {
    return c == '\n' || c == '\r' || c == '\0';
}

bool IsBlank(unsigned char c) {
    return c == ' ' || c == '\t' || c == '\v' || c == '\f';
}

/// The documented rules, one byte at a time, with no chunks.
struct Reference {
    std::string const& bytes;
    std::size_t pos = 0;
    unsigned char prevEnd = 0;
    int numLines = 0;
    long long offset = -1;
    int extra = 0;

    /// One line: false at the end of input. `content` is set when a non-blank byte was seen.
    bool ReadLine(std::size_t maxLen, std::string& text, bool& content) {
        offset = static_cast<long long>(pos);
        extra = 0;
        text.clear();
        content = false;
        bool first = true, collected = false;
        for (;;) {
            if (pos == bytes.size()) {
                if (!collected)
                    return false;
                break;
            }
            auto const c = static_cast<unsigned char>(bytes[pos++]);
            if (first && IsLineEnd(c) && c != prevEnd) {
                prevEnd = c;
                ++offset;
                ++extra;
                first = false;
                continue;
            }
            first = false;
            if (IsLineEnd(c)) {
                prevEnd = c;
                break;
            }
            collected = true;
            content = content || !IsBlank(c);
            if (text.size() < maxLen)
                text += static_cast<char>(c);
        }
        ++numLines;
        return true;
    }

    bool Read(std::size_t maxLen, bool nonEmpty, std::string& text) {
        bool content = false;
        while (ReadLine(maxLen, text, content)) {
            if (!nonEmpty || content)
                return true;
        }
        return false;
    }
};

/// A source that hands out the bytes in chunks of pseudo-random sizes, mostly short.
struct ChunkedSource {
    std::string const& bytes;
    std::uint32_t state;
    std::size_t pos = 0;

    static int TEKIT_STDCALL Read(void* source, int numBytes, int* numRead, void* buffer) {
        auto& s = *static_cast<ChunkedSource*>(source);
        s.state = s.state * 1103515245u + 12345u;
        std::uint32_t const r = s.state >> 16;
        std::size_t size = (r & 7) == 0 ? static_cast<std::size_t>(numBytes) : 1 + (r >> 3) % 9;
        size = std::min({size, static_cast<std::size_t>(numBytes), s.bytes.size() - s.pos});
        std::copy_n(s.bytes.data() + s.pos, size, static_cast<char*>(buffer));
        s.pos += size;
        *numRead = static_cast<int>(size);
        return 0;
    }
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    if (size < 3)
        return 0;
    int const maxLen = data[0];
    bool const nonEmpty = (data[1] & 1) != 0;
    std::string const bytes(reinterpret_cast<char const*>(data) + 3, size - 3);

    ChunkedSource source{bytes, data[2]};
    LineFile reader = LineFile_New(ChunkedSource::Read, &source);
    Check(reader != nullptr);
    Reference reference{bytes};
    std::vector<char> buffer(static_cast<std::size_t>(maxLen) + 1);
    std::string expected;
    for (;;) {
        int length = -1, end = -1;
        int const status = nonEmpty
                               ? LineFile_ReadNonEmpty(reader, buffer.data(), maxLen, &length, &end)
                               : LineFile_Read(reader, buffer.data(), maxLen, &length, &end);
        Check(status == 0);
        bool const more = reference.Read(static_cast<std::size_t>(maxLen), nonEmpty, expected);
        Check(end == (more ? 0 : 1));
        Check(LineFile_NumLinesRead(reader) == reference.numLines);
        Check(LineFile_OffsetOfLastLine(reader) == reference.offset);
        Check(LineFile_NumExtraLineTermChars(reader) == reference.extra);
        if (!more) {
            Check(length == 0 && buffer[0] == '\0');
            break;
        }
        Check(length == static_cast<int>(expected.size()));
        Check(std::string(buffer.data(), static_cast<std::size_t>(length)) == expected);
        Check(buffer[static_cast<std::size_t>(length)] == '\0');
    }
    LineFile_Dispose(reader);
    return 0;
}
