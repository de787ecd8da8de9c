// The fields of a printf-style format, and the repair of formats that do not fit an argument.
//
// Formats reach the library from callers and from message files, so they cannot be trusted to
// match the value they are given. The typed String::Format and String::Append forms analyse
// the caller's format, make it fit the one value they pass (FixupFields), and only then format:
// a wrong conversion, a stray %n or a second field never reads an argument that is not there.
//
//   FormatStringAnalysis analysis("%5s items, %n%d left");
//   analysis.GetNumFields();                         // 3
//   analysis.FixupFields(FormatStringAnalysis::kArgInt32);
//   analysis.GetFormat();                            // "%5d items, %%n%%d left"
//
// A field runs from its '%' through its conversion character:
//   % [flags -+ #0'] [width: digits or *] [. precision: digits or *] [length] conversion
// with the length modifiers hh h l ll q L j z t w I I32 I64 and the conversions
// d i u o x X c C s S p n f F e E g G a A. "%%" (and a field ending in '%') is literal text, not
// a field. A '%' that does not start a well-formed field is a malformed field (conversion 0),
// shown as literal text by the library's formatting.
#pragma once

#include "tekit/Export.h"
#include "tekit/strings/DynamicString.h"

#include <vector>

namespace tekit {

class TEKIT_API FormatStringAnalysis {
public:
    /// Flag bits of a field.
    enum FieldFlags : unsigned {
        kFlagLeftJustify = 1, ///< '-'
        kFlagPlusSign = 2,    ///< '+'
        kFlagSpaceSign = 4,   ///< ' '
        kFlagAlternate = 8,   ///< '#'
        kFlagZeroPad = 16,    ///< '0'
        kFlagGrouping = 32,   ///< '\'' (thousands grouping: locale dependent, never applied)
    };

    /// Length modifiers, named after their text.
    enum LengthModifier {
        kLengthNone,
        kLength_hh,
        kLength_h,
        kLength_l,
        kLength_ll, ///< also "q"
        kLength_L,
        kLength_j,
        kLength_z,
        kLength_t,
        kLength_w,   ///< wide character or text (Windows runtime)
        kLength_I,   ///< pointer-sized integer (Windows runtime)
        kLength_I32, ///< 32-bit integer (Windows runtime)
        kLength_I64, ///< 64-bit integer (Windows runtime)
    };

    /// Width or precision not given.
    static constexpr int kNotGiven = -1;
    /// Width or precision taken from an int argument ('*').
    static constexpr int kFromArgument = -2;
    /// Widths and precisions are cut to this, so a format can never ask for gigabytes.
    static constexpr int kMaxWidthOrPrecision = 4096;

    struct Field {
        int offset = 0;   ///< Byte offset of the '%' in the format.
        int numBytes = 0; ///< Bytes from the '%' through the conversion character.
        unsigned flags = 0;
        int width = kNotGiven;
        int precision = kNotGiven;
        LengthModifier length = kLengthNone;
        char conversion = 0; ///< 0 for a malformed field.
    };

    /// The value a format is fitted to by FixupFields.
    enum ArgumentKind : long {
        kArgNone = 0, ///< No value: every field becomes literal text.
        kArgInt8,
        kArgUInt8,
        kArgInt16,
        kArgUInt16,
        kArgInt32,
        kArgUInt32,
        kArgInt64,
        kArgUInt64,
        kArgFloat64,
        kArgText, ///< a narrow `char const*`
    };

    /// Analyses `format` (null: the empty format).
    explicit FormatStringAnalysis(char const* format);
    explicit FormatStringAnalysis(String const& format);

    /// Analyses another format.
    void Analyze(char const* format);

    /// The format text, as fixed by FixupFields.
    char const* GetFormat() const { return m_format.GetBufferReadPtr(); }
    int GetNumFields() const { return static_cast<int>(m_fields.size()); }
    /// The field at `index`, or null when there is none.
    Field const* GetField(int index) const;
    /// The arguments that printf would read for this format ('*' widths and precisions count).
    int GetNumArguments() const;
    /// True when no field is malformed.
    bool IsValid() const;

    /// Rewrites the format so that formatting it with one value of `argumentKind` reads exactly
    /// that value and nothing else; returns the number of fields changed:
    /// - the first field takes the value: a conversion that cannot show it becomes the kind's
    ///   own ('d' signed, 'u' unsigned, 'g' floating, 's' text); the length modifier becomes
    ///   the one the platform's printf needs for the kind (64-bit as in PRId64, so also right
    ///   for MinGW's runtime); '*' widths and precisions and the grouping flag are dropped;
    /// - %n (which writes through a pointer), every later field and every malformed field become
    ///   literal text (their '%' doubled), so they are shown instead of reading an argument.
    /// kArgNone makes every field literal: any text can then be used safely as a format.
    long FixupFields(long argumentKind);

private:
    DynamicString m_format;
    std::vector<Field> m_fields;
};

} // namespace tekit
