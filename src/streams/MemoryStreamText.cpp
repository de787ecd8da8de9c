// The memory stream's contents as text: the stringified form (the data-to-text encoding) and
// the UTF-8 form.
#include "tekit/streams/OVMemoryStream.h"

#include "platform/Heap.h"
#include "tekit/errors/Raise.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/toolbox/DataText.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <memory>

namespace tekit {

namespace {

constexpr auto kMaxInt = static_cast<std::uint32_t>(std::numeric_limits<int>::max());

struct Utf8Deleter {
    void operator()(char* text) const { String::FreeUTF8(text); }
};

} // namespace

void OVMemoryStream::ReplaceContents(void const* data, std::uint32_t count, char const* function) {
    if (count > m_capacity) {
        // A new block first, so a failed allocation leaves this stream as it was.
        auto* block = static_cast<unsigned char*>(platform::HeapAllocate(count));
        if (!block)
            TE_RAISE(TE_OUT_OF_MEMORY, "", function);
        platform::HeapFree(m_buffer);
        m_buffer = block;
        m_capacity = count;
    }
    if (count)
        std::memmove(m_buffer, data, count);
    m_size = count;
    m_offset = 0;
}

void OVMemoryStream::GetStringifiedVersionOfData(DynamicString& text) const {
    char const* const kFunction = "OVMemoryStream::GetStringifiedVersionOfData";
    int const length = m_size > kMaxInt ? -1 : GetTextSizeForData(static_cast<int>(m_size));
    if (length < 0)
        Throw32BitOverflowException(kFunction, TE_FILE_BASE_NAME, __LINE__, true);
    DynamicString result;
    result.RequestBufferSize(length + 1, false, true);
    int const written = ConvertDataToTextInBuffer(m_buffer, static_cast<int>(m_size),
                                                  result.GetBufferWritePtr(), length + 1);
    if (written < 0)
        TE_RAISE(static_cast<TEError>(written), "", kFunction);
    result.ReleasePtr();
    text = result;
}

void OVMemoryStream::SetDataFromStringifiedVersion(String const& text) {
    char const* const kFunction = "OVMemoryStream::SetDataFromStringifiedVersion";
    int const length = text.GetNumBytes();
    int const size = GetDataSizeForText(length);
    if (size < 0)
        TE_RAISE(static_cast<TEError>(size), "", kFunction);
    // Decoded into a block of its own: malformed text must leave the stream as it was.
    std::uint32_t const capacity = std::max(static_cast<std::uint32_t>(size), kInitialCapacity);
    std::unique_ptr<unsigned char, void (*)(void*)> block(
        static_cast<unsigned char*>(platform::HeapAllocate(capacity)), platform::HeapFree);
    if (!block)
        TE_RAISE(TE_OUT_OF_MEMORY, "", kFunction);
    int const decoded =
        ConvertTextToDataInBuffer(text.GetBufferReadPtr(), length, block.get(), size);
    if (decoded < 0)
        TE_RAISE(static_cast<TEError>(decoded), "", kFunction);
    platform::HeapFree(m_buffer);
    m_buffer = block.release();
    m_capacity = capacity;
    m_size = static_cast<std::uint32_t>(decoded);
    m_offset = 0;
}

void OVMemoryStream::GetData_AssumingDataIsUTF8(DynamicString& text) const {
    auto const* nul =
        static_cast<unsigned char const*>(m_size ? std::memchr(m_buffer, 0, m_size) : nullptr);
    std::uint32_t const length = nul ? static_cast<std::uint32_t>(nul - m_buffer) : m_size;
    if (length > kMaxInt)
        Throw32BitOverflowException("OVMemoryStream::GetData_AssumingDataIsUTF8", TE_FILE_BASE_NAME,
                                    __LINE__, true);
    DynamicString result;
    result.AssignFromUTF8(reinterpret_cast<char const*>(m_buffer), static_cast<int>(length));
    text = result;
}

void OVMemoryStream::SetData_AsUTF8(String const& text) {
    long length = 0;
    std::unique_ptr<char, Utf8Deleter> const utf8(text.AllocUTF8(nullptr, 0, &length));
    ReplaceContents(utf8.get(), static_cast<std::uint32_t>(length),
                    "OVMemoryStream::SetData_AsUTF8");
}

} // namespace tekit
