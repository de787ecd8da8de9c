// StringVector's comma-separated text, joining and SAFEARRAY conversions.
#include "tekit/strings/StringVector.h"

#include "strings/CharScan.h"
#include "strings/ErrDescr.h"
#include "tekit/errors/Raise.h"

#include <string>

namespace tekit {

namespace {

/// The delimiter to use: NUL means the comma; a double quote cannot be one.
char CheckedDelimiter(char delimiter, char const* function) {
    if (delimiter == '"')
        TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE, DescribeError("CSV_CANNOT_USE_QUOTE_AS_A_DELIMIER"),
                 function);
    return delimiter == '\0' ? ',' : delimiter;
}

bool NeedsQuotes(char const* item, char delimiter, bool mb) {
    for (char const* p = item; *p; p += detail::CharBytes(p, mb))
        if (detail::CharBytes(p, mb) == 1 &&
            (*p == delimiter || *p == '"' || *p == '\r' || *p == '\n'))
            return true;
    return false;
}

void AppendQuoted(std::string& out, char const* item, bool mb) {
    out += '"';
    for (char const* p = item; *p;) {
        int const n = detail::CharBytes(p, mb);
        if (n == 1 && *p == '"')
            out += '"';
        out.append(p, static_cast<size_t>(n));
        p += n;
    }
    out += '"';
}

/// Reads one item starting at `p` into `item`; returns where it ends (at the delimiter or
/// the terminator).
char const* ReadItem(char const* p, char delimiter, bool mb, char const* whole, std::string& item) {
    if (*p == '"') {
        for (++p;;) {
            if (!*p)
                TE_RAISE(TE_UNRECOGNIZED_VALUE, DescribeError("CSV_UNTERMINATED_QUOTE_1", whole),
                         "StringVector::SetFromCSVString");
            if (*p == '"' && p[1] == '"') {
                item += '"';
                p += 2;
                continue;
            }
            if (*p == '"')
                break;
            int const n = detail::CharBytes(p, mb);
            item.append(p, static_cast<size_t>(n));
            p += n;
        }
        ++p; // past the closing quote
    }
    while (*p && !detail::IsSingle(p, mb, delimiter)) {
        int const n = detail::CharBytes(p, mb);
        item.append(p, static_cast<size_t>(n));
        p += n;
    }
    return p;
}

} // namespace

void StringVector::CreateCSVString(String& csv, char delimiter) const {
    delimiter = CheckedDelimiter(delimiter, "StringVector::CreateCSVString");
    bool const mb = String::IsMultiByteSupportEnabled();
    std::string out;
    for (size_t i = 0; i < size(); ++i) {
        if (i > 0)
            out += delimiter;
        char const* item = (*this)[i].GetBufferReadPtr();
        bool const loneEmpty = size() == 1 && !*item;
        if (loneEmpty || NeedsQuotes(item, delimiter, mb))
            AppendQuoted(out, item, mb);
        else
            out += item;
    }
    detail::AssignResult(csv, out);
}

void StringVector::SetFromCSVString(String const& csv, char delimiter) {
    delimiter = CheckedDelimiter(delimiter, "StringVector::SetFromCSVString");
    bool const mb = String::IsMultiByteSupportEnabled();
    std::string const text = csv.GetBufferReadPtr(); // csv may be one of our own items
    StringVector items;
    for (char const* p = text.c_str(); *p || !items.empty();) {
        std::string item;
        p = ReadItem(p, delimiter, mb, text.c_str(), item);
        items.emplace_back(item.c_str());
        if (!*p)
            break;
        ++p; // past the delimiter: another item follows, maybe empty
    }
    swap(items);
}

void StringVector::Join(String& result, char const* separator) const {
    std::string out;
    for (size_t i = 0; i < size(); ++i) {
        if (i > 0 && separator)
            out += separator;
        out += (*this)[i].GetBufferReadPtr();
    }
    detail::AssignResult(result, out);
}

int StringVector::Find(char const* text, bool ignoreCase) const {
    for (size_t i = 0; i < size(); ++i)
        if ((*this)[i].Compare(text ? text : "", ignoreCase) == 0)
            return static_cast<int>(i);
    return -1;
}

} // namespace tekit
