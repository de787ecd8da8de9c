// The decimal point of numbers: the period or the user's decimal separator.
#include "tekit/strings/DecimalPoint.h"

#include "platform/Locale.h"
#include "strings/MultiByteChars.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/String.h"

#include <string>

namespace tekit {

LocalizeExprFunc String::s_localizeExprFuncPtr = nullptr;

namespace {

/// Byte offset of the next character after `p` (whole double-byte characters in multibyte
/// mode).
char const* Next(char const* p, bool multiByte) {
    return multiByte ? mbcs::Inc(p) : p + 1;
}

/// Replaces every `from` of the text by `to`, writing only when there is one.
void ReplaceChar(String& text, char from, char to) {
    bool const multiByte = String::IsMultiByteSupportEnabled();
    char const* const read = text.GetBufferReadPtr();
    char const* p = read;
    while (*p != '\0' && *p != from)
        p = Next(p, multiByte);
    if (*p == '\0')
        return;
    char* const write = text.GetBufferWritePtr();
    for (char* q = write + (p - read); *q != '\0'; q = const_cast<char*>(Next(q, multiByte)))
        if (*q == from)
            *q = to;
    text.ReleasePtr();
}

bool IsDigit(char c) {
    return c >= '0' && c <= '9';
}
bool IsNameChar(char c) {
    return IsDigit(c) || c == '_' || ((c | 0x20) >= 'a' && (c | 0x20) <= 'z') ||
           static_cast<unsigned char>(c) >= 0x80;
}

// ---- Expressions ---------------------------------------------------------------------------

/// The built-in LocalizeExpression: a scan that knows quoted text, names and numbers.
class ExpressionScan {
public:
    ExpressionScan(char const* text, char from, char to)
        : m_p(text), m_from(from), m_to(to), m_multiByte(String::IsMultiByteSupportEnabled()) {}

    std::string Run() {
        while (*m_p != '\0') {
            if (*m_p == '"')
                CopyQuoted();
            else if (IsDigit(*m_p) || (*m_p == m_from && IsDigit(m_p[1]) && !m_afterOperand))
                CopyNumber();
            else if (IsNameChar(*m_p))
                CopyName();
            else
                CopyOther();
        }
        return m_out;
    }

private:
    void CopyChar() {
        char const* next = Next(m_p, m_multiByte);
        m_out.append(m_p, next);
        m_p = next;
    }

    /// "..." with backslash escapes, copied as it stands.
    void CopyQuoted() {
        CopyChar();
        while (*m_p != '\0' && *m_p != '"') {
            if (*m_p == '\\' && m_p[1] != '\0')
                CopyChar();
            CopyChar();
        }
        if (*m_p == '"')
            CopyChar();
        m_afterOperand = true;
    }

    /// Digits with one decimal point and an exponent; hex literals have no point.
    void CopyNumber() {
        if (m_p[0] == '0' && (m_p[1] | 0x20) == 'x') {
            CopyName();
            return;
        }
        bool point = false;
        for (; IsDigit(*m_p) || (*m_p == m_from && !point && IsDigitOrEnd(m_p[1])); ++m_p) {
            point = point || *m_p == m_from;
            m_out += *m_p == m_from ? m_to : *m_p;
        }
        if ((*m_p | 0x20) == 'e' &&
            (IsDigit(m_p[1]) || ((m_p[1] == '+' || m_p[1] == '-') && IsDigit(m_p[2])))) {
            m_out.append(m_p, 2);
            for (m_p += 2; IsDigit(*m_p); ++m_p)
                m_out += *m_p;
        }
        m_afterOperand = true;
    }

    /// A decimal point needs a digit after it; a period may also end a number ("5." is 5.0)
    /// unless a name follows ("5.x" stays). A comma never ends one: "f(1, 2)" is a list.
    bool IsDigitOrEnd(char next) const {
        return IsDigit(next) || (m_from == '.' && !IsNameChar(next));
    }

    /// A name, with what follows a '.' after it (member access, never a decimal point).
    void CopyName() {
        while (IsNameChar(*m_p))
            CopyChar();
        m_afterOperand = true;
    }

    /// Operators and brackets: a period after one starts a number (".5"), never after a name.
    void CopyOther() {
        char const c = *m_p;
        CopyChar();
        if (c != ' ' && c != '\t')
            m_afterOperand = false;
    }

    char const* m_p;
    char m_from, m_to;
    bool m_multiByte;
    bool m_afterOperand = false;
    std::string m_out;
};

/// The built-in LocalizeExpression.
void LocalizeExpressionByScan(String const& expression, kDecimalPointLocalizationOptions options,
                              bool localize, String& result) {
    char const separator = String::GetLocalizedDecimalPoint(options);
    if (separator == '.') {
        if (&result != &expression)
            result.Assign(expression);
        return;
    }
    ExpressionScan scan(expression.GetBufferReadPtr(), localize ? '.' : separator,
                        localize ? separator : '.');
    std::string const text = scan.Run();
    result.AssignUsingNumBytesInsteadOfNumChars(text.c_str(), int(text.size()), false);
}

} // namespace

// ---- DecimalPointLocalizer -------------------------------------------------------------------

DecimalPointLocalizer::DecimalPointLocalizer(kDecimalPointLocalizationOptions options)
    : m_options(options), m_decimalPoint(options == kDecimalPoint_UseSystemSeparator
                                             ? platform::GetSystemDecimalSeparator()
                                             : '.') {}

void DecimalPointLocalizer::Localize(String& number) const {
    if (IsLocalizing())
        ReplaceChar(number, '.', m_decimalPoint);
}

void DecimalPointLocalizer::Delocalize(String& number) const {
    if (IsLocalizing())
        ReplaceChar(number, m_decimalPoint, '.');
}

// ---- String members --------------------------------------------------------------------------

char String::GetLocalizedDecimalPoint(kDecimalPointLocalizationOptions options) {
    return DecimalPointLocalizer(options).GetDecimalPoint();
}

void String::Localize(kDecimalPointLocalizationOptions options) {
    DecimalPointLocalizer(options).Localize(*this);
}

void String::Delocalize(kDecimalPointLocalizationOptions options) {
    DecimalPointLocalizer(options).Delocalize(*this);
}

void String::TrimTrailingZeros(kDecimalPointLocalizationOptions options) {
    char const decimalPoint = GetLocalizedDecimalPoint(options);
    bool const multiByte = IsMultiByteSupportEnabled();
    char const* const text = GetBufferReadPtr();
    char const* point = text;
    while (*point != '\0' && *point != decimalPoint)
        point = Next(point, multiByte);
    if (*point == '\0')
        return;
    char const* fractionEnd = point + 1;
    while (IsDigit(*fractionEnd))
        ++fractionEnd;
    char const* keep = fractionEnd;
    while (keep > point + 1 && keep[-1] == '0')
        --keep;
    if (keep == fractionEnd && keep != point + 1)
        return;
    if (keep == point + 1)
        keep = point; // no fraction digit left: the point goes too
    bool const needZero = keep == point && (point == text || !IsDigit(point[-1]));
    int const removeStart = ByteToCharIndex(int(keep - text));
    RemoveSubstring(removeStart, int(fractionEnd - keep));
    if (needZero)
        InsertChar('0', removeStart);
}

void String::LocalizeExpression(String const& expression, kDecimalPointLocalizationOptions options,
                                bool localize, String& result) {
    LocalizeExprFunc const func = s_localizeExprFuncPtr;
    (func != nullptr ? func : LocalizeExpressionByScan)(expression, options, localize, result);
}

LocalizeExprFunc String::RegisterLocalizeExprFunc(LocalizeExprFunc func) {
    LocalizeExprFunc const previous = s_localizeExprFuncPtr;
    s_localizeExprFuncPtr = func;
    return previous;
}

} // namespace tekit
