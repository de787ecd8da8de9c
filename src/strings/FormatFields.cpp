// The library's own printf: parsing fields and writing integers, floating-point numbers, text
// and pointers without the C runtime.
#include "strings/FormatFields.h"

#include "strings/MultiByteChars.h"
#include "tekit/strings/DynamicString.h"

#include <algorithm>
#include <charconv>
#include <cinttypes>
#include <cmath>
#include <cstring>
#include <cwchar>
#include <string_view>

namespace tekit::detail {

namespace {

using FSA = FormatStringAnalysis;

// ---- Parsing ---------------------------------------------------------------------------

bool IsConversion(char c) {
    return c != 0 && std::strchr("diouxXcCsSpnfFeEgGaA%", c) != nullptr;
}

/// Reads decimal digits into `value`, cut to the largest width or precision.
char const* ParseNumber(char const* p, int& value) {
    value = 0;
    for (; *p >= '0' && *p <= '9'; ++p)
        value = std::min(value * 10 + (*p - '0'), FSA::kMaxWidthOrPrecision);
    return p;
}

/// The flag characters in the order of their bits.
constexpr char kFlagChars[] = "-+ #0'";
static_assert(FSA::kFlagLeftJustify == 1 && FSA::kFlagZeroPad == 16 && FSA::kFlagGrouping == 32);

char const* ParseFlags(char const* p, unsigned& flags) {
    for (char const* f; *p != '\0' && (f = std::strchr(kFlagChars, *p)) != nullptr; ++p)
        flags |= 1u << (f - kFlagChars);
    return p;
}

/// Longer modifiers before their prefixes.
constexpr struct {
    char const* text;
    FSA::LengthModifier length;
} kLengths[] = {{"hh", FSA::kLength_hh}, {"h", FSA::kLength_h},     {"ll", FSA::kLength_ll},
                {"l", FSA::kLength_l},   {"q", FSA::kLength_ll},    {"L", FSA::kLength_L},
                {"j", FSA::kLength_j},   {"z", FSA::kLength_z},     {"t", FSA::kLength_t},
                {"w", FSA::kLength_w},   {"I64", FSA::kLength_I64}, {"I32", FSA::kLength_I32},
                {"I", FSA::kLength_I}};

char const* ParseLength(char const* p, FSA::LengthModifier& length) {
    if (*p == '\0' || std::strchr("hlqLjztwI", *p) == nullptr)
        return p;
    for (auto const& candidate : kLengths) {
        size_t const n = std::strlen(candidate.text);
        if (std::strncmp(p, candidate.text, n) == 0) {
            length = candidate.length;
            return p + n;
        }
    }
    return p;
}

// ---- Writing ---------------------------------------------------------------------------

/// Writes `prefix` (sign, "0x") and `body` padded to the field's width: spaces on the left or
/// right, or zeros between prefix and body.
void Pad(std::string& out, Field const& field, std::string_view prefix, std::string_view body,
         bool zeroPadAllowed) {
    size_t const length = prefix.size() + body.size();
    size_t const width = field.width > 0 ? size_t(field.width) : 0;
    size_t const fill = width > length ? width - length : 0;
    if (field.flags & FSA::kFlagLeftJustify) {
        out.append(prefix).append(body).append(fill, ' ');
    } else if (zeroPadAllowed && (field.flags & FSA::kFlagZeroPad)) {
        out.append(prefix).append(fill, '0').append(body);
    } else {
        out.append(fill, ' ').append(prefix).append(body);
    }
}

void ToUpper(std::string& text) {
    for (char& c : text)
        if (c >= 'a' && c <= 'z')
            c = char(c - 'a' + 'A');
}

/// The sign a field shows before a number.
std::string_view SignOf(bool negative, unsigned flags) {
    if (negative)
        return "-";
    if (flags & FSA::kFlagPlusSign)
        return "+";
    if (flags & FSA::kFlagSpaceSign)
        return " ";
    return "";
}

/// `bits` sign-extended from `numBytes` bytes.
std::int64_t SignExtend(std::uint64_t bits, int numBytes) {
    int const shift = 64 - 8 * numBytes;
    return static_cast<std::int64_t>(bits << shift) >> shift;
}

void AppendIntegerField(std::string& out, Field const& field, Value const& value) {
    int const numBytes = std::max(KindBytes(value.kind), 1);
    std::uint64_t const mask = numBytes >= 8 ? ~0ull : (1ull << (8 * numBytes)) - 1;
    std::uint64_t magnitude = value.bits & mask;
    char const conversion = field.conversion;
    if (conversion == 'c') {
        char const ch = char(magnitude & 0xFF);
        Pad(out, field, {}, std::string_view(&ch, 1), false);
        return;
    }
    bool negative = false;
    if (conversion == 'd' || conversion == 'i') {
        std::int64_t const s = SignExtend(magnitude, numBytes);
        negative = s < 0;
        magnitude = negative ? 0 - static_cast<std::uint64_t>(s) : static_cast<std::uint64_t>(s);
    }
    int const base = conversion == 'o' ? 8 : (conversion == 'x' || conversion == 'X') ? 16 : 10;
    char digits[72];
    auto const end = std::to_chars(digits, digits + sizeof digits, magnitude, base).ptr;
    std::string body(digits, end);
    if (conversion == 'X')
        ToUpper(body);
    if (field.precision == 0 && magnitude == 0)
        body.clear();
    else if (field.precision > 0 && body.size() < size_t(field.precision))
        body.insert(0, size_t(field.precision) - body.size(), '0');
    bool const alternate = (field.flags & FSA::kFlagAlternate) != 0;
    if (alternate && conversion == 'o' && (body.empty() || body[0] != '0'))
        body.insert(0, 1, '0');
    std::string prefix(conversion == 'd' || conversion == 'i' ? SignOf(negative, field.flags) : "");
    if (alternate && magnitude != 0 && (conversion == 'x' || conversion == 'X'))
        prefix += conversion == 'x' ? "0x" : "0X";
    Pad(out, field, prefix, body, field.precision < 0);
}

/// to_chars of a finite, non-negative value; a negative precision gives the shortest text.
std::string ToChars(double value, std::chars_format format, int precision) {
    std::string text(size_t(std::max(precision, 0)) + 400, '\0');
    char* const first = text.data();
    char* const last = first + text.size();
    auto const end = precision < 0 ? std::to_chars(first, last, value, format).ptr
                                   : std::to_chars(first, last, value, format, precision).ptr;
    text.resize(size_t(end - first));
    return text;
}

/// Makes sure a number body has a decimal point: after the first digit when it has an
/// exponent, at the end otherwise.
void EnsurePoint(std::string& body) {
    if (body.find('.') != std::string::npos)
        return;
    size_t const exponent = body.find_first_of("ep");
    body.insert(exponent == std::string::npos ? body.size() : 1, 1, '.');
}

/// %#g: like %g, but trailing zeros stay and the point is always written.
std::string AlternateGeneral(double value, int precision) {
    std::string const scientific = ToChars(value, std::chars_format::scientific, precision - 1);
    int exponent = 0;
    size_t const e = scientific.find('e');
    char const* p = scientific.c_str() + e + 1;
    if (*p == '+')
        ++p;
    std::from_chars(p, scientific.c_str() + scientific.size(), exponent);
    std::string body = (precision > exponent && exponent >= -4)
                           ? ToChars(value, std::chars_format::fixed, precision - 1 - exponent)
                           : scientific;
    EnsurePoint(body);
    return body;
}

/// The digits of a finite, non-negative value for a floating-point conversion (lower case).
std::string FloatBody(double value, char conversion, int precision, bool alternate) {
    switch (conversion | 0x20) {
    case 'f': {
        std::string body = ToChars(value, std::chars_format::fixed, precision < 0 ? 6 : precision);
        return alternate ? (EnsurePoint(body), body) : body;
    }
    case 'e': {
        std::string body =
            ToChars(value, std::chars_format::scientific, precision < 0 ? 6 : precision);
        return alternate ? (EnsurePoint(body), body) : body;
    }
    case 'a': {
        std::string body = ToChars(value, std::chars_format::hex, precision);
        return alternate ? (EnsurePoint(body), body) : body;
    }
    default: {
        int const p = precision < 0 ? 6 : precision == 0 ? 1 : precision;
        return alternate ? AlternateGeneral(value, p)
                         : ToChars(value, std::chars_format::general, p);
    }
    }
}

void AppendFloatField(std::string& out, Field const& field, double value, char decimalPoint) {
    bool const negative = std::signbit(value);
    bool const finite = std::isfinite(value);
    double const magnitude = std::fabs(value);
    std::string body = !finite ? std::string(std::isnan(value) ? "nan" : "inf")
                               : FloatBody(magnitude, field.conversion, field.precision,
                                           (field.flags & FSA::kFlagAlternate) != 0);
    std::replace(body.begin(), body.end(), '.', decimalPoint);
    bool const upper = field.conversion >= 'A' && field.conversion <= 'Z';
    std::string prefix(SignOf(negative, field.flags));
    if (finite && (field.conversion | 0x20) == 'a')
        prefix += "0x";
    if (upper) {
        ToUpper(body);
        ToUpper(prefix);
    }
    Pad(out, field, prefix, body, finite);
}

/// Bytes of `text` that a precision of `limit` bytes keeps (negative: all), never reading
/// past the limit and, in multibyte mode, never keeping half a double-byte character.
size_t TextBytes(char const* text, int limit) {
    size_t n = 0;
    if (limit < 0)
        return std::strlen(text);
    bool const multiByte = String::IsMultiByteSupportEnabled();
    while (n < size_t(limit) && text[n] != '\0') {
        if (multiByte && mbcs::IsLeadByte(text[n])) {
            if (n + 1 >= size_t(limit) || text[n + 1] == '\0')
                break;
            ++n;
        }
        ++n;
    }
    return n;
}

void AppendTextField(std::string& out, Field const& field, char const* text) {
    if (text == nullptr)
        text = "";
    Pad(out, field, {}, std::string_view(text, TextBytes(text, field.precision)), false);
}

void AppendValueField(std::string& out, Field const& field, Value const& value, char decimalPoint) {
    if (value.kind == FSA::kArgFloat64)
        AppendFloatField(out, field, value.number, decimalPoint);
    else if (value.kind == FSA::kArgText)
        AppendTextField(out, field, value.text);
    else
        AppendIntegerField(out, field, value);
}

// ---- Walking a format ------------------------------------------------------------------

/// Copies the literal text up to the next '%' (whole double-byte characters in multibyte
/// mode) and returns where it stopped.
char const* CopyLiteral(std::string& out, char const* p) {
    char const* start = p;
    if (String::IsMultiByteSupportEnabled()) {
        while (*p != '\0' && *p != '%')
            p = mbcs::Inc(p);
    } else {
        while (*p != '\0' && *p != '%')
            ++p;
    }
    out.append(start, p);
    return p;
}

/// Writes every field through `source.Write(out, field, fieldText, numBytes)`.
template <class Source> void Walk(std::string& out, char const* format, Source& source) {
    if (format == nullptr)
        return;
    char const* p = format;
    while (*(p = CopyLiteral(out, p)) != '\0') {
        Field field;
        int const numBytes = ParseField(p, field);
        if (field.conversion == '%')
            out += '%';
        else if (field.conversion == 0)
            out.append(p, size_t(numBytes));
        else
            source.Write(out, field, p, numBytes);
        p += numBytes;
    }
}

/// The source of FormatOne: the value for the first field that can show it.
struct OneValue {
    Value const& value;
    char decimalPoint;
    bool taken = false;

    void Write(std::string& out, Field field, char const* text, int numBytes) {
        char const conversion = taken ? 0 : FitConversion(field.conversion, value.kind);
        if (conversion == 0) {
            out.append(text, size_t(numBytes));
            return;
        }
        taken = true;
        field.conversion = conversion;
        if (field.width == FSA::kFromArgument)
            field.width = FSA::kNotGiven;
        if (field.precision == FSA::kFromArgument)
            field.precision = FSA::kNotGiven;
        AppendValueField(out, field, value, decimalPoint);
    }
};

/// The source of FormatArgs: C variadic arguments, read as the fields' types say.
struct VariadicArgs {
    std::va_list args;

    explicit VariadicArgs(std::va_list source) { va_copy(args, source); }
    ~VariadicArgs() { va_end(args); }
    VariadicArgs(VariadicArgs const&) = delete;
    VariadicArgs& operator=(VariadicArgs const&) = delete;

    void Write(std::string& out, Field field, char const*, int) {
        ReadStars(field);
        switch (field.conversion) {
        case 'd':
        case 'i':
            return AppendIntegerField(out, field, ReadSigned(field.length));
        case 'u':
        case 'o':
        case 'x':
        case 'X':
            return AppendIntegerField(out, field, ReadUnsigned(field.length));
        case 'c':
        case 'C':
            return AppendChar(out, field);
        case 's':
        case 'S':
            return AppendText(out, field);
        case 'p':
            return AppendPointerField(out, field);
        case 'n':
            (void)va_arg(args, void*);
            return;
        default:
            return AppendFloatField(out, field, ReadFloat(field.length), '.');
        }
    }

    void ReadStars(Field& field) {
        if (field.width == FSA::kFromArgument) {
            long long width = va_arg(args, int);
            if (width < 0) {
                field.flags |= FSA::kFlagLeftJustify;
                width = -width;
            }
            field.width = int(std::min<long long>(width, FSA::kMaxWidthOrPrecision));
        }
        if (field.precision == FSA::kFromArgument) {
            int const precision = va_arg(args, int);
            field.precision =
                precision < 0 ? FSA::kNotGiven : std::min(precision, FSA::kMaxWidthOrPrecision);
        }
    }

    Value ReadSigned(FSA::LengthModifier length) {
        switch (length) {
        case FSA::kLength_hh:
            return Value::Signed(va_arg(args, int), FSA::kArgInt8);
        case FSA::kLength_h:
            return Value::Signed(va_arg(args, int), FSA::kArgInt16);
        case FSA::kLength_l:
            return Value::Signed(va_arg(args, long), IntegerKind(sizeof(long), true));
        case FSA::kLength_ll:
        case FSA::kLength_L:
        case FSA::kLength_I64:
            return Value::Signed(va_arg(args, long long), FSA::kArgInt64);
        case FSA::kLength_j:
            return Value::Signed(va_arg(args, std::intmax_t), FSA::kArgInt64);
        case FSA::kLength_z:
        case FSA::kLength_t:
        case FSA::kLength_I:
            return Value::Signed(va_arg(args, std::ptrdiff_t),
                                 IntegerKind(sizeof(std::ptrdiff_t), true));
        default:
            return Value::Signed(va_arg(args, int), FSA::kArgInt32);
        }
    }

    Value ReadUnsigned(FSA::LengthModifier length) {
        switch (length) {
        case FSA::kLength_hh:
            return Value::Unsigned(va_arg(args, unsigned), FSA::kArgUInt8);
        case FSA::kLength_h:
            return Value::Unsigned(va_arg(args, unsigned), FSA::kArgUInt16);
        case FSA::kLength_l:
            return Value::Unsigned(va_arg(args, unsigned long), IntegerKind(sizeof(long), false));
        case FSA::kLength_ll:
        case FSA::kLength_L:
        case FSA::kLength_I64:
            return Value::Unsigned(va_arg(args, unsigned long long), FSA::kArgUInt64);
        case FSA::kLength_j:
            return Value::Unsigned(va_arg(args, std::uintmax_t), FSA::kArgUInt64);
        case FSA::kLength_z:
        case FSA::kLength_t:
        case FSA::kLength_I:
            return Value::Unsigned(va_arg(args, std::size_t),
                                   IntegerKind(sizeof(std::size_t), false));
        default:
            return Value::Unsigned(va_arg(args, unsigned), FSA::kArgUInt32);
        }
    }

    double ReadFloat(FSA::LengthModifier length) {
        if (length == FSA::kLength_L)
            return static_cast<double>(va_arg(args, long double));
        return va_arg(args, double);
    }

    static bool IsWide(Field const& field) {
        return field.conversion == 'C' || field.conversion == 'S' ||
               field.length == FSA::kLength_l || field.length == FSA::kLength_w;
    }

    void AppendChar(std::string& out, Field const& field) {
        int const ch = va_arg(args, int);
        if (!IsWide(field))
            return AppendIntegerField(out, field, Value::Signed(ch, FSA::kArgInt8));
        wchar_t const wide[2] = {static_cast<wchar_t>(ch), L'\0'};
        DynamicString const narrow(wide);
        AppendTextField(out, field, narrow.GetBufferReadPtr());
    }

    void AppendText(std::string& out, Field const& field) {
        if (!IsWide(field))
            return AppendTextField(out, field, va_arg(args, char const*));
        wchar_t const* wide = va_arg(args, wchar_t const*);
        DynamicString const narrow(wide != nullptr ? wide : L"");
        AppendTextField(out, field, narrow.GetBufferReadPtr());
    }

    void AppendPointerField(std::string& out, Field const& field) {
        std::string body;
        AppendPointer(body, reinterpret_cast<std::uintptr_t>(va_arg(args, void*)));
        Pad(out, field, {}, body, false);
    }
};

} // namespace

// ---- Public helpers ----------------------------------------------------------------------

int ParseField(char const* format, Field& field) {
    field = Field{};
    char const* p = ParseFlags(format + 1, field.flags);
    if (*p == '*') {
        field.width = FSA::kFromArgument;
        ++p;
    } else if (*p >= '0' && *p <= '9') {
        p = ParseNumber(p, field.width);
    }
    if (*p == '.') {
        if (*++p == '*') {
            field.precision = FSA::kFromArgument;
            ++p;
        } else {
            p = ParseNumber(p, field.precision);
        }
    }
    p = ParseLength(p, field.length);
    if (IsConversion(*p))
        field.conversion = *p++;
    field.numBytes = int(p - format);
    return field.numBytes;
}

char FitConversion(char conversion, long kind) {
    if (conversion == 'n' || conversion == 0 || conversion == '%' || kind == FSA::kArgNone)
        return 0;
    if (kind == FSA::kArgFloat64)
        return std::strchr("fFeEgGaA", conversion) ? conversion : 'g';
    if (kind == FSA::kArgText)
        return 's';
    if (std::strchr("diouxXc", conversion))
        return conversion;
    return KindIsSigned(kind) ? 'd' : 'u';
}

char const* LengthTextFor(long kind, char conversion) {
    // The platform printf's own modifier for 64-bit integers: PRId64 without its 'd'.
    static std::string const k64(PRId64, sizeof(PRId64) - 2);
    if (conversion == 'c' || conversion == 's')
        return "";
    switch (KindBytes(kind)) {
    case 1:
        return "hh";
    case 2:
        return "h";
    case 8:
        return k64.c_str();
    default:
        return "";
    }
}

Value Value::Signed(std::int64_t v, long kind) {
    Value value;
    value.kind = kind;
    value.bits = static_cast<std::uint64_t>(v);
    return value;
}

Value Value::Unsigned(std::uint64_t v, long kind) {
    Value value;
    value.kind = kind;
    value.bits = v;
    return value;
}

Value Value::Float(double v) {
    Value value;
    value.kind = FSA::kArgFloat64;
    value.number = v;
    return value;
}

Value Value::Text(char const* v) {
    Value value;
    value.kind = FSA::kArgText;
    value.text = v;
    return value;
}

int KindBytes(long kind) {
    switch (kind) {
    case FSA::kArgInt8:
    case FSA::kArgUInt8:
        return 1;
    case FSA::kArgInt16:
    case FSA::kArgUInt16:
        return 2;
    case FSA::kArgInt32:
    case FSA::kArgUInt32:
        return 4;
    case FSA::kArgInt64:
    case FSA::kArgUInt64:
        return 8;
    default:
        return 0;
    }
}

bool KindIsSigned(long kind) {
    return kind == FSA::kArgInt8 || kind == FSA::kArgInt16 || kind == FSA::kArgInt32 ||
           kind == FSA::kArgInt64;
}

long IntegerKind(int numBytes, bool isSigned) {
    switch (numBytes) {
    case 1:
        return isSigned ? FSA::kArgInt8 : FSA::kArgUInt8;
    case 2:
        return isSigned ? FSA::kArgInt16 : FSA::kArgUInt16;
    case 8:
        return isSigned ? FSA::kArgInt64 : FSA::kArgUInt64;
    default:
        return isSigned ? FSA::kArgInt32 : FSA::kArgUInt32;
    }
}

void FormatOne(std::string& out, char const* format, Value const& value, char decimalPoint) {
    OneValue source{value, decimalPoint};
    Walk(out, format, source);
}

void FormatArgs(std::string& out, char const* format, std::va_list args) {
    VariadicArgs source(args);
    Walk(out, format, source);
}

void AppendShortestDouble(std::string& out, double value, char decimalPoint) {
    if (std::signbit(value))
        out += '-';
    if (!std::isfinite(value)) {
        out += std::isnan(value) ? "nan" : "inf";
        return;
    }
    char digits[64];
    auto const end = std::to_chars(digits, digits + sizeof digits, std::fabs(value)).ptr;
    size_t const start = out.size();
    out.append(digits, end);
    std::replace(out.begin() + std::ptrdiff_t(start), out.end(), '.', decimalPoint);
}

void AppendPointer(std::string& out, std::uintptr_t value) {
    char digits[2 * sizeof(void*) + 1];
    auto const end = std::to_chars(digits, digits + sizeof digits, value, 16).ptr;
    std::string body(digits, end);
    ToUpper(body);
    out += "0x";
    out.append(2 * sizeof(void*) - body.size(), '0');
    out += body;
}

void AppendDecimal(std::string& out, std::int64_t value) {
    char digits[24];
    out.append(digits, std::to_chars(digits, digits + sizeof digits, value).ptr);
}

void AppendDecimal(std::string& out, std::uint64_t value) {
    char digits[24];
    out.append(digits, std::to_chars(digits, digits + sizeof digits, value).ptr);
}

} // namespace tekit::detail
