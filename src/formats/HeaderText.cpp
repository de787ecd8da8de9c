#include "formats/HeaderText.h"

#include "strings/MultiByteChars.h"
#include "tekit/strings/String.h"

#include <cstring>

namespace tekit::header_text {

void CopyCut(char* field, std::size_t size, char const* text) {
    if (!text || size == 0)
        return;
    std::size_t const limit = size - 1;
    std::size_t length = 0;
    if (String::IsMultiByteSupportEnabled()) {
        for (int step = mbcs::CharBytes(text); step > 0 && length + step <= limit;
             step = mbcs::CharBytes(text + length))
            length += static_cast<std::size_t>(step);
    } else {
        length = strnlen(text, limit);
    }
    std::memcpy(field, text, length);
}

bool MayBeXml(unsigned char const* data, unsigned count) {
    unsigned i = count >= 3 && data[0] == 0xEF && data[1] == 0xBB && data[2] == 0xBF ? 3 : 0;
    while (i < count && (data[i] == ' ' || data[i] == '\t' || data[i] == '\r' || data[i] == '\n'))
        ++i;
    return i < count && data[i] == '<';
}

} // namespace tekit::header_text
