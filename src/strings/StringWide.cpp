// The family's wide, UTF-8 and COM text: converted on the way in and out, never stored.
#include "strings/WideText.h"
#include "tekit/strings/String.h"

#include <algorithm>
#include <cstring>
#include <string>

namespace tekit {

int String::ConvertToUnicodeInBufferTruncateIfNeeded(wchar_t* buffer, int size) const {
    if (!buffer || size < 1)
        return 0;
    std::wstring const text = detail::ToWide(GetBufferReadPtr(), GetNumBytes());
    int n = std::min(static_cast<int>(text.size()), size - 1);
    // Where wchar_t is UTF-16, a cut never leaves the first half of a surrogate pair.
    if (sizeof(wchar_t) == 2 && n > 0 && text[size_t(n - 1)] >= 0xD800 &&
        text[size_t(n - 1)] <= 0xDBFF)
        --n;
    std::copy_n(text.data(), n, buffer);
    buffer[n] = L'\0';
    return n;
}

char* String::AllocUTF8(char* buffer, long size, long* length) const {
    std::wstring const text = detail::ToWide(GetBufferReadPtr(), GetNumBytes());
    std::string const utf8 = detail::WideToUtf8(text.c_str(), static_cast<int>(text.size()));
    if (length)
        *length = static_cast<long>(utf8.size());
    char* out = buffer;
    if (!buffer || size < 0 || static_cast<unsigned long>(size) <= utf8.size())
        out = new char[utf8.size() + 1];
    std::memcpy(out, utf8.c_str(), utf8.size() + 1);
    return out;
}

// Only what AllocUTF8 allocated may come here: never the caller's own buffer.
void String::FreeUTF8(char* utf8) {
    delete[] utf8;
}

void String::AssignFromUTF8(char const* utf8, int numBytes) {
    std::wstring const text = detail::Utf8ToWide(utf8, numBytes);
    std::string const narrow = detail::ToNarrow(text.c_str(), static_cast<int>(text.size()));
    AssignUsingNumBytesInsteadOfNumChars(narrow.c_str(), static_cast<int>(narrow.size()), false);
}

} // namespace tekit
