// Helpers of the header's text fields and of telling its forms apart.
#pragma once

#include <cstddef>

namespace tekit::header_text {

/// Bytes of a stream that the XML form's reader looks at for the header element.
constexpr unsigned kXmlWindow = 10240;

/// Copies `text` (null: empty) into a zeroed field of `size` bytes, cut to `size` - 1 bytes
/// and, in multibyte mode, never in the middle of a double-byte character.
void CopyCut(char* field, std::size_t size, char const* text);

/// False when the bytes cannot begin an XML document: after an optional UTF-8 byte-order mark
/// and white space, the first character is not "<". Spares the XML reader binary data.
bool MayBeXml(unsigned char const* data, unsigned count);

} // namespace tekit::header_text
