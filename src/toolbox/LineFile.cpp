// The line reader. A call scans its chunk for the next CR, LF or NUL eight bytes at a time and
// copies whole runs of line text, so its cost is per line and per chunk, not per byte.
#include "tekit/toolbox/LineFile.h"

#include "tekit/errors/TEError.h"
#include "toolbox/FlatGuard.h"

#include <algorithm>
#include <bit>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <new>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace {

using namespace tekit;

constexpr int kChunkSize = 2048;
/// Bytes after the chunk that a 16-byte scan may load (never used as data).
constexpr int kScanSlack = 16;

} // namespace

struct LineFileRec {
    LineFileReadCallback read;
    void* source;
    int pos = 0;  ///< read position in `chunk`
    int left = 0; ///< bytes of `chunk` not yet used
    int numLines = 0;
    std::int64_t totalRead = 0;
    std::int64_t lastOffset = -1;
    int prevEnd = 0; ///< the last line-end byte seen; 0 at the start
    int extra = 0;
    char chunk[kChunkSize + kScanSlack] = {};
};

namespace {

bool IsLineEnd(unsigned char c) {
    return c == '\n' || c == '\r' || c == '\0';
}

/// Bytes at the start of `p` before the first CR, LF or NUL (`n` when there is none). `p`
/// lies in a chunk, so up to kScanSlack bytes past `n` may be loaded; hits there are ignored.
int FindLineEnd(char const* p, int n) {
#if defined(__SSE2__)
    __m128i const lf = _mm_set1_epi8('\n');
    __m128i const cr = _mm_set1_epi8('\r');
    __m128i const nul = _mm_setzero_si128();
    for (int i = 0; i < n; i += 16) {
        __m128i const v = _mm_loadu_si128(reinterpret_cast<__m128i const*>(p + i));
        __m128i const hits = _mm_or_si128(
            _mm_or_si128(_mm_cmpeq_epi8(v, lf), _mm_cmpeq_epi8(v, cr)), _mm_cmpeq_epi8(v, nul));
        if (int const mask = _mm_movemask_epi8(hits))
            return std::min(n, i + std::countr_zero(static_cast<unsigned>(mask)));
    }
    return n;
#else
    constexpr std::uint64_t kOnes = 0x0101010101010101ull;
    constexpr std::uint64_t kHighs = 0x8080808080808080ull;
    auto zeroBytes = [](std::uint64_t x) { return (x - kOnes) & ~x & kHighs; };
    int i = 0;
    for (; i + 8 <= n; i += 8) {
        std::uint64_t word;
        std::memcpy(&word, p + i, 8);
        std::uint64_t const hits =
            zeroBytes(word) | zeroBytes(word ^ (kOnes * '\n')) | zeroBytes(word ^ (kOnes * '\r'));
        if (hits == 0)
            continue;
        // The lowest flagged byte is exact (borrows only disturb bytes above a true match).
        if constexpr (std::endian::native == std::endian::little)
            return i + std::countr_zero(hits) / 8;
        break;
    }
    while (i < n && !IsLineEnd(static_cast<unsigned char>(p[i])))
        ++i;
    return i;
#endif
}

bool HasContent(char const* p, int n) {
    for (int i = 0; i < n; ++i) {
        char const c = p[i];
        if (c != ' ' && c != '\t' && c != '\v' && c != '\f')
            return true;
    }
    return false;
}

int Fill(LineFileRec& r) {
    int count = 0;
    int const status = r.read(r.source, kChunkSize, &count, r.chunk);
    if (status < 0)
        return status;
    if (count < 0 || count > kChunkSize)
        return TE_INVALID_OR_OUT_OF_RANGE; // a callback that would make us read past the chunk
    r.pos = 0;
    r.left = count;
    r.totalRead += count;
    return 0;
}

/// What a read found.
struct LineResult {
    int length = 0;
    bool endOfInput = false;
    bool hasContent = false;   ///< a byte other than blanks, kept or not
    bool trackContent = false; ///< whether hasContent is wanted (it costs a scan)
};

/// Takes the line text of the current chunk up to its next line end into `buffer`; true when
/// the line end was reached (and consumed).
bool TakeRun(LineFileRec& r, char* buffer, int maxLen, LineResult& line) {
    char const* const p = r.chunk + r.pos;
    int const n = FindLineEnd(p, r.left);
    int const take = std::min(n, maxLen - line.length);
    std::memcpy(buffer + line.length, p, static_cast<std::size_t>(take));
    line.length += take;
    if (line.trackContent && !line.hasContent)
        line.hasContent = HasContent(p, n);
    r.pos += n;
    r.left -= n;
    if (r.left == 0)
        return false;
    r.prevEnd = static_cast<unsigned char>(r.chunk[r.pos]);
    ++r.pos;
    --r.left;
    return true;
}

/// Bytes of `q` (at most `avail`) before its first line end, copied to `buffer` on the way
/// where whole 16-byte blocks fit in its `maxLen` + 1 bytes; `*copied` gets how many were.
/// `avail` or more when there is no line end.
int ScanAndCopy(char const* q, int avail, char* buffer, int maxLen, int* copied) {
#if defined(__SSE2__)
    __m128i const lf = _mm_set1_epi8('\n');
    __m128i const cr = _mm_set1_epi8('\r');
    __m128i const nul = _mm_setzero_si128();
    *copied = 0;
    for (int i = 0; i < avail; i += 16) {
        __m128i const v = _mm_loadu_si128(reinterpret_cast<__m128i const*>(q + i));
        if (i + 16 <= maxLen + 1) {
            _mm_storeu_si128(reinterpret_cast<__m128i*>(buffer + i), v);
            *copied = i + 16;
        }
        __m128i const hits = _mm_or_si128(
            _mm_or_si128(_mm_cmpeq_epi8(v, lf), _mm_cmpeq_epi8(v, cr)), _mm_cmpeq_epi8(v, nul));
        if (int const mask = _mm_movemask_epi8(hits))
            return i + std::countr_zero(static_cast<unsigned>(mask));
    }
    return avail;
#else
    (void)buffer;
    (void)maxLen;
    *copied = 0;
    return FindLineEnd(q, avail);
#endif
}

/// The common case in one step: the chunk holds the line and its end (after, perhaps, the
/// second half of a pair). False, with the reader unchanged, otherwise. Bytes of `buffer`
/// after the terminator may be overwritten.
bool ReadLineInChunk(LineFileRec& r, char* buffer, int maxLen, LineResult& line) {
    if (r.left < 2)
        return false;
    char const* const p = r.chunk + r.pos;
    auto const c = static_cast<unsigned char>(p[0]);
    int const skip = IsLineEnd(c) && c != r.prevEnd ? 1 : 0;
    int copied = 0;
    int const n = ScanAndCopy(p + skip, r.left - skip, buffer, maxLen, &copied);
    if (n >= r.left - skip)
        return false;
    line.length = std::min(n, maxLen);
    if (copied < line.length)
        std::memcpy(buffer + copied, p + skip + copied,
                    static_cast<std::size_t>(line.length - copied));
    if (line.trackContent)
        line.hasContent = HasContent(p + skip, n);
    r.prevEnd = static_cast<unsigned char>(p[skip + n]);
    r.lastOffset += skip;
    r.extra = skip;
    r.pos += skip + n + 1;
    r.left -= skip + n + 1;
    return true;
}

int ReadLine(LineFileRec& r, char* buffer, int maxLen, LineResult& line) {
    r.lastOffset = r.totalRead - r.left;
    r.extra = 0;
    if (ReadLineInChunk(r, buffer, maxLen, line)) {
        buffer[line.length] = '\0';
        ++r.numLines;
        return 0;
    }
    bool collected = false; // line text seen in this call, kept or cut off
    bool first = true;
    for (;;) {
        if (r.left == 0) {
            int const status = Fill(r);
            if (status < 0) {
                buffer[line.length] = '\0';
                return status;
            }
            if (r.left == 0) {
                line.endOfInput = !collected;
                break;
            }
        }
        auto const c = static_cast<unsigned char>(r.chunk[r.pos]);
        if (first && IsLineEnd(c) && c != r.prevEnd) {
            // The second half of a CR LF or LF CR pair (or a line end at the very start).
            r.prevEnd = c;
            ++r.pos;
            --r.left;
            ++r.lastOffset;
            ++r.extra;
            first = false;
            continue;
        }
        first = false;
        collected = collected || !IsLineEnd(c);
        if (TakeRun(r, buffer, maxLen, line))
            break;
    }
    buffer[line.length] = '\0';
    if (!line.endOfInput)
        ++r.numLines;
    return 0;
}

/// Checks the arguments, reads, and reports; `skipEmpty` reads on past lines without content.
int Read(LineFile reader, char* buffer, int maxLen, int* length, int* endOfInput, bool skipEmpty) {
    if (!reader || !buffer)
        return TE_INVALID_POINTER;
    if (maxLen < 0)
        return TE_INVALID_OR_OUT_OF_RANGE;
    return toolbox::Guarded<int>(TE_OUT_OF_MEMORY, TE_OPERATION_FAILED, [&] {
        LineResult line;
        int status = 0;
        do {
            line = LineResult{};
            line.trackContent = skipEmpty;
            status = ReadLine(*reader, buffer, maxLen, line);
        } while (status >= 0 && skipEmpty && !line.endOfInput && !line.hasContent);
        if (length)
            *length = line.length;
        if (endOfInput)
            *endOfInput = line.endOfInput ? 1 : 0;
        return status;
    });
}

} // namespace

extern "C" LineFile TEKIT_STDCALL LineFile_New(LineFileReadCallback readCallback, void* source) {
    auto* const reader = new (std::nothrow) LineFileRec;
    if (reader) {
        reader->read = readCallback ? readCallback : LineFile_ReadFromFile;
        reader->source = source;
    }
    return reader;
}

extern "C" void TEKIT_STDCALL LineFile_Dispose(LineFile reader) {
    delete reader;
}

extern "C" int TEKIT_STDCALL LineFile_Read(LineFile reader, char* buffer, int maxLen, int* length,
                                           int* endOfInput) {
    return Read(reader, buffer, maxLen, length, endOfInput, false);
}

extern "C" int TEKIT_STDCALL LineFile_ReadNonEmpty(LineFile reader, char* buffer, int maxLen,
                                                   int* length, int* endOfInput) {
    return Read(reader, buffer, maxLen, length, endOfInput, true);
}

extern "C" int TEKIT_STDCALL LineFile_NumLinesRead(LineFile reader) {
    return reader ? reader->numLines : 0;
}

extern "C" std::int64_t TEKIT_STDCALL LineFile_OffsetOfLastLine(LineFile reader) {
    return reader ? reader->lastOffset : -1;
}

extern "C" int TEKIT_STDCALL LineFile_NumExtraLineTermChars(LineFile reader) {
    return reader ? reader->extra : 0;
}

extern "C" int TEKIT_STDCALL LineFile_ReadFromFile(void* source, int numBytes, int* numBytesRead,
                                                   void* buffer) {
    if (!source || !numBytesRead || !buffer)
        return TE_INVALID_POINTER;
    if (numBytes < 0)
        return TE_INVALID_OR_OUT_OF_RANGE;
    auto* const file = static_cast<std::FILE*>(source);
    std::size_t const got = std::fread(buffer, 1, static_cast<std::size_t>(numBytes), file);
    *numBytesRead = static_cast<int>(got);
    // A partial read keeps its bytes; the error shows on the next call, which reads nothing.
    return got == 0 && std::ferror(file) ? static_cast<int>(TE_IO_ERROR) : 0;
}
