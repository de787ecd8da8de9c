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

namespace tekit {

class CopyOnWriteMemory;
class GlobalConstantCopyOnWriteMemory;

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
    /// Called by placeholder formatting when `placeholder` is not in the text.
    virtual void HandleMissingFormatArgument(String const& placeholder, String const& argument);

    // ---- Process-wide switches. --------------------------------------------------------
    static void EnableMultiByteSupport(bool enable);
    static bool IsMultiByteSupportEnabled();
    /// The shared empty block: one process-wide constant "" of buffer size 1.
    static GlobalConstantCopyOnWriteMemory* EmptyStrCOWM();

    // ---- Measures. ----------------------------------------------------------------------
    /// Bytes of text without the terminator (cached).
    int GetNumBytes() const;
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
    /// Replaces the character at `charIndex` by a single-byte `ch` (byte arithmetic only).
    void SetChar(int charIndex, unsigned short ch);
    /// Replaces the character at `charIndex` by `ch`, which may be double-byte.
    void MBSetChar(int charIndex, unsigned short ch);
    void InsertChar(unsigned short ch, int charIndex);
    void AppendChar(unsigned short ch);

    // ---- Comparison. --------------------------------------------------------------------
    /// Negative, 0 or positive. `numChars` negative compares all; `startIndex` skips that many
    /// characters of this string first. Case-insensitive comparison is locale independent.
    long Compare(String const& other, bool ignoreCase = false, int numChars = -1,
                 int startIndex = 0) const;
    long Compare(char const* other, bool ignoreCase = false, int numChars = -1,
                 int startIndex = 0) const;
    bool operator==(String const& other) const { return Compare(other) == 0; }
    bool operator==(char const* other) const { return Compare(other) == 0; }
    bool operator!=(String const& other) const { return Compare(other) != 0; }
    bool operator!=(char const* other) const { return Compare(other) != 0; }
    bool operator<(String const& other) const { return Compare(other) < 0; }
    bool operator<(char const* other) const { return Compare(other) < 0; }
    bool operator<=(String const& other) const { return Compare(other) <= 0; }
    bool operator<=(char const* other) const { return Compare(other) <= 0; }
    bool operator>(String const& other) const { return Compare(other) > 0; }
    bool operator>(char const* other) const { return Compare(other) > 0; }
    bool operator>=(String const& other) const { return Compare(other) >= 0; }
    bool operator>=(char const* other) const { return Compare(other) >= 0; }

    // ---- Search. Results are character indices, -1 when not found. ----------------------
    int FindChar(unsigned short ch, int startIndex = 0) const;
    /// Searches backwards from `startIndex` (negative: from the last character).
    int FindCharReverse(unsigned short ch, int startIndex = -1) const;
    int FindCharInSet(char const* set, int startIndex = 0) const;
    bool ContainsCharInSet(char const* set) const;
    int FindSubstring(char const* text, int startIndex = 0, bool ignoreCase = false) const;
    int FindSubstring(String const& text, int startIndex = 0, bool ignoreCase = false) const;
    bool ContainsSubstring(char const* text, bool ignoreCase = false) const;
    /// Non-overlapping occurrences of `text`.
    int GetNumOccurrences(char const* text, bool ignoreCase = false) const;
    int GetNumOccurrences(unsigned short ch) const;
    bool StartsWith(char const* text, bool ignoreCase = false) const;
    bool EndsWith(char const* text, bool ignoreCase = false) const;
    bool ContainsCntrlChar() const;

    // ---- Sub-strings. -------------------------------------------------------------------
    /// Copies `numChars` characters from `start` (negative count: to the end) into `out`.
    void GetSubstring(int start, int numChars, String& out) const;
    void InsertSubstring(char const* text, int charIndex);
    void InsertSubstring(String const& text, int charIndex);
    void RemoveSubstring(int start, int numChars);
    /// Replaces `numChars` characters at `start` by `replacement`.
    void ReplaceSubstring(int start, int numChars, char const* replacement);
    /// Replaces the first occurrence of `find` (whole words only when asked) by
    /// `replacement`; returns whether one was found.
    bool ReplaceSubstring(String const& find, String const& replacement, bool ignoreCase,
                          bool wholeWordOnly);
    bool ReplaceSubstring(char const* find, char const* replacement, bool ignoreCase = false,
                          bool wholeWordOnly = false);
    /// Replaces every non-overlapping occurrence, left to right; returns the count.
    int ReplaceAllSubstrings(char const* find, char const* replacement, bool ignoreCase = false,
                             bool wholeWordOnly = false);
    /// Replaces the whole text by `replacement` when it equals `text`; returns whether it did.
    bool ReplaceIfEqual(char const* text, char const* replacement, bool ignoreCase = false);
    /// Cuts the text to at most `numChars` characters; when it was cut and `suffix` is given,
    /// the suffix replaces the last characters so the result still has at most `numChars`.
    void TruncateToNChars(int numChars, char const* suffix = nullptr);
    /// Removes leading / trailing characters of `set` (null: white space).
    void TrimLeft(char const* set = nullptr);
    void TrimRight(char const* set = nullptr);
    void RemoveSurroundingWhiteSpace(TrimOptions options = kTrimLeftAndRight);
    /// Index of the first (non-)white-space character at or after `charIndex`, or the length.
    int SkipWhiteSpace(int charIndex = 0) const;
    int SkipNonWhiteSpace(int charIndex = 0) const;

    // ---- Case and shape. ---------------------------------------------------------------
    void SetUppercase();
    void SetUppercase(int start, int numChars);
    void SetLowercase();
    void SetLowercase(int start, int numChars);
    /// Reverses the characters (double-byte characters stay whole).
    void Reverse();
    /// Makes the text `count` copies of itself (0 or less: empty).
    void Repeat(int count);

    // ---- Lines. A line ends at "\n", "\r\n" or a lone "\r". --------------------------
    int GetNumLines() const;
    /// Line `lineIndex` (0-based) without its ending; empty when there is no such line.
    void GetNthLine(int lineIndex, String& out) const;
    /// Character index where line `lineIndex` starts, or -1.
    int CharOffsetOfLine(int lineIndex) const;
    void RemoveNthLine(int lineIndex);
    void TruncateToNLines(int numLines);
    /// Makes every line ending "\r\n".
    void ConvertToCRLF();
    /// Makes every "\r\n" a "\n".
    void ConvertFromCRLF();
    /// Where character `charIndex` would be after ConvertToCRLF / ConvertFromCRLF.
    int GetIndexIfConvertToCRLF(int charIndex) const;
    int GetIndexIfConvertFromCRLF(int charIndex) const;

    // ---- Appending with a separator. ----------------------------------------------------
    /// Appends `separator` (when this text is not empty) and then `item`.
    void Append(String const& item, char const* separator);
    void AppendUsingSeparator(String const& item, char const* separator);

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
    /// is no encryption.
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
    void InvalSizeCache() { m_cachedSize = -1; }

protected:
    String() = default;
    String(String const&) = default;
    String& operator=(String const&) = default;

    /// Sets the cached size (bytes including the terminator, or -1).
    void SetCachedSize(int size) const { m_cachedSize = size; }
    int GetCachedSize() const { return m_cachedSize; }
    /// Appends `numBytes` bytes of `text` (which may point into this string).
    void AppendBytes(char const* text, int numBytes);

    static bool m_isMultiByteSupportEnabled;

private:
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
