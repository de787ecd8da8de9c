// The data-to-text encoding: each 4-byte group as six 6-bit digits over an alphabet safe in
// INI values, XML attributes and CSV fields (see tekit/toolbox/DataText.h for the format).
//
// Encoding looks up 12 bits (two characters) at a time. Decoding first validates the whole
// text, then converts: a malformed text must leave the caller's buffer untouched, and the
// validation pass is cheap next to the conversion.
#include "tekit/toolbox/DataText.h"

#include "tekit/errors/TEError.h"

#include <array>
#include <climits>
#include <cstdint>
#include <cstdlib>
#include <cstring>

namespace {

using tekit::TE_INCOMPATIBLE_PARAMETERS;
using tekit::TE_INVALID_OR_OUT_OF_RANGE;
using tekit::TE_INVALID_POINTER;
using tekit::TE_OUT_OF_MEMORY;
using tekit::TE_UNRECOGNIZED_VALUE;

constexpr char kAlphabet[] = ".0123456789ABCDEFGHIJKLMNOPQRSTUVWXYZ_abcdefghijklmnopqrstuvwxyz";
static_assert(sizeof kAlphabet == 65);

/// Characters of a last group of 0 to 3 bytes, and bytes of a last group of 0 to 5 characters
/// (-1: no text has that many).
constexpr int kCharsForTail[4] = {0, 2, 3, 4};
constexpr int kBytesForTail[6] = {0, -1, 1, 2, 3, -1};

/// Two characters for every 12-bit value.
constexpr auto kPairs = [] {
    std::array<std::array<char, 2>, 4096> pairs{};
    for (int v = 0; v < 4096; ++v)
        pairs[v] = {kAlphabet[v >> 6], kAlphabet[v & 63]};
    return pairs;
}();

/// The digit of each byte; 0xFF for bytes outside the alphabet.
constexpr auto kDigits = [] {
    std::array<std::uint8_t, 256> digits{};
    for (auto& d : digits)
        d = 0xFF;
    for (int i = 0; i < 64; ++i)
        digits[static_cast<unsigned char>(kAlphabet[i])] = static_cast<std::uint8_t>(i);
    return digits;
}();

bool Overlap(void const* a, std::size_t aSize, void const* b, std::size_t bSize) {
    if (aSize == 0 || bSize == 0)
        return false;
    auto const x = reinterpret_cast<std::uintptr_t>(a);
    auto const y = reinterpret_cast<std::uintptr_t>(b);
    return x < y + bSize && y < x + aSize;
}

long long TextSize(long long dataSize) {
    return dataSize / 4 * 6 + kCharsForTail[dataSize % 4];
}

void EncodeGroups(unsigned char const* in, std::size_t numGroups, char* out) {
    for (std::size_t i = 0; i < numGroups; ++i, in += 4, out += 6) {
        std::uint64_t const bits = (std::uint64_t{in[0]} << 28 | std::uint64_t{in[1]} << 20 |
                                    std::uint64_t{in[2]} << 12 | std::uint64_t{in[3]} << 4);
        std::memcpy(out, kPairs[bits >> 24].data(), 2);
        std::memcpy(out + 2, kPairs[(bits >> 12) & 0xFFF].data(), 2);
        std::memcpy(out + 4, kPairs[bits & 0xFFF].data(), 2);
    }
}

/// A last group of 1 to 3 bytes: its bits, then zero bits up to whole digits.
void EncodeTail(unsigned char const* in, int numBytes, char* out) {
    std::uint32_t bits = 0;
    for (int i = 0; i < numBytes; ++i)
        bits = bits << 8 | in[i];
    int const numChars = kCharsForTail[numBytes];
    bits <<= numChars * 6 - numBytes * 8;
    for (int i = numChars - 1; i >= 0; --i, bits >>= 6)
        out[i] = kAlphabet[bits & 63];
}

void Encode(unsigned char const* data, int dataSize, char* text) {
    std::size_t const groups = static_cast<std::size_t>(dataSize) / 4;
    EncodeGroups(data, groups, text);
    EncodeTail(data + groups * 4, dataSize % 4, text + groups * 6);
    text[TextSize(dataSize)] = '\0';
}

/// True when every character is a digit, the length is one a text can have, and the unused
/// low bits of every group's last digit are zero (the text is the one text of its bytes).
bool IsValidText(unsigned char const* text, std::size_t length) {
    if (kBytesForTail[length % 6] < 0)
        return false;
    // A byte outside the alphabet has digit 0xFF: its 0xC0 bits show. The sixth digit of a
    // group also shows its 4 unused bits.
    std::uint8_t bad = 0;
    std::size_t const groups = length / 6;
    for (std::size_t g = 0; g < groups; ++g, text += 6) {
        bad |= (kDigits[text[0]] | kDigits[text[1]] | kDigits[text[2]] | kDigits[text[3]] |
                kDigits[text[4]]) &
               0xC0;
        bad |= kDigits[text[5]] & 0xCF;
    }
    std::size_t const tail = length % 6;
    for (std::size_t i = 0; i < tail; ++i)
        bad |= kDigits[text[i]] & 0xC0;
    // Tails of 2, 3, 4 characters leave 4, 2, 0 bits of their last digit unused.
    static constexpr std::uint8_t kUnusedMask[6] = {0, 0, 15, 3, 0, 0};
    if (tail > 0)
        bad |= kDigits[text[tail - 1]] & kUnusedMask[tail];
    return bad == 0;
}

void DecodeGroups(unsigned char const* in, std::size_t numGroups, unsigned char* out) {
    for (std::size_t i = 0; i < numGroups; ++i, in += 6, out += 4) {
        std::uint64_t const bits =
            std::uint64_t{kDigits[in[0]]} << 30 | std::uint64_t{kDigits[in[1]]} << 24 |
            std::uint64_t{kDigits[in[2]]} << 18 | std::uint64_t{kDigits[in[3]]} << 12 |
            std::uint64_t{kDigits[in[4]]} << 6 | std::uint64_t{kDigits[in[5]]};
        out[0] = static_cast<unsigned char>(bits >> 28);
        out[1] = static_cast<unsigned char>(bits >> 20);
        out[2] = static_cast<unsigned char>(bits >> 12);
        out[3] = static_cast<unsigned char>(bits >> 4);
    }
}

void DecodeTail(unsigned char const* in, int numChars, unsigned char* out) {
    std::uint32_t bits = 0;
    for (int i = 0; i < numChars; ++i)
        bits = bits << 6 | kDigits[in[i]];
    int const numBytes = kBytesForTail[numChars];
    bits >>= numChars * 6 - numBytes * 8;
    for (int i = numBytes - 1; i >= 0; --i, bits >>= 8)
        out[i] = static_cast<unsigned char>(bits);
}

/// Decodes a text that IsValidText accepted.
void Decode(unsigned char const* text, std::size_t length, unsigned char* data) {
    std::size_t const groups = length / 6;
    DecodeGroups(text, groups, data);
    DecodeTail(text + groups * 6, static_cast<int>(length % 6), data + groups * 4);
}

/// The length of a text argument: `textLength`, or up to the terminator for -1. Negative on
/// failure.
long long TextLength(char const* text, int textLength) {
    if (textLength < -1)
        return TE_INVALID_OR_OUT_OF_RANGE;
    if (!text)
        return textLength == 0 ? 0 : TE_INVALID_POINTER;
    return textLength == -1 ? static_cast<long long>(std::strlen(text)) : textLength;
}

/// Checks a text and returns the size of its data, or a negative status.
long long CheckText(char const* text, long long length) {
    if (length < 0)
        return length;
    if (!IsValidText(reinterpret_cast<unsigned char const*>(text),
                     static_cast<std::size_t>(length)))
        return TE_UNRECOGNIZED_VALUE;
    long long const size = length / 6 * 4 + kBytesForTail[length % 6];
    return size > INT_MAX ? static_cast<long long>(TE_INVALID_OR_OUT_OF_RANGE) : size;
}

int CheckData(void const* data, int dataSize) {
    if (dataSize < 0)
        return TE_INVALID_OR_OUT_OF_RANGE;
    if (!data && dataSize > 0)
        return TE_INVALID_POINTER;
    return GetTextSizeForData(dataSize);
}

} // namespace

extern "C" int TEKIT_STDCALL GetTextSizeForData(int dataSize) {
    if (dataSize < 0 || TextSize(dataSize) >= INT_MAX)
        return TE_INVALID_OR_OUT_OF_RANGE;
    return static_cast<int>(TextSize(dataSize));
}

extern "C" int TEKIT_STDCALL GetDataSizeForText(int textLength) {
    if (textLength < 0)
        return TE_INVALID_OR_OUT_OF_RANGE;
    int const tail = kBytesForTail[textLength % 6];
    return tail < 0 ? static_cast<int>(TE_UNRECOGNIZED_VALUE) : textLength / 6 * 4 + tail;
}

extern "C" int TEKIT_STDCALL ConvertDataToTextInBuffer(void const* data, int dataSize, char* text,
                                                       int textBufferSize) {
    int const size = CheckData(data, dataSize);
    if (size < 0)
        return size;
    if (!text)
        return TE_INVALID_POINTER;
    if (textBufferSize <= size)
        return TE_INVALID_OR_OUT_OF_RANGE;
    if (Overlap(data, static_cast<std::size_t>(dataSize), text, static_cast<std::size_t>(size) + 1))
        return TE_INCOMPATIBLE_PARAMETERS;
    Encode(static_cast<unsigned char const*>(data), dataSize, text);
    return size;
}

extern "C" char* TEKIT_STDCALL ConvertDataToText(void const* data, int dataSize) {
    int const size = CheckData(data, dataSize);
    if (size < 0)
        return nullptr;
    auto* const text = static_cast<char*>(std::malloc(static_cast<std::size_t>(size) + 1));
    if (text)
        Encode(static_cast<unsigned char const*>(data), dataSize, text);
    return text;
}

extern "C" int TEKIT_STDCALL ConvertTextToDataInBuffer(char const* text, int textLength, void* data,
                                                       int dataBufferSize) {
    long long const length = TextLength(text, textLength);
    long long const size = CheckText(text, length);
    if (size < 0)
        return static_cast<int>(size);
    if (!data && size > 0)
        return TE_INVALID_POINTER;
    if (dataBufferSize < size)
        return TE_INVALID_OR_OUT_OF_RANGE;
    if (Overlap(text, static_cast<std::size_t>(length), data, static_cast<std::size_t>(size)))
        return TE_INCOMPATIBLE_PARAMETERS;
    Decode(reinterpret_cast<unsigned char const*>(text), static_cast<std::size_t>(length),
           static_cast<unsigned char*>(data));
    return static_cast<int>(size);
}

extern "C" void* TEKIT_STDCALL ConvertTextToData(char const* text, int textLength, int* dataSize) {
    long long const length = TextLength(text, textLength);
    long long const size = CheckText(text, length);
    if (size < 0)
        return nullptr;
    // One byte at least: an empty result is a valid block, not a failure.
    auto* const data =
        static_cast<unsigned char*>(std::malloc(size > 0 ? static_cast<std::size_t>(size) : 1u));
    if (!data)
        return nullptr;
    Decode(reinterpret_cast<unsigned char const*>(text), static_cast<std::size_t>(length), data);
    if (dataSize)
        *dataSize = static_cast<int>(size);
    return data;
}
