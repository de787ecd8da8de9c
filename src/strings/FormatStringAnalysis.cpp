// Analysis of printf-style formats and their repair for one argument.
#include "tekit/strings/FormatStringAnalysis.h"

#include "strings/FormatFields.h"
#include "strings/MultiByteChars.h"

#include <string>
#include <string_view>

namespace tekit {

// Out-of-class definitions make the DLL export the constants: MinGW imports a constant of an
// exported class from the DLL wherever a caller takes its address or binds a reference to it.
constexpr int FormatStringAnalysis::kNotGiven;
constexpr int FormatStringAnalysis::kFromArgument;
constexpr int FormatStringAnalysis::kMaxWidthOrPrecision;

namespace {

/// The flags of a field in one fixed order; the grouping flag is dropped (it would make the
/// C runtime's text depend on the locale).
void AppendFlags(std::string& out, unsigned flags) {
    using FSA = FormatStringAnalysis;
    static constexpr struct {
        unsigned flag;
        char text;
    } kFlags[] = {{FSA::kFlagLeftJustify, '-'},
                  {FSA::kFlagPlusSign, '+'},
                  {FSA::kFlagSpaceSign, ' '},
                  {FSA::kFlagAlternate, '#'},
                  {FSA::kFlagZeroPad, '0'}};
    for (auto const& f : kFlags)
        if (flags & f.flag)
            out += f.text;
}

/// The text of `field` fitted to one value of `kind`, or the field as literal text when it
/// must not read that value.
std::string FitField(FormatStringAnalysis::Field const& field, std::string_view original, long kind,
                     bool& valueTaken) {
    char const conversion = valueTaken ? 0 : detail::FitConversion(field.conversion, kind);
    std::string out = "%";
    if (conversion == 0)
        return out.append(original);
    valueTaken = true;
    AppendFlags(out, field.flags);
    if (field.width >= 0)
        out += std::to_string(field.width);
    if (field.precision >= 0)
        out.append(1, '.').append(std::to_string(field.precision));
    out += detail::LengthTextFor(kind, conversion);
    out += conversion;
    return out;
}

} // namespace

FormatStringAnalysis::FormatStringAnalysis(char const* format) {
    Analyze(format);
}

FormatStringAnalysis::FormatStringAnalysis(String const& format) {
    Analyze(format.GetBufferReadPtr());
}

void FormatStringAnalysis::Analyze(char const* format) {
    // Copied first: `format` may be this analysis's own text.
    std::string const text(format != nullptr ? format : "");
    m_format.Assign(text.c_str());
    m_fields.clear();
    bool const multiByte = String::IsMultiByteSupportEnabled();
    char const* const start = text.c_str();
    for (char const* p = start; *p != '\0';) {
        if (*p != '%') {
            p = multiByte ? mbcs::Inc(p) : p + 1;
            continue;
        }
        Field field;
        int const numBytes = detail::ParseField(p, field);
        field.offset = int(p - start);
        if (field.conversion != '%')
            m_fields.push_back(field);
        p += numBytes;
    }
}

FormatStringAnalysis::Field const* FormatStringAnalysis::GetField(int index) const {
    if (index < 0 || index >= GetNumFields())
        return nullptr;
    return &m_fields[size_t(index)];
}

int FormatStringAnalysis::GetNumArguments() const {
    int count = 0;
    for (Field const& field : m_fields) {
        if (field.conversion == 0)
            continue;
        count += 1 + (field.width == kFromArgument) + (field.precision == kFromArgument);
    }
    return count;
}

bool FormatStringAnalysis::IsValid() const {
    for (Field const& field : m_fields)
        if (field.conversion == 0)
            return false;
    return true;
}

long FormatStringAnalysis::FixupFields(long argumentKind) {
    std::string const text(GetFormat());
    std::string fixed;
    long changed = 0;
    bool valueTaken = false;
    size_t position = 0;
    for (Field const& field : m_fields) {
        fixed.append(text, position, size_t(field.offset) - position);
        std::string_view const original(text.c_str() + field.offset, size_t(field.numBytes));
        std::string const fitted = FitField(field, original, argumentKind, valueTaken);
        changed += fitted != original;
        fixed += fitted;
        position = size_t(field.offset + field.numBytes);
    }
    fixed.append(text, position);
    Analyze(fixed.c_str());
    return changed;
}

} // namespace tekit
