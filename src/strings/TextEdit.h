// Byte-level editing steps shared by the sub-string, line and case members.
//
// Each step works through the virtual storage operations only, so it runs on every kind of
// storage, and returns the string's new cached size (bytes including the terminator, or -1
// when it is not known) for the calling member to store:
//
//   StableText const text(*this, replacement, -1);  // copied aside only if it points into us
//   SetCachedSize(detail::InsertBytes(*this, length, offset, text.data(), text.size()));
#pragma once

#include "tekit/errors/Raise.h"
#include "tekit/strings/String.h"

#include <algorithm>
#include <climits>
#include <cstring>
#include <string>

namespace tekit::detail {

/// A text argument made safe against writes to `target`: when it points into the target's
/// buffer (which a write may move or overwrite) it is copied aside first. Either way data()
/// is NUL-terminated after size() bytes.
class StableText {
public:
    /// `numBytes` negative: to the terminator. A null text is the empty text.
    StableText(String const& target, char const* text, int numBytes) {
        if (!text)
            text = "";
        m_size = numBytes < 0 ? static_cast<int>(std::strlen(text)) : numBytes;
        char const* start = target.GetBufferReadPtr();
        int const capacity = target.GetBufferSize();
        if (start && capacity > 0 && text >= start && text < start + capacity) {
            m_copy.assign(text, size_t(m_size));
            text = m_copy.c_str();
        }
        m_data = text;
    }
    StableText(StableText const&) = delete;
    StableText& operator=(StableText const&) = delete;

    char const* data() const { return m_data; }
    int size() const { return m_size; }

private:
    std::string m_copy;
    char const* m_data = nullptr;
    int m_size = 0;
};

/// Removes `numBytes` bytes at byte `offset` of `s`, whose text has `length` bytes.
inline int RemoveBytes(String& s, int length, int offset, int numBytes) {
    String::StringRemove(s.GetBufferWritePtr(), offset, numBytes);
    return length - numBytes + 1;
}

/// Ends the text of `s` at byte `offset` (a character boundary).
inline int CutAt(String& s, int offset) {
    s.GetBufferWritePtr()[offset] = '\0';
    return offset + 1;
}

/// Inserts `numBytes` bytes of `text` (not inside `s`, NUL-terminated after them) at byte
/// `offset` of `s`. Storage that cannot hold the result keeps its start, never half a
/// double-byte character.
inline int InsertBytes(String& s, int length, int offset, char const* text, int numBytes) {
    if (static_cast<long long>(length) + numBytes >= INT_MAX)
        Throw32BitOverflowException("String::InsertSubstring", TE_FILE_BASE_NAME, __LINE__, true);
    int const wanted = length + numBytes + 1;
    int const available = s.RequestBufferSize(wanted, true, false);
    char* p = s.GetBufferWritePtr();
    if (available >= wanted) {
        std::memmove(p + offset + numBytes, p + offset, size_t(length - offset + 1));
        std::memcpy(p + offset, text, size_t(numBytes));
        return wanted;
    }
    if (available < 1)
        return -1;
    offset = std::min(offset, available - 1);
    bool const mb = String::IsMultiByteSupportEnabled();
    int const room = std::max(available - 1 - offset, 0);
    if (room < numBytes) {
        // The inserted text itself is cut, so nothing of the old tail survives.
        int const keep = mb ? String::SizeOfMBCSSubString(text, -1, room) : room;
        std::memcpy(p + offset, text, size_t(keep));
        p[offset + keep] = '\0';
        return offset + keep + 1;
    }
    if (mb)
        String::MBCSStringInsert(p, text, offset, available);
    else
        String::StringInsert(p, text, offset, available);
    return -1;
}

/// Replaces `removeBytes` bytes at byte `offset` of `s` (text of `length` bytes) by `text`,
/// handing each new cached size to `setSize`. Removing first means storage that cannot grow
/// keeps the start of the result.
template <class SetSize>
void Splice(String& s, int length, int offset, int removeBytes, StableText const& text,
            SetSize setSize) {
    if (removeBytes > 0) {
        setSize(RemoveBytes(s, length, offset, removeBytes));
        length -= removeBytes;
    }
    if (text.size() > 0)
        setSize(InsertBytes(s, length, offset, text.data(), text.size()));
}

/// Splice in one step when the storage holds the whole result: one resize at most and one move
/// of the tail, instead of a removal and an insertion that may each resize. Storage that cannot
/// hold the result takes Splice's way, so what it keeps is the same.
template <class SetSize>
void Replace(String& s, int length, int offset, int removeBytes, StableText const& text,
             SetSize setSize) {
    if (removeBytes == 0 && text.size() == 0)
        return; // nothing changes: nothing is written
    int const newLength = length - removeBytes + text.size();
    if (static_cast<long long>(length) + text.size() < INT_MAX) {
        int const wanted = std::max(newLength, length) + 1;
        if (s.RequestBufferSize(wanted, true, false) >= wanted) {
            char* p = s.GetBufferWritePtr();
            std::memmove(p + offset + text.size(), p + offset + removeBytes,
                         size_t(length - offset - removeBytes + 1));
            std::memcpy(p + offset, text.data(), size_t(text.size()));
            setSize(newLength + 1);
            return;
        }
    }
    Splice(s, length, offset, removeBytes, text, setSize);
}

} // namespace tekit::detail
