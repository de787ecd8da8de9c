// Fuzzes the data-to-text encoding: the input decoded as text (into a buffer of exactly the
// announced size, so a read or write out of bounds is caught), and encoded as data and back.
//
// A text that decodes must be the one text of its bytes (encoding them gives it back); a text
// that does not decode must fail with TE_UNRECOGNIZED_VALUE and leave the buffer untouched.
#include "tekit/toolbox/DataText.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

namespace {

constexpr int kUnrecognizedValue = -17304;
constexpr char kAlphabet[] = ".0123456789ABCDEFGHIJKLMNOPQRSTUVWXYZ_abcdefghijklmnopqrstuvwxyz";

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

void DecodeText(std::string const& text) {
    int const length = static_cast<int>(text.size());
    int const expectedSize = GetDataSizeForText(length);
    // A heap block of exactly the size, filled with a marker.
    std::vector<unsigned char> data(expectedSize > 0 ? static_cast<std::size_t>(expectedSize) : 0,
                                    0xA5);
    int const size =
        ConvertTextToDataInBuffer(text.data(), length, data.data(), static_cast<int>(data.size()));
    if (size < 0) {
        Check(size == kUnrecognizedValue);
        for (unsigned char b : data)
            Check(b == 0xA5);
        Check(ConvertTextToData(text.data(), length, nullptr) == nullptr);
        return;
    }
    Check(size == expectedSize);
    std::vector<char> again(static_cast<std::size_t>(length) + 1);
    Check(ConvertDataToTextInBuffer(data.data(), size, again.data(), length + 1) == length);
    Check(std::memcmp(again.data(), text.data(), text.size()) == 0);
    // The terminated form reads the same bytes.
    int size2 = -1;
    void* const copy = ConvertTextToData(text.c_str(), -1, &size2);
    Check(copy != nullptr && size2 == size && std::memcmp(copy, data.data(), data.size()) == 0);
    TBFree(copy);
}

void EncodeData(std::string const& bytes) {
    int const n = static_cast<int>(bytes.size());
    char* const text = ConvertDataToText(bytes.data(), n);
    Check(text != nullptr);
    std::size_t const length = std::strlen(text);
    Check(static_cast<int>(length) == GetTextSizeForData(n));
    Check(std::strspn(text, kAlphabet) == length);
    int size = -1;
    void* const back = ConvertTextToData(text, -1, &size);
    Check(back != nullptr && size == n && std::memcmp(back, bytes.data(), bytes.size()) == 0);
    TBFree(back);
    TBFree(text);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    std::string const input(reinterpret_cast<char const*>(data), size);
    DecodeText(input);
    EncodeData(input);
    return 0;
}
