// The string family's multibyte character operations, independent of the C runtime's locale.
//
// One process-wide 256-entry table says which bytes lead a double-byte character of the ANSI
// code page (filled at load from the process's code page on Windows, by SetMultiByteCodePage
// elsewhere). The operations below are the library's own forms of the runtime's `_mbs*`
// functions:
//
//   char const* p = mbcs::NInc(text, 3);           // start of the 4th character
//   int bytes = mbcs::NBCnt(text, 3);              // bytes of the first 3 characters
//   unsigned short ch = mbcs::GetChar(p);          // 0x82A0 for a double-byte character
//
// Every operation is safe on a lead byte followed by the terminator: such a truncated
// double-byte character counts as one single byte, and nothing ever reads past the NUL. A null
// text is the empty text. A character value is an `unsigned short`: lead byte in the high 8
// bits, trail byte in the low 8 bits; a single byte is its own value.
//
// Case folding is ASCII only ('A'-'Z' <-> 'a'-'z'), as in the "C" locale: it never depends on
// the process's locale, and double-byte characters are left alone.
#pragma once

namespace tekit::mbcs {

/// The process-wide lead-byte table; true for the bytes that lead a double-byte character.
extern bool gLeadBytes[256];

inline bool IsLeadByte(unsigned char c) {
    return gLeadBytes[c];
}
inline bool IsLeadByte(char c) {
    return gLeadBytes[static_cast<unsigned char>(c)];
}

/// Replaces the table by the lead bytes of `codePage` (0: none); false, and the table left as
/// it was, when the code page is unknown.
bool LoadCodePage(unsigned codePage);
/// The code page whose lead bytes the table holds (0: single-byte).
unsigned CurrentCodePage();

/// Bytes of the character at `p`: 2 for a lead byte followed by a non-NUL byte, 0 at the
/// terminator, 1 otherwise.
int CharBytes(char const* p);
/// Bytes that the character value `ch` takes: 2 when it has a lead byte (above 0xFF), else 1.
inline int CharValueBytes(unsigned short ch) {
    return ch > 0xFF ? 2 : 1;
}

/// The next character; stays at the terminator (never moves past it).
char const* Inc(char const* p);
inline char* Inc(char* p) {
    return const_cast<char*>(Inc(static_cast<char const*>(p)));
}
/// Moves forward `n` characters, stopping at the terminator; `n` of 0 or less stays put.
char const* NInc(char const* p, int n);
inline char* NInc(char* p, int n) {
    return const_cast<char*>(NInc(static_cast<char const*>(p), n));
}
/// The start of the character before `p` in the text that starts at `start`; `start` when
/// `p` is not after it.
char const* Dec(char const* start, char const* p);
inline char* Dec(char* start, char* p) {
    return const_cast<char*>(Dec(static_cast<char const*>(start), static_cast<char const*>(p)));
}

/// Characters of the text.
int Len(char const* s);
/// Bytes of the first `n` characters (negative: of the whole text); stops at the terminator.
int NBCnt(char const* s, int n);
/// Characters that lie wholly within the first `numBytes` bytes of the text: the character
/// index of byte `numBytes` (a byte inside a double-byte character gives that character's
/// index). Stops at the terminator.
int CharsInBytes(char const* s, int numBytes);

/// The character at `p` (0 at the terminator).
unsigned short GetChar(char const* p);
/// Writes `ch` at `p` (1 or 2 bytes, no terminator) and returns the bytes written.
int PutChar(char* p, unsigned short ch);

/// ASCII case folding of one character; double-byte characters are returned unchanged.
inline unsigned short ToUpper(unsigned short ch) {
    return (ch >= 'a' && ch <= 'z') ? static_cast<unsigned short>(ch - 'a' + 'A') : ch;
}
inline unsigned short ToLower(unsigned short ch) {
    return (ch >= 'A' && ch <= 'Z') ? static_cast<unsigned short>(ch - 'A' + 'a') : ch;
}

/// Character-by-character comparison by character value: -1, 0 or 1.
int Cmp(char const* a, char const* b);
/// The same over at most `n` characters (negative: all).
int NCmp(char const* a, char const* b, int n);
/// Comparison ignoring ASCII case: -1, 0 or 1.
int ICmp(char const* a, char const* b);
int NICmp(char const* a, char const* b, int n);

/// Single-byte comparison ignoring ASCII case (the "C" locale's `_stricmp`): -1, 0 or 1.
/// `n` bytes at most (negative: all).
int AsciiNICmp(char const* a, char const* b, int n);
inline int AsciiICmp(char const* a, char const* b) {
    return AsciiNICmp(a, b, -1);
}

} // namespace tekit::mbcs
