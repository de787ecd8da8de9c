// Fuzzes the pattern engine with arbitrary patterns and texts. Every result must be 0 or a code
// of the status table; a match must lie inside one line of the text; and a match found must be
// found again when the search starts at it, forward or backward.
//
// Input: one byte of flags (case, direction, policy, multibyte mode), one byte for the start
// offset, then the pattern up to the first 0xFF byte, then the text (NUL bytes included).
#include "tekit/strings/MultiByte.h"
#include "tekit/strings/String.h"
#include "tekit/toolbox/RegExpr.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

bool IsTableCode(int rc) {
    if (rc == REGEXPR_ALLOCATION_FAILED)
        return true;
    return std::strcmp(RegExpr_GetOVErrorDescTag(rc, nullptr), "REGEXPR_UnknownError") != 0;
}

struct Match {
    int rc, found, position, length;
};

Match Find(std::string const& pattern, std::string const& text, int flags, int start, int forward) {
    Match m{};
    char bad = 'x';
    m.rc = RegExpr_FindPatternInText(pattern.c_str(), flags & 1, text.data(),
                                     static_cast<int>(text.size()), start, forward,
                                     (flags >> 2) & 1, &m.found, &m.position, &m.length, &bad);
    if (m.rc < 0) {
        Check(IsTableCode(m.rc));
        Check(m.found == 0 && m.position == -1 && m.length == -1);
        int takesArgument = 0;
        RegExpr_GetOVErrorDescTag(m.rc, &takesArgument);
        Check(takesArgument == 1 ? bad != '\0' : bad == '\0');
    }
    return m;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    static bool const once = [] {
        tekit::SetMultiByteCodePage(932);
        return true;
    }();
    (void)once;
    if (size < 2)
        return 0;
    int const flags = data[0];
    int const start = static_cast<signed char>(data[1]);
    auto const* begin = reinterpret_cast<char const*>(data + 2);
    auto const* end = reinterpret_cast<char const*>(data + size);
    auto const* split = static_cast<char const*>(std::memchr(begin, '\xFF', end - begin));
    std::string pattern(begin, split ? split : end);
    pattern = pattern.substr(0, std::strlen(pattern.c_str())); // the pattern ends at a NUL
    std::string const text(split ? split + 1 : end, end);
    tekit::String::EnableMultiByteSupport((flags & 8) != 0);

    int const forward = (flags >> 1) & 1;
    Match const m = Find(pattern, text, flags, start, forward);
    Check(m.rc <= 0);
    if (m.rc == 0 && m.found == 0)
        Check(m.position == -1 && m.length == -1);
    if (m.rc == 0 && m.found == 1) {
        auto const textSize = static_cast<int>(text.size());
        Check(m.position >= 0 && m.length >= 0 && m.position + m.length <= textSize);
        for (int i = m.position; i < m.position + m.length; ++i)
            Check(text[i] != '\r' && text[i] != '\n');
        if (forward)
            Check(m.position >= start || start < 0);
        else
            Check(m.position <= start);
        // The same match is found from its own position, in either direction (the longest
        // policy retries every position backward).
        Match const again = Find(pattern, text, (flags & 1) | 4, m.position, 1);
        Check(again.found == 1 && again.position == m.position);
        Match const back = Find(pattern, text, (flags & 1) | 4, m.position, 0);
        Check(back.found == 1 && back.position == m.position);
    }
    int error = 1;
    bool const valid = OVIsValidRegularExpression(pattern.c_str(), &error);
    Check(valid == (m.rc >= 0) && (valid ? error == 0 : error == m.rc));
    return 0;
}
