// Lines of a string and conversion of their endings.
//
// A line ends at "\n", "\r\n" or a lone "\r", so text from every platform's files and from
// edit controls reads the same. A final ending closes the last line and opens no new one, as
// in a text file. The walk goes by characters, so in multibyte mode the trail byte of a
// double-byte character is never taken for a line ending.
#include "strings/CharScan.h"
#include "strings/MultiByteChars.h"
#include "strings/TextEdit.h"
#include "strings/TextSearch.h"
#include "tekit/strings/String.h"

#include <string>

namespace tekit {

namespace {

/// One line: byte offsets of its start, of its ending and of the next line; the character
/// index of its start.
struct Line {
    int start = 0;
    int end = 0;
    int next = 0;
    int startChar = 0;
};

/// Hands out the lines of a text one after the other.
class LineWalker {
public:
    LineWalker(char const* text, bool mb) : m_text(text), m_mb(mb) {}

    /// The next line; false after the last one.
    bool Next(Line& line) {
        if (m_text[m_pos] == '\0')
            return false;
        line.start = m_pos;
        line.startChar = m_chars;
        char const* p = m_text + m_pos;
        for (; *p && *p != '\n' && *p != '\r'; ++m_chars)
            p += detail::CharBytes(p, m_mb);
        line.end = static_cast<int>(p - m_text);
        int const endingBytes = (*p == '\r' && p[1] == '\n') ? 2 : (*p ? 1 : 0);
        line.next = line.end + endingBytes;
        m_chars += endingBytes;
        m_pos = line.next;
        return true;
    }

private:
    char const* m_text;
    bool m_mb;
    int m_pos = 0;
    int m_chars = 0;
};

/// Line `lineIndex` of `text`; false when there is no such line.
bool FindLine(char const* text, int lineIndex, bool mb, Line& line) {
    if (lineIndex < 0)
        return false;
    LineWalker walker(text, mb);
    for (int i = 0; walker.Next(line); ++i)
        if (i == lineIndex)
            return true;
    return false;
}

/// True when `p` is a line ending that ConvertToCRLF changes: a lone "\r" or "\n" (`afterCR`
/// tells whether the character before `p` was a carriage return).
bool IsLoneEnding(char const* p, bool afterCR) {
    return (*p == '\r' && p[1] != '\n') || (*p == '\n' && !afterCR);
}

} // namespace

int String::GetNumLines() const {
    LineWalker walker(detail::ReadPtr(*this), m_isMultiByteSupportEnabled);
    Line line;
    int count = 0;
    while (walker.Next(line))
        ++count;
    return count;
}

void String::GetNthLine(int lineIndex, String& out) const {
    char const* text = detail::ReadPtr(*this);
    Line line;
    if (!FindLine(text, lineIndex, m_isMultiByteSupportEnabled, line)) {
        out.Clear();
        return;
    }
    // The assignment copies the bytes aside itself when `out` is this string.
    out.AssignUsingNumBytesInsteadOfNumChars(text + line.start, line.end - line.start, false);
}

int String::CharOffsetOfLine(int lineIndex) const {
    Line line;
    if (!FindLine(detail::ReadPtr(*this), lineIndex, m_isMultiByteSupportEnabled, line))
        return -1;
    return line.startChar;
}

void String::RemoveNthLine(int lineIndex) {
    int const numBytes = GetNumBytes();
    Line line;
    if (!FindLine(detail::ReadPtr(*this), lineIndex, m_isMultiByteSupportEnabled, line))
        return;
    if (line.next - line.start == numBytes)
        Clear();
    else
        SetCachedSize(detail::RemoveBytes(*this, numBytes, line.start, line.next - line.start));
}

void String::TruncateToNLines(int numLines) {
    char const* text = detail::ReadPtr(*this);
    Line line;
    if (numLines <= 0) {
        if (*text)
            Clear();
        return;
    }
    if (!FindLine(text, numLines - 1, m_isMultiByteSupportEnabled, line) || text[line.next] == '\0')
        return; // no line follows the ones kept
    if (line.end == 0)
        Clear();
    else
        SetCachedSize(detail::CutAt(*this, line.end));
}

void String::ConvertToCRLF() {
    bool const mb = m_isMultiByteSupportEnabled;
    char const* text = detail::ReadPtr(*this);
    int const numBytes = GetNumBytes();
    int added = 0;
    bool afterCR = false;
    for (char const* p = text; *p; p += detail::CharBytes(p, mb)) {
        added += IsLoneEnding(p, afterCR) ? 1 : 0;
        afterCR = detail::IsSingle(p, mb, '\r');
    }
    if (added == 0)
        return;
    std::string result;
    result.reserve(size_t(numBytes) + size_t(added));
    for (char const* p = text; *p;) {
        int width = detail::CharBytes(p, mb);
        if (*p == '\r' || *p == '\n') {
            result += "\r\n";
            width = (*p == '\r' && p[1] == '\n') ? 2 : 1;
        } else {
            result.append(p, size_t(width));
        }
        p += width;
    }
    AssignUsingNumBytesInsteadOfNumChars(result.c_str(), static_cast<int>(result.size()), false);
}

void String::ConvertFromCRLF() {
    bool const mb = m_isMultiByteSupportEnabled;
    int const numBytes = GetNumBytes();
    char const* found = detail::ReadPtr(*this);
    for (; *found && !(found[0] == '\r' && found[1] == '\n');
         found += detail::CharBytes(found, mb)) {
    }
    if (*found == '\0')
        return;
    int const from = static_cast<int>(found - detail::ReadPtr(*this));
    // Compacting in place: the write position never passes the read position.
    char* p = GetBufferWritePtr();
    int to = from;
    for (int i = from; i < numBytes;) {
        if (p[i] == '\r' && p[i + 1] == '\n') {
            ++i;
            continue;
        }
        int const width = detail::CharBytes(p + i, mb);
        for (int k = 0; k < width; ++k)
            p[to++] = p[i++];
    }
    p[to] = '\0';
    SetCachedSize(to + 1);
}

int String::GetIndexIfConvertToCRLF(int charIndex) const {
    bool const mb = m_isMultiByteSupportEnabled;
    int index = 0;
    int added = 0;
    bool afterCR = false;
    for (char const* p = detail::ReadPtr(*this); *p && index < charIndex;
         p += detail::CharBytes(p, mb), ++index) {
        added += IsLoneEnding(p, afterCR) ? 1 : 0;
        afterCR = detail::IsSingle(p, mb, '\r');
    }
    return index + added;
}

int String::GetIndexIfConvertFromCRLF(int charIndex) const {
    bool const mb = m_isMultiByteSupportEnabled;
    int index = 0;
    int removed = 0;
    for (char const* p = detail::ReadPtr(*this); *p && index < charIndex;
         p += detail::CharBytes(p, mb), ++index)
        removed += (p[0] == '\r' && p[1] == '\n') ? 1 : 0;
    return index - removed;
}

} // namespace tekit
