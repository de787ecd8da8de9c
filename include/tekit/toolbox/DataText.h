// The data-to-text encoding: arbitrary bytes as printable text that can stand, unquoted and
// unescaped, in an INI value, an XML attribute and a CSV field.
//
//   char text[16];
//   int n = ConvertDataToTextInBuffer(bytes, 4, text, sizeof text);   // n == 6
//   unsigned char back[4];
//   int m = ConvertTextToDataInBuffer(text, -1, back, sizeof back);    // m == 4
//
// Every 4 bytes become 6 characters (the compressed-string text form relies on that ratio: its
// first 6 characters stand for the block's 4 magic bytes). A group of 4 bytes, read as a
// big-endian 32-bit value followed by 4 zero bits, is written as six 6-bit digits, most
// significant first. A last partial group of 1, 2 or 3 bytes is written the same way with as
// few digits as hold its bits, the unused low bits zero: 2, 3 or 4 characters. So a text of
// n bytes has 6 * (n / 4) + {0, 2, 3, 4}[n % 4] characters.
//
// The digits 0 to 63 are the characters of
//
//   .0123456789ABCDEFGHIJKLMNOPQRSTUVWXYZ_abcdefghijklmnopqrstuvwxyz
//
// in ASCII order, so texts of equal length sort as their bytes do. None of them is white
// space, a quote, comma, ampersand, <, >, ;, =, [, ] or backslash.
//
// Decoding is strict: a character outside the alphabet, a length of 6k + 1 or 6k + 5, or
// unused bits that are not zero make the text malformed, so every byte string has exactly one
// text. Nothing is read beyond the given length or the terminator.
//
// Failures, as negative TEError values (the result, nothing written):
//   TE_INVALID_POINTER (-17346)          a null pointer where one is needed
//   TE_INVALID_OR_OUT_OF_RANGE (-17300)  a negative or too large size, a buffer too small
//   TE_INCOMPATIBLE_PARAMETERS (-17311)  source and destination overlap
//   TE_UNRECOGNIZED_VALUE (-17304)       the text is not encoded data
//   TE_OUT_OF_MEMORY (-17000)            an allocation failed
// Results of the allocating forms are freed with TBFree.
#pragma once

#include "tekit/Export.h"

/// Characters (without the terminator) of the text for `dataSize` bytes; TE_INVALID_OR_OUT_OF_RANGE
/// when `dataSize` is negative or the text would not fit in an int with its terminator.
extern "C" TEKIT_API int TEKIT_STDCALL GetTextSizeForData(int dataSize);

/// Bytes that a text of `textLength` characters decodes to; TE_INVALID_OR_OUT_OF_RANGE for a
/// negative length, TE_UNRECOGNIZED_VALUE for a length no encoded text has (6k + 1, 6k + 5).
extern "C" TEKIT_API int TEKIT_STDCALL GetDataSizeForText(int textLength);

/// Writes the text of `dataSize` bytes and a terminator into `text`, which holds
/// `textBufferSize` bytes (at least GetTextSizeForData(dataSize) + 1). Returns the characters
/// written. `data` may be null when `dataSize` is 0.
extern "C" TEKIT_API int TEKIT_STDCALL ConvertDataToTextInBuffer(void const* data, int dataSize,
                                                                 char* text, int textBufferSize);

/// The text of `dataSize` bytes, NUL-terminated, in a new block (free with TBFree); null on
/// any failure.
extern "C" TEKIT_API char* TEKIT_STDCALL ConvertDataToText(void const* data, int dataSize);

/// Decodes `textLength` characters of `text` (-1: up to its terminator) into `data`, which
/// holds `dataBufferSize` bytes. Returns the bytes written. `data` is written only when the
/// whole text is valid.
extern "C" TEKIT_API int TEKIT_STDCALL ConvertTextToDataInBuffer(char const* text, int textLength,
                                                                 void* data, int dataBufferSize);

/// Decodes `textLength` characters of `text` (-1: up to its terminator) into a new block (free
/// with TBFree; never null on success, even for 0 bytes) and stores its size in `*dataSize`.
/// Null on any failure, `*dataSize` then unchanged. `dataSize` may be null.
extern "C" TEKIT_API void* TEKIT_STDCALL ConvertTextToData(char const* text, int textLength,
                                                           int* dataSize);
