// The abstract narrow-text class on which every string of the library is built.
//
// Text is NUL-terminated bytes in the process's ANSI code page; a string never holds an
// embedded NUL. Every operation is written once here against a few virtual storage operations
// (GetBufferReadPtr, GetBufferWritePtr, GetBufferSize, RequestBufferSize), so the same algorithm
// runs on every kind of storage: DynamicString (heap, copy-on-write), StaticString<N> (inline,
// truncating), BufferString (a caller's buffer) and GlobalConstantDynamicString (interned).
//
//   DynamicString name("report.txt", true);
//   if (name.EndsWith(".txt", true))
//       name.TruncateToNChars(name.GetNumChars() - 4, nullptr);
//
// Multibyte mode (EnableMultiByteSupport) is one process-wide switch: when on, indices, lengths,
// limits, truncation points, comparisons and case changes count double-byte characters of the
// lead-byte table (SetMultiByteCodePage) and never split one. It is meant to be set once at
// start-up. A character value is an `unsigned short` so a double-byte character travels as one
// value: lead byte in the high 8 bits, trail byte in the low 8 bits.
//
// Indices are character indices unless a name says "Byte" or "Offset". Out-of-range indices and
// negative counts are clamped to the text; a null `char const*` is the empty text.
#pragma once

#include "tekit/Export.h"
#include "tekit/platform/WinTypes.h"
#include "tekit/strings/DecimalPoint.h"

#include <cstdarg>
#include <cstddef>
#include <cstdint>
#include <vector>

/// Lets the compiler check the arguments of a printf-style member against its format.
#if defined(__MINGW32__)
#define TEKIT_PRINTF_FORMAT(formatIndex, firstArg)                                                 \
    __attribute__((format(gnu_printf, formatIndex, firstArg)))
#elif defined(__GNUC__)
#define TEKIT_PRINTF_FORMAT(formatIndex, firstArg)                                                 \
    __attribute__((format(printf, formatIndex, firstArg)))
#else
#define TEKIT_PRINTF_FORMAT(formatIndex, firstArg)
#endif

namespace tekit {

class CopyOnWriteMemory;
class GlobalConstantCopyOnWriteMemory;
class StringVector;

/// Which ends RemoveSurroundingWhiteSpace trims.
enum TrimOptions { kTrimLeft = 1, kTrimRight = 2, kTrimLeftAndRight = 3 };

class TEKIT_API String {
public:
    // ---- Virtual storage interface, in slot order. -------------------------------------
    virtual ~String();
    /// Write pointer to the character at `charIndex` (0: start of the buffer).
    virtual char* GetPtr(int charIndex);
    /// Ends a write through GetPtr: the cached size is measured again on the next read.
    virtual void ReleasePtr();
#if TEKIT_HAS_OLE
    virtual String& operator+=(_bstr_t const& text);
#endif
    virtual String& operator+=(wchar_t const* text);
    virtual String& operator+=(String const& text);
    virtual String& operator+=(char const* text);
#if TEKIT_HAS_OLE
    virtual void Assign(_bstr_t const& text);
#endif
    virtual void Assign(wchar_t const* text);
    virtual void Assign(String const& text);
    virtual void Assign(char const* text);
    /// Copies at most `numChars` characters of `text` (negative: all). The final flag is
    /// reserved for storage kinds that distinguish an intended truncation; the kinds in this
    /// library ignore it.
    virtual void Assign(char const* text, int numChars, bool reserved);
    /// The same, counted in bytes (never splitting a double-byte character in multibyte mode).
    virtual void AssignUsingNumBytesInsteadOfNumChars(char const* text, int numBytes,
                                                      bool reserved);
    /// Empties the text.
    virtual void Clear();
    /// Gives back memory, where the storage can.
    virtual void ClearMemory();
    virtual bool IsGlobalConstant() const;
    virtual char const* GetBufferReadPtr() const = 0;
    /// Write pointer to the start of the buffer; invalidates the cached size.
    virtual char* GetBufferWritePtr() = 0;
    /// Capacity in bytes.
    virtual int GetBufferSize() const = 0;
    /// The block behind the string, or null when the storage has none.
    virtual CopyOnWriteMemory* GetCopyOnWriteMemory() const;
    /// Asks for at least `numBytes` bytes (terminator included); returns the bytes available,
    /// which may be fewer for storage that cannot grow.
    virtual int RequestBufferSize(int numBytes, bool keepContents, bool exactSize) = 0;
    /// Called by placeholder formatting when `placeholder` is not in the text. The default
    /// reports the warning "Could not find argument to replace in string" (written only when
    /// the diagnostic level is above 0) and appends " COULD NOT FIND <placeholder>TO REPLACE
    /// WITH <argument> ", so the argument and the mistake stay visible in the message.
    virtual void HandleMissingFormatArgument(String const& placeholder, String const& argument);

    // ---- Process-wide switches. --------------------------------------------------------
    static void EnableMultiByteSupport(bool enable);
    static bool IsMultiByteSupportEnabled();
    /// The shared empty block: one process-wide constant "" of buffer size 1.
    static GlobalConstantCopyOnWriteMemory* EmptyStrCOWM();

    // ---- Measures. ----------------------------------------------------------------------
    /// Bytes of text without the terminator (cached).
    int GetNumBytes() const {
        return m_cachedSize > 0 ? m_cachedSize - 1 : MeasureNumBytes();
    }
    /// Characters of text: GetNumBytes() in single-byte mode.
    int GetNumChars() const;
    /// Bytes of text including the terminator.
    int GetSize() const;
    bool IsEmpty() const;
    int CharToByteIndex(int charIndex) const;
    int ByteToCharIndex(int byteIndex) const;
    /// Same as CharToByteIndex / ByteToCharIndex (the names used by older callers).
    int IndexToOffset(int charIndex) const;
    int OffsetToIndex(int byteOffset) const;
    /// The character at `charIndex`, or 0 outside the text.
    unsigned short GetChar(int charIndex) const;
    unsigned short GetFirstChar() const;
    unsigned short GetLastChar() const;
    /// Pointer to the first byte of the last character, or to the terminator when empty.
    char const* GetLastCharPtr() const;
    bool IsPtrToLastChar(unsigned char const* ptr) const;
    /// Replaces the character at `charIndex` by `ch`. In single-byte mode with a single-byte
    /// `ch` this is a plain byte write; otherwise it is MBSetChar, so a double-byte character
    /// is never half overwritten. A `ch` of 0 ends the text there; an index outside the text
    /// does nothing.
    void SetChar(int charIndex, unsigned short ch);
    /// Replaces the character at `charIndex` by `ch`, which may be double-byte (the text grows
    /// or shrinks by a byte when the widths differ).
    void MBSetChar(int charIndex, unsigned short ch);
    /// Inserts `ch` before character `charIndex` (clamped to the text); a `ch` of 0 does
    /// nothing. A value above 0xFF is always written as two bytes, lead byte first.
    void InsertChar(unsigned short ch, int charIndex);
    void AppendChar(unsigned short ch);

    // ---- Comparison. --------------------------------------------------------------------
    /// Negative, 0 or positive. `numChars` negative compares all; `startIndex` skips that many
    /// characters of this string first. Case-insensitive comparison is locale independent.
    long Compare(String const& other, bool ignoreCase = false, int numChars = -1,
                 int startIndex = 0) const;
    long Compare(char const* other, bool ignoreCase = false, int numChars = -1,
                 int startIndex = 0) const;
    bool operator==(String const& other) const {
        return Compare(other) == 0;
    }
    bool operator==(char const* other) const {
        return Compare(other) == 0;
    }
    bool operator!=(String const& other) const {
        return Compare(other) != 0;
    }
    bool operator!=(char const* other) const {
        return Compare(other) != 0;
    }
    bool operator<(String const& other) const {
        return Compare(other) < 0;
    }
    bool operator<(char const* other) const {
        return Compare(other) < 0;
    }
    bool operator<=(String const& other) const {
        return Compare(other) <= 0;
    }
    bool operator<=(char const* other) const {
        return Compare(other) <= 0;
    }
    bool operator>(String const& other) const {
        return Compare(other) > 0;
    }
    bool operator>(char const* other) const {
        return Compare(other) > 0;
    }
    bool operator>=(String const& other) const {
        return Compare(other) >= 0;
    }
    bool operator>=(char const* other) const {
        return Compare(other) >= 0;
    }

    // ---- Search. Results are character indices, -1 when not found. ----------------------
    //
    // In multibyte mode a match always starts on a character boundary, so the trail byte of
    // a double-byte character is never taken for a character of its own. With ignoreCase,
    // only ASCII letters fold ('A'-'Z' / 'a'-'z'), whatever the process's locale; every other
    // byte and every double-byte character must be equal. An empty or null text to find
    // occurs nowhere (FindSubstring gives -1, GetNumOccurrences 0), but every text starts and
    // ends with it (StartsWith / EndsWith give true). A character value of 0 is never found.

    /// The first `ch` at or after `startIndex`.
    int FindChar(unsigned short ch, int startIndex = 0) const;
    /// Searches backwards from `startIndex` (negative or past the end: from the last
    /// character).
    int FindCharReverse(unsigned short ch, int startIndex = -1) const;
    /// The first character at or after `startIndex` that is one of the characters of `set`
    /// (which may hold double-byte characters in multibyte mode).
    int FindCharInSet(char const* set, int startIndex = 0) const;
    bool ContainsCharInSet(char const* set) const;
    int FindSubstring(char const* text, int startIndex = 0, bool ignoreCase = false) const;
    int FindSubstring(String const& text, int startIndex = 0, bool ignoreCase = false) const;
    bool ContainsSubstring(char const* text, bool ignoreCase = false) const;
    /// Non-overlapping occurrences of `text`, counted left to right ("aaaa" holds "aa" twice).
    int GetNumOccurrences(char const* text, bool ignoreCase = false) const;
    int GetNumOccurrences(unsigned short ch) const;
    bool StartsWith(char const* text, bool ignoreCase = false) const;
    bool EndsWith(char const* text, bool ignoreCase = false) const;
    /// True when a character is below 0x20 or is 0x7F (the "C" locale's control characters).
    bool ContainsCntrlChar() const;

    // ---- Sub-strings. -------------------------------------------------------------------
    //
    // Start indices are clamped to the text (negative: 0, past the end: the end). A negative
    // count means "to the end of the text"; a count past the end stops there. Storage that
    // cannot grow keeps the start of a result that does not fit, never half a double-byte
    // character. A text argument may point into this string itself. Nothing is written (and
    // a shared block is not copied) when an operation changes nothing.

    /// Copies `numChars` characters from `start` into `out` (which may be this string).
    void GetSubstring(int start, int numChars, String& out) const;
    void InsertSubstring(char const* text, int charIndex);
    void InsertSubstring(String const& text, int charIndex);
    void RemoveSubstring(int start, int numChars);
    /// Replaces `numChars` characters at `start` by `replacement`.
    void ReplaceSubstring(int start, int numChars, char const* replacement);
    /// Replaces the first occurrence of `find` by `replacement`; returns whether one was
    /// found. With `wholeWordOnly` an occurrence counts only when neither the character
    /// before it nor the one after it is a word character (IsCharWholeWordChar: ASCII
    /// letters, digits, underscore and every character above 127, double-byte ones included).
    bool ReplaceSubstring(String const& find, String const& replacement, bool ignoreCase = false,
                          bool wholeWordOnly = false);
    bool ReplaceSubstring(char const* find, char const* replacement, bool ignoreCase = false,
                          bool wholeWordOnly = false);
    /// Replaces every non-overlapping occurrence, left to right, in one pass (a replacement
    /// is never searched again); returns the count. Whole words as ReplaceSubstring.
    int ReplaceAllSubstrings(char const* find, char const* replacement, bool ignoreCase = false,
                             bool wholeWordOnly = false);
    /// Replaces the whole text by `replacement` when it equals `text`; returns whether it did.
    bool ReplaceIfEqual(char const* text, char const* replacement, bool ignoreCase = false);
    /// Cuts the text to at most `numChars` characters (negative: 0). When it was cut and
    /// `suffix` is given, the suffix replaces the last characters so that the result still
    /// has at most `numChars`: ("abcdef", 5, "...") gives "ab...". A suffix longer than
    /// `numChars` is left out and the text is only cut. A text that is not cut gets no suffix.
    void TruncateToNChars(int numChars, char const* suffix = nullptr);
    /// Removes leading / trailing characters of `set` (null: white space, which is blank,
    /// tab, line feed, carriage return, vertical tab and form feed).
    void TrimLeft(char const* set = nullptr);
    void TrimRight(char const* set = nullptr);
    void RemoveSurroundingWhiteSpace(TrimOptions options = kTrimLeftAndRight);
    /// Index of the first (non-)white-space character at or after `charIndex`, or the length.
    int SkipWhiteSpace(int charIndex = 0) const;
    int SkipNonWhiteSpace(int charIndex = 0) const;

    // ---- Case and shape. ---------------------------------------------------------------
    //
    // Case changes touch ASCII letters only, whatever the process's locale; bytes above 127
    // and double-byte characters are left alone. Ranges follow the sub-string rules above.
    void SetUppercase();
    void SetUppercase(int start, int numChars);
    void SetLowercase();
    void SetLowercase(int start, int numChars);
    /// Reverses the characters (double-byte characters stay whole).
    void Reverse();
    /// Makes the text `count` copies of itself (0 or less: empty). Storage that cannot grow
    /// keeps what fits; a result beyond 32 bits raises TE_INT32_OVERFLOW.
    void Repeat(int count);

    // ---- Lines. --------------------------------------------------------------------------
    //
    // A line ends at "\n", "\r\n" or a lone "\r". A final line ending closes the last line
    // and opens no new one, as in a text file: "" has no lines, "a" and "a\n" one, "a\n\n"
    // two (the second empty). Line indices are 0-based.
    int GetNumLines() const;
    /// Line `lineIndex` without its ending into `out` (which may be this string); empty when
    /// there is no such line.
    void GetNthLine(int lineIndex, String& out) const;
    /// Character index where line `lineIndex` starts, or -1 when there is no such line.
    int CharOffsetOfLine(int lineIndex) const;
    /// Removes line `lineIndex` together with its own ending; no such line: nothing.
    void RemoveNthLine(int lineIndex);
    /// Keeps the first `numLines` lines (0 or less: none). When lines are cut off, the ending
    /// of the last kept line goes with them, so the text then ends without a line ending.
    void TruncateToNLines(int numLines);
    /// Makes every line ending "\r\n" (a lone "\n" or "\r" gains its partner).
    void ConvertToCRLF();
    /// Makes every "\r\n" a "\n"; a lone "\r" stays.
    void ConvertFromCRLF();
    /// Where character `charIndex` (clamped to the text; the length maps to the new length)
    /// would be after ConvertToCRLF / ConvertFromCRLF. A lone "\n" maps to its new "\r";
    /// both characters of a "\r\n" map to the "\n" that remains of it.
    int GetIndexIfConvertToCRLF(int charIndex) const;
    int GetIndexIfConvertFromCRLF(int charIndex) const;

    // ---- Appending with a separator. ----------------------------------------------------
    //
    // A null separator is the empty text; `item` may be this string itself.

    /// Appends `separator` (when this text is not empty) and then `item`: building a list one
    /// item at a time, empty items included.
    void Append(String const& item, char const* separator);
    /// Joins `item` to the text with one `separator` between them: the separator is added
    /// only when the text is not empty, does not already end with it, and `item` does not
    /// start with it. ("C:\dir\" and "file" with "\" give "C:\dir\file".)
    void AppendUsingSeparator(String const& item, char const* separator);

    // ---- Formatting and numbers. ------------------------------------------------------
    //
    // Messages are templates with numbered placeholders %1, %2, ...; each Format call fills
    // the first occurrence of one, found as plain text (so %1 also matches the start of %10):
    //
    //   DynamicString msg("Could not find file '%1'.", true);
    //   msg.Format(path, 1);                       // Could not find file 'C:\a.txt'.
    //
    // The typed forms first write the value with a printf format; a null format means the
    // default shown. The format is fitted to the value's type (FormatStringAnalysis::
    // FixupFields), so a wrong one shows odd text but never reads a missing argument. Numbers
    // are written without the process's C locale: the decimal point is the option's.

    /// Replaces the first "%<number>" by `argument`; when there is none,
    /// HandleMissingFormatArgument is called.
    void Format(String const& argument, long number);
    void Format(char const* argument, long number);
    void Format(int value, long number, char const* printfFormat = "%d");
    void Format(long value, long number, char const* printfFormat = "%ld");
    void Format(short value, long number, char const* printfFormat = "%hd");
    /// A char is shown as the character; pass "%d" for its code.
    void Format(char value, long number, char const* printfFormat = "%c");
    void Format(unsigned char value, long number, char const* printfFormat = "%u");
    void Format(unsigned short value, long number, char const* printfFormat = "%hu");
    void Format(unsigned int value, long number, char const* printfFormat = "%u");
    void Format(unsigned long value, long number, char const* printfFormat = "%lu");
    void Format(long long value, long number, char const* printfFormat = "%lld");
    void Format(unsigned long long value, long number, char const* printfFormat = "%llu");
    /// A null format writes the shortest text that reads back as the same double ("0.1",
    /// "1e+300", "-0", "inf", "nan").
    void Format(double value, long number, kDecimalPointLocalizationOptions options,
                char const* printfFormat = nullptr);
    /// A pointer-sized value; a null format writes "0x" and upper-case hex digits, 2 per byte
    /// of a pointer ("0x0000BEEF" on 32-bit).
    void FormatPtr(std::intptr_t value, long number, char const* printfFormat = nullptr);
    void FormatPtr(std::uintptr_t value, long number, char const* printfFormat = nullptr);

    /// Appends a number written with `printfFormat` (null: the default shown). The int forms
    /// keep a plain literal such as Append(5) from being ambiguous.
    void Append(int value, char const* printfFormat = "%d");
    void Append(unsigned int value, char const* printfFormat = "%u");
    void Append(long value, char const* printfFormat = "%ld");
    void Append(unsigned long value, char const* printfFormat = "%lu");
    void Append(long long value, char const* printfFormat = "%lld");
    void Append(unsigned long long value, char const* printfFormat = "%llu");
    void Append(double value, kDecimalPointLocalizationOptions options,
                char const* printfFormat = nullptr);
    void Append(double value, kDecimalPointLocalizationOptions options, String const& printfFormat);
#if TEKIT_HAS_OLE
    /// Appends the value of a VARIANT: numbers as above, VT_BOOL as "True"/"False", text as
    /// is, VT_EMPTY and VT_NULL as nothing; other types raise TE_UNEXPECTED_TYPE.
    void Append(VARIANT const& value, kDecimalPointLocalizationOptions options);
#endif
    /// Appends a size in decimal.
    void AppendSize(std::size_t size);
    /// Appends a pointer as FormatPtr's default does.
    void AppendPtr(void const* ptr);

    /// Replaces the text by printf-style formatting: the C conversions with their flags,
    /// widths, precisions and length modifiers (hh h l ll q L j z t I I32 I64, %ls for wide
    /// text). Unlike the C runtime it uses a period whatever the process's locale, writes
    /// nothing for %n, takes a null text as empty and shows a malformed field as written.
    void SPrintf(char const* format, ...) TEKIT_PRINTF_FORMAT(2, 3);
    /// The same into `target`.
    static void SPrintf(String& target, char const* format, ...) TEKIT_PRINTF_FORMAT(2, 3);
    void VSPrintf(char const* format, std::va_list args);

    // Reading numbers. A number may follow white space, starts with an optional sign and
    // digits, and is read from character `startIndex`. Without `endIndex` only white space may
    // follow it; with it, reading stops after the number and `endIndex` receives the index of
    // the first character after it. Text that holds no number raises TE_UNRECOGNIZED_VALUE;
    // a number that does not fit raises TE_INT32_OVERFLOW, TE_UINT32_OVERFLOW,
    // TE_INT64_OVERFLOW or TE_UINT64_OVERFLOW (the size types: those of their width); both
    // messages quote the text. Integers are decimal ("-0" is 0 for the unsigned types, "-1"
    // overflows them).
    std::int32_t CvtToInt32(int startIndex = 0) const;
    std::int32_t CvtToInt32(int startIndex, int& endIndex) const;
    std::uint32_t CvtToUInt32(int startIndex = 0) const;
    std::uint32_t CvtToUInt32(int startIndex, int& endIndex) const;
    std::int64_t CvtToInt64(int startIndex = 0) const;
    std::int64_t CvtToInt64(int startIndex, int& endIndex) const;
    std::uint64_t CvtToUInt64(int startIndex = 0) const;
    std::uint64_t CvtToUInt64(int startIndex, int& endIndex) const;
    std::size_t CvtToSizeT(int startIndex = 0) const;
    std::size_t CvtToSizeT(int startIndex, int& endIndex) const;
    std::ptrdiff_t CvtToSignedSizeT(int startIndex = 0) const;
    std::ptrdiff_t CvtToSignedSizeT(int startIndex, int& endIndex) const;
    /// Reads decimal ("1.5", "-2e-3", ".5", "5."), hexadecimal ("0x1.8p+1"), "inf",
    /// "infinity" and "nan" (any case), with the option's decimal point. A magnitude too large
    /// for a double raises TE_INVALID_OR_OUT_OF_RANGE; one too small reads as zero.
    double
    CvtToFloat64(int startIndex = 0,
                 kDecimalPointLocalizationOptions options = kDecimalPoint_AlwaysPeriod) const;
    double
    CvtToFloat64(int startIndex, int& endIndex,
                 kDecimalPointLocalizationOptions options = kDecimalPoint_AlwaysPeriod) const;
    /// Integers in `radix` 2 to 36 (letters of either case); radix 16 also takes a "0x"
    /// prefix; radix 0 picks it from the text as C does ("0x": 16, a leading "0": 8, else 10).
    /// Another radix raises TE_INVALID_OR_OUT_OF_RANGE.
    std::int32_t CvtToInt32WithRadix(int radix, int startIndex = 0) const;
    std::int32_t CvtToInt32WithRadix(int radix, int startIndex, int& endIndex) const;
    std::uint32_t CvtToUInt32WithRadix(int radix, int startIndex = 0) const;
    std::uint32_t CvtToUInt32WithRadix(int radix, int startIndex, int& endIndex) const;

    // Decimal point.
    /// '.' or the system's decimal separator.
    static char GetLocalizedDecimalPoint(kDecimalPointLocalizationOptions options);
    /// Number text written with '.' gets the option's decimal point (every '.' is replaced).
    void Localize(kDecimalPointLocalizationOptions options);
    /// The reverse: every decimal separator of the option becomes '.'.
    void Delocalize(kDecimalPointLocalizationOptions options);
    /// On number text: removes the zeros that end the fraction, and the decimal point when
    /// no fraction digit is left; an exponent stays ("1.2500e+03" gives "1.25e+03", "2.000"
    /// gives "2"). Text without the option's decimal point is left alone.
    void TrimTrailingZeros(kDecimalPointLocalizationOptions options = kDecimalPoint_AlwaysPeriod);
    /// Writes `expression` into `result` with the decimal points of its numeric literals
    /// changed from '.' to the option's separator (`localize` true) or back. Quoted text and
    /// names (x.y, Step2.5) are left alone. A function registered with
    /// RegisterLocalizeExprFunc replaces this built-in scan. `result` may be `expression`.
    static void LocalizeExpression(String const& expression,
                                   kDecimalPointLocalizationOptions options, bool localize,
                                   String& result);
    /// Registers the implementation of LocalizeExpression (null: the built-in one) and
    /// returns the previous one. Meant to be called at start-up.
    static LocalizeExprFunc RegisterLocalizeExprFunc(LocalizeExprFunc func);

protected:
    /// The registered LocalizeExpression implementation, or null for the built-in one.
    static LocalizeExprFunc s_localizeExprFuncPtr;

public:
    // ---- Escaping, quoting, tokens and patterns. ------------------------------------------
    //
    // Special characters (expression literals). EscapeSpecialChars writes, character by
    // character (double-byte characters are never touched):
    //   tab -> \t, line feed -> \n, double quote -> \"   (only when keepLayoutChars is false)
    //   carriage return -> \r, backslash -> \\, other control characters (below 0x20 and 0x7F)
    //   -> \x and two lower-case hex digits                 (always)
    // UnescapeSpecialChars(keepLayoutChars) is its exact inverse for the same setting. It reads
    // \\, \r, \' and \xHH (two hex digits of either case, not 00) always, and \t, \n and \"
    // only when keepLayoutChars is false: the escaper never writes those three in the other
    // mode, so a text with layout kept may hold them literally. Anything else stays as written:
    // a backslash before any other character keeps both (so "C:\temp" survives), a lone
    // trailing backslash stays, and \x without two hex digits stays "\x...".
    //
    //   DynamicString s("a\tb\\c", true);
    //   s.EscapeSpecialChars(false);    // a\tb\\c  (tab now two characters)
    //   s.UnescapeSpecialChars(false);  // back to the original
    void EscapeSpecialChars(bool keepLayoutChars = false);
    void UnescapeSpecialChars(bool keepLayoutChars = false);
    /// Reads one character of `text` at byte offset `*index`, decoding an escape by the rules
    /// above, stores it in `*character` (0 at the end) and advances `*index` past what it read.
    /// Returns true when an escape sequence was decoded, so a caller can tell an escaped quote
    /// from a closing one.
    static bool UnescapeNextChar(char const* text, int* index, unsigned short* character,
                                 bool keepLayoutChars = false);
    /// Finds the next double quote at or after byte offset `*index` that no backslash escapes.
    /// On success `*index` is its byte offset; otherwise `*index` is the offset of the text's
    /// terminator. `*passedEscape` (may be null) tells whether an escape lay on the way.
    static bool FindNextUnescapedQuoteChar(char const* text, int* index, bool* passedEscape);

    // XML and HTML. EscapeXmlChars: < > & as &lt; &gt; &amp;, and ' as &apos; on request;
    // never the double quote. EscapeHtmlChars: < > & " as &lt; &gt; &amp; &quot;. Both return
    // whether anything was replaced. UnEscapeXmlChars reads the five named entities (&lt;
    // &gt; &amp; &apos; &quot;, case respected) and the numeric references &#NN; and &#xHH; of
    // ASCII characters (1 to 127, the same in every ANSI code page); anything else, such as
    // "&nbsp;", a reference above 127 or a lone "&", stays as written. It inverts both
    // escapers.
    static bool EscapeXmlChars(String& text, bool escapeApostrophe);
    static bool UnEscapeXmlChars(String& text);
    static bool EscapeHtmlChars(String& text);
    /// One pass replacing each character of `characters` by the text at the same position of
    /// `replacements`; returns whether anything was replaced.
    static bool EscapeCharsHelper(String& text, char const* characters, char const** replacements);
    /// XML 1.0 cannot carry the control characters below 0x20 other than tab, line feed and
    /// carriage return. With `forAttribute`, tab, line feed and carriage return count as well:
    /// a reader's attribute-value normalisation would turn them into blanks.
    bool ContainsIllegalXMLChar(bool forAttribute = false) const;
    /// Makes `text` element content that a reader gets back exactly. When it holds characters
    /// illegal in XML 1.0, it is first escaped with EscapeSpecialChars(true) (they become
    /// \xHH, and backslash and carriage return \\ and \r) and `escapedSpecialChars` is set, so
    /// the writer can record that the reader must call UnescapeSpecialChars(true) after
    /// UnEscapeXmlChars. Then the XML characters are escaped, and a remaining carriage return
    /// is written &#13; so that end-of-line normalisation keeps it. Returns whether it changed.
    static bool MakeValidXMLValue(String& text, bool& escapedSpecialChars, bool escapeApostrophe);
    /// Makes `text` an attribute value in the given quotes: & < > escaped, the delimiting quote
    /// as &apos; (singleQuoted) or &quot;, tab, line feed and carriage return as &#9; &#10;
    /// &#13;, and the illegal control characters as &#xHH;, which strict XML 1.0 parsers
    /// reject but UnEscapeXmlChars (and XML 1.1) reads back. Returns whether it changed.
    static bool MakeValidXMLAttribute(String& text, bool singleQuoted);
    /// JSON string content: double quote and backslash get a backslash, every character below
    /// 0x20 becomes \u and four upper-case hex digits ("\u000A", no short forms); everything
    /// else, double-byte characters and bytes above 0x7F included, is left for the caller's
    /// conversion to UTF-8.
    void EscapeSpecialCharsForJSON();

    // Quoting. A quoted text is a double quote, text with \" and \\ for quote and backslash,
    // and a closing double quote.
    void Quote();
    /// Escapes double quotes and backslashes only (a backslash too, or a text ending in one
    /// would escape its own closing quote). UnescapeSpecialChars(false) inverts it.
    void EscapeQuotes();
    void EscapeQuotesAndQuote();
    /// EscapeSpecialChars(false), then Quote: an expression string literal.
    void EscapeAndQuote();
    /// True when the text starts with a double quote whose first unescaped partner is the
    /// last character: `"a"` is, `"a" + "b"` and `"a\"` are not.
    bool IsSurroundedByQuotes() const;
    /// Removes the surrounding quotes when IsSurroundedByQuotes; returns whether it did.
    bool RemoveSurroundingQuotes();
    /// RemoveSurroundingQuotes and then UnescapeSpecialChars(false); a text that is not
    /// surrounded by quotes is left alone (returns false).
    bool RemoveQuotesAndUnescape();

    // Tokens. Tokens are separated by white space (blank, tab, line feed, carriage return,
    // vertical tab, form feed). A double quote opens a quoted run that lasts to the next
    // unescaped double quote (or the end of the text) and may hold white space, so
    // `set "a b" x"y z"` has the three tokens `set`, `"a b"` and `x"y z"`. Tokens are given
    // as written, quotes and escapes included.
    /// Character index of the first token at or after `startIndex`, and its length in
    /// `tokenLength`; -1 (length 0) when there is none. The next token starts the search at
    /// index + length.
    int GetNextToken(int startIndex, int& tokenLength) const;
    /// Token `tokenIndex` (0-based) into `token`; false, and `token` emptied, when missing.
    bool GetNthToken(int tokenIndex, String& token) const;

    // Location strings name a place in a data tree: parts joined by "." or given as an index
    // in brackets, for example `Main["Step 1"].Result` or `Locals.Array[3]`:
    //   location := [name] { "." name | "[" index "]" }
    //   name     := one or more characters other than "." and "["
    //   index    := quoted | one or more characters other than "]"
    //   quoted   := a double-quoted text with backslash escapes, directly followed by "]"
    // An empty name or index, a "[" without its "]", a quoted index without its closing
    // quote, or text after "]" that is not "." or "[" raises TE_BAD_PROP_OR_VAR_NAME.
    /// Takes the first part off the front of `location` into `token` (`location` keeps the
    /// rest); false when `location` is empty. With `removeQuotes` a quoted index is given
    /// unquoted and unescaped (`Step 1`), otherwise as written (`"Step 1"`).
    static bool GetNextLocationStringToken(String& location, String& token, bool removeQuotes);
    /// All parts of `location` into `parts` (replacing its contents); returns their count.
    static int ParseLocationString(String const& location, StringVector& parts, bool removeQuotes);

    /// Word characters: ASCII letters, digits, underscore, and every character above 127
    /// (double-byte characters and the code page's own letters), so no word of any language
    /// is cut in two.
    static bool IsCharWholeWordChar(unsigned short ch);
    /// True when the `numBytes` bytes at `ptr` inside `text` are neither preceded nor
    /// followed by a word character.
    static bool IsPtrToWholeWord(char const* text, char const* ptr, int numBytes);
    /// The last `ch` at or before `startIndex` (negative: the end) that lies outside the
    /// double-quoted string constants of the text (escapes respected), or -1.
    int FindCharReverseIgnoringEmbeddedStringConstants(unsigned short ch,
                                                       int startIndex = -1) const;

    // Patterns (wildcards, as in file names):
    //   *       any run of characters, also none
    //   ?       any one character (a double-byte character is one)
    //   [set]   one character of the set: single characters and ranges a-z; "!" or "^" first
    //           negates it; "]" first and "-" first or last are ordinary characters
    //   \c      the character c itself (\* is a star, \\ a backslash, also inside a set)
    // Any other character matches itself; with ignoreCase, ASCII letters match either case.
    // A "[" without its "]" and a trailing lone "\" match themselves. Each *, ? and [set] is
    // a wildcard, numbered from 1; the text it matched can be asked for. A search finds the
    // leftmost match; there each * takes as many characters as it can while the rest still
    // matches (greedy), or as few as it can with shortestMatch. An empty pattern finds
    // nothing (and matches only the empty text). Examples: "Step ?.seq" matches
    // "Step 1.seq"; "*.[ch]" matches "main.c"; FindPattern("a*b") in "xa1b2b" is at 1,
    // length 5 (3 with shortestMatch).
    /// Character index of the first match at or after `startIndex`, or -1; its length in
    /// characters in `*matchLength` (may be null).
    int FindPattern(char const* pattern, int startIndex = 0, bool ignoreCase = false,
                    int* matchLength = nullptr) const;
    /// FindPattern with the match length choice and, in `wildcardMatches` (may be null),
    /// the text each wildcard matched.
    int FindPatternEx(char const* pattern, int startIndex, bool ignoreCase, bool shortestMatch,
                      int* matchLength, StringVector* wildcardMatches) const;
    /// True when the whole text matches `pattern`; `wildcardMatches` then receives what each
    /// wildcard matched: "Step 12.seq" against "Step *.seq" gives ["12"].
    bool MatchPattern(String const& pattern, StringVector& wildcardMatches,
                      bool ignoreCase = false) const;
    /// Replaces every non-overlapping, non-empty match, left to right. In `replacement`, \1 to
    /// \9 insert what that wildcard matched (empty when there is no such wildcard), \0 the
    /// whole match and \\ a backslash; any other character, other backslashes included, stands
    /// for itself. Returns the number of replacements.
    int ReplaceAllPatterns(char const* pattern, char const* replacement, bool ignoreCase = false,
                           bool shortestMatch = false);
    /// Character indices of the non-overlapping occurrences of `text`, left to right, into
    /// `positions` (replacing its contents); returns their count. An empty `text` occurs
    /// nowhere.
    int FindSubStringPositions(char const* text, std::vector<int>& positions) const;
    int FindSubStringPositionsNoCase(char const* text, std::vector<int>& positions) const;

    // Splitting.
    /// Cuts the text at every character of `separators` (null or empty: white space) into
    /// `items`, replacing its contents. An empty text gives no items; otherwise n separators
    /// give n + 1 items, empty ones included unless `skipEmptyItems`. With `trimWhiteSpace`
    /// each item loses its surrounding white space first (so an item of blanks is empty).
    void Split(StringVector& items, char const* separators, bool skipEmptyItems = false,
               bool trimWhiteSpace = false) const;
    /// Cuts the text at every occurrence of any of the separator texts (the longest one when
    /// several start at the same character); empty items are kept, empty separators ignored,
    /// and an empty text gives no items.
    void Split(StringVector& items, StringVector const& separators) const;

    // ---- Wide, UTF-8 and COM text. ------------------------------------------------------
#if TEKIT_HAS_OLE
    /// A new BSTR holding the text; the caller frees it with SysFreeString.
    BSTR AllocSysString() const;
    operator _bstr_t() const;
#endif
    /// Converts into `buffer` of `size` wide characters, truncated to fit, always terminated;
    /// returns the characters written without the terminator.
    int ConvertToUnicodeInBufferTruncateIfNeeded(wchar_t* buffer, int size) const;
    /// The text as UTF-8: in `buffer` when it fits in `size` bytes, otherwise in a new buffer
    /// that the caller gives back with FreeUTF8. `*length` receives the bytes without the
    /// terminator.
    char* AllocUTF8(char* buffer, long size, long* length) const;
    static void FreeUTF8(char* utf8);
    /// Assigns UTF-8 text of `numBytes` bytes (negative: to its terminator).
    void AssignFromUTF8(char const* utf8, int numBytes);

    // ---- Obscuring. --------------------------------------------------------------------
    /// A reversible transform that hides text from casual reading; Unscramble undoes it. It
    /// is no encryption: each byte b (1-255) at byte position i becomes
    /// ((b - 1 + k(i)) mod 255) + 1 with the key k(i) = (31 * i + 7) mod 255, so the result
    /// has the same length and never contains a NUL.
    void Scramble();
    void Unscramble();

    // ---- Byte-level helpers shared by the family. ----------------------------------------
    /// Copies `src` into `dest` of `destSize` bytes, truncated, terminated; `*cachedSize`
    /// (when given) receives the bytes written plus 1, or 0 when `destSize` is below 1.
    static void StringCopyMax(char* dest, char const* src, int destSize, int* cachedSize);
    /// The same for at most `numBytes` bytes of `src`; source and destination may overlap.
    static void StringCopyMaxN(char* dest, char const* src, int numBytes, int destSize,
                               int* cachedSize);
    /// The multibyte forms never split a double-byte character.
    static void MBCSStringCopyMax(char* dest, char const* src, int destSize, int* cachedSize);
    static void MBCSStringCopyMaxN(char* dest, char const* src, int numBytes, int destSize,
                                   int* cachedSize);
    /// MBCSStringCopyMax when multibyte mode is on, StringCopyMax otherwise.
    static void MBSafeStringCopyMax(char* dest, char const* src, int destSize, int* cachedSize);
    /// Bytes of the longest prefix of `text` of at most `numChars` characters (negative: all)
    /// that fits in `maxBytes` without splitting a double-byte character.
    static int SizeOfMBCSSubString(char const* text, int numChars, int maxBytes);
    /// Inserts `text` at byte `offset` of `dest` (`destSize` bytes), cutting what does not fit.
    static void StringInsert(char* dest, char const* text, int offset, int destSize);
    static void MBCSStringInsert(char* dest, char const* text, int offset, int destSize);
    /// Removes `numBytes` bytes at byte `offset` of `dest`.
    static void StringRemove(char* dest, int offset, int numBytes);
    /// Removes `numChars` characters at character `charIndex` of `dest`.
    static void MBCSStringRemove(char* dest, int charIndex, int numChars);
    /// Case change of at most `numChars` characters, leaving double-byte characters alone.
    static void MBCSUpperN(char* text, int numChars);
    static void MBCSLowerN(char* text, int numChars);
    /// Character index of `ptr` within `text`.
    static int MBCSPtrCharacterIndex(char const* text, char const* ptr);

    /// Raises the string family's assertion for a broken invariant.
    [[noreturn]] static void ThrowStringAssertion(char const* condition, char const* function);

    /// Marks the cached size unknown.
    void InvalSizeCache() {
        m_cachedSize = -1;
    }

protected:
    String() = default;
    String(String const&) = default;
    String& operator=(String const&) = default;

    /// Sets the cached size (bytes including the terminator, or -1).
    void SetCachedSize(int size) const {
        m_cachedSize = size;
    }
    int GetCachedSize() const {
        return m_cachedSize;
    }
    /// Appends `numBytes` bytes of `text` (negative: to its terminator; it may point into this
    /// string). Storage that cannot grow keeps what fits, never half a double-byte character.
    void AppendBytes(char const* text, int numBytes);
    /// Replaces `numBytes` bytes at byte `byteOffset` by `textBytes` bytes of `text` (which may
    /// point into this string); offsets and counts are clamped to the text. Storage that cannot
    /// grow keeps the start of the result.
    void ReplaceBytes(int byteOffset, int numBytes, char const* text, int textBytes);
    /// The cached size of another string of the family, as it stands (-1 when unknown).
    static int CachedSizeOf(String const& s) {
        return s.m_cachedSize;
    }

    static bool m_isMultiByteSupportEnabled;

private:
    /// Measures the text within the buffer and caches its size.
    int MeasureNumBytes() const;

    mutable int m_cachedSize = 1;
};

/// Orderings for sorted containers of string pointers.
struct TEKIT_API StringPtrLessThan {
    bool operator()(String const* a, String const* b) const;
};
struct TEKIT_API StringPtrLessThanNoCase {
    bool operator()(String const* a, String const* b) const;
};

} // namespace tekit
