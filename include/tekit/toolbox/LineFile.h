// The line reader: splits a byte source, read in chunks through a callback, into lines.
//
//   FILE* file = std::fopen("station.ini", "rb");
//   LineFile reader = LineFile_New(nullptr, file);        // null callback: read the FILE*
//   char line[641];
//   int length = 0, endOfInput = 0;
//   while (LineFile_Read(reader, line, 640, &length, &endOfInput) >= 0 && !endOfInput)
//       Use(line, LineFile_NumLinesRead(reader), LineFile_OffsetOfLastLine(reader));
//   LineFile_Dispose(reader);
//   std::fclose(file);
//
// Line ends are CR, LF and NUL. A line end that is the first byte a call looks at and differs
// from the previous line end is the second half of a pair and is skipped: so CR LF, LF CR, a
// single CR, a single LF and NUL each end one line, while CR CR and LF LF end two (the second
// empty). The previous line end is 0 at the start, so a source that begins with CR or LF does
// not report a leading empty line; the same rule makes LF NUL or CR NUL one line end. Text
// after the last line end is the last line. A line longer than `maxLen` characters is cut; the
// rest of it is consumed, so the next call starts at the next line.
//
// Failures are negative: TE_INVALID_POINTER (-17346) for a null reader or buffer,
// TE_INVALID_OR_OUT_OF_RANGE (-17300) for a negative `maxLen` or a callback that reports more
// bytes than it was asked for; an error of the chunk callback is returned as it is.
#pragma once

#include "tekit/Export.h"

#include <cstdint>

/// A line reader (opaque).
typedef struct LineFileRec* LineFile;

/// Reads up to `numBytes` bytes of `source` into `buffer` and stores how many in
/// `*numBytesRead`; 0 bytes means the source is exhausted. Returns a negative error or a
/// non-negative value.
typedef int(TEKIT_STDCALL* LineFileReadCallback)(void* source, int numBytes, int* numBytesRead,
                                                 void* buffer);

/// A reader of `source` through `readCallback` (null: LineFile_ReadFromFile, `source` being a
/// FILE*), asking for 2048 bytes at a time. Null when memory is exhausted.
extern "C" TEKIT_API LineFile TEKIT_STDCALL LineFile_New(LineFileReadCallback readCallback,
                                                         void* source);
/// Frees the reader, not its source. Null is ignored.
extern "C" TEKIT_API void TEKIT_STDCALL LineFile_Dispose(LineFile reader);

/// Reads the next line into `buffer` (room for `maxLen` + 1 bytes), without its line end,
/// terminated; `*length` gets the characters kept (at most `maxLen`). At the end of the source
/// `*endOfInput` is 1 and the line is empty. Returns 0 or a negative error. `length` and
/// `endOfInput` may be null. Bytes of `buffer` after the terminator may change (the reader
/// copies in blocks).
extern "C" TEKIT_API int TEKIT_STDCALL LineFile_Read(LineFile reader, char* buffer, int maxLen,
                                                     int* length, int* endOfInput);
/// LineFile_Read, skipping lines that are empty: lines whose bytes, the ones cut off an
/// over-long line included, are all space, tab, vertical tab or form feed (or that have
/// none). Skipped lines count in LineFile_NumLinesRead, so it stays the line number of the
/// line returned.
extern "C" TEKIT_API int TEKIT_STDCALL LineFile_ReadNonEmpty(LineFile reader, char* buffer,
                                                             int maxLen, int* length,
                                                             int* endOfInput);

/// Lines read so far, skipped empty ones included (0 for a null reader).
extern "C" TEKIT_API int TEKIT_STDCALL LineFile_NumLinesRead(LineFile reader);
/// Byte offset in the source where the line last returned begins (-1 before the first read
/// and for a null reader; the source's size once its end was reached).
extern "C" TEKIT_API std::int64_t TEKIT_STDCALL LineFile_OffsetOfLastLine(LineFile reader);
/// Line-end characters skipped, as second halves of pairs, just before the line last
/// returned: 0 or 1 (0 for a null reader).
extern "C" TEKIT_API int TEKIT_STDCALL LineFile_NumExtraLineTermChars(LineFile reader);

/// The default chunk callback: fread from the FILE* `source`. Returns TE_IO_ERROR (-17200)
/// when the stream reports an error, TE_INVALID_POINTER for null arguments, else 0.
extern "C" TEKIT_API int TEKIT_STDCALL LineFile_ReadFromFile(void* source, int numBytes,
                                                             int* numBytesRead, void* buffer);
