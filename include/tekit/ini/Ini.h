// The INI store's flat interface: an in-memory INI document of named sections, each an ordered
// list of tag/value items, read from and written to text.
//
//   IniHandle ini = Ini_New(0, nullptr);               // file order, the "C" locale
//   if (Ini_ReadFromFile(ini, "station.ini") == 0) {
//       int channel = 0;
//       if (Ini_GetInt(ini, "Scope", "Channel", &channel) == 1)   // 1 found, 0 absent
//           Use(channel);
//       Ini_PutString(ini, "Scope", "Label", "Supply \"A\"");     // stored as Supply \"A\"
//       Ini_PutDouble(ini, "Scope", "Gain", 2.5);
//       int rc = Ini_WriteToFile(ini, "station.ini");             // atomic replace
//   }
//   Ini_Dispose(ini);
//
// Status conventions. Every function returns an int (except Ini_New and Ini_Dispose): a
// negative value is an IniStatus code below; getters and existence tests return 1 when the
// item (section) was found and 0 when it is absent; other functions return 0 on success.
// An absent item is not an error, and neither is a value that is empty or only white space:
// every getter (the raw-string ones too) returns 0 for it and leaves its output unchanged.
// Outputs are written only on a result of 1. A null object, section, tag or output pointer, or
// an empty tag given to a setter, gives INI_ERR_INVALID_ARGUMENT; an index out of range is an
// absent entry (0). No function throws.
//
// Parameter order: object, section name (or, in the "SP" twins, a section pointer from
// Ini_GetSectionPtr), tag, then the value or output, then a buffer size. Indexes count from 1.
//
// The text grammar (one line at a time, at most 640 bytes; tokens per Ini_SetTokens):
//   - leading white space is skipped; a line that starts with the comment token (";") is a
//     comment;
//   - "[name]" is a section header: white space after "[" and before the last "]" is dropped;
//     the last "]" closes the name, so "[a]b]" is section "a]b"; a header with anything but
//     white space after its last "]", without a "]", or with an empty name is ignored;
//   - "tag = value" is an item: the tag is the text before the first separator ("="), the value
//     the text after it, both without surrounding white space; a line without the separator,
//     with an empty tag or an empty value is ignored. A value of two or more characters in
//     double quotes loses them and is marked quoted: `T = ""` is an empty string, `T =` is no
//     item at all. There are no comments after a value;
//   - items before the first section are ignored; so are the items of a section that the
//     section filter rejected. A section header always starts a new section, also when the
//     name was seen before (lookups then find the first one).
// Names of sections and tags are exact, case-sensitive byte strings ("Key" and "key" are two
// items); sorted order is their byte order. Setters store names as given, so a tag holding the
// separator, starting with the comment token or "[", or with white space around it, and a
// section name with white space around it, are written but do not read back as themselves. In the
// string family's multibyte mode (tekit/strings/MultiByte.h) the scans step over double-byte
// characters, so a trail byte is never taken for "]", "=", a backslash or white space.
//
// Multi-line values. A value longer than 120 bytes is written as consecutive items whose tags
// are the tag, " Line" and the piece number from 1 ("%04d"): `Tag Line0001`, `Tag Line0002`,
// and so on, each piece at most 120 bytes and never splitting a double-byte character. After
// a read, each run of such items in a section is joined into one item `Tag` whose value is the
// pieces' concatenation, whose line is the first piece's line and whose quoted flag is the
// first piece's. A run starts at a tag ending in " Line" and digits that read as 1 ("Line1",
// "Line0001"); the next item continues it when it has the same base tag and the next number;
// anything else ends it (an item of another form or base, a number that is not the next one
// — so another 1 starts a new run). A file that ends inside a run keeps the pieces it has: the
// run is joined from them. Pieces that are not part of a run stay items of their own.
//   The writer makes the text read back to the same object: a piece boundary never leaves
// white space at the edge of an unquoted piece (it cuts earlier, or writes a later piece in
// quotes, which joining does not see), an unquoted value that a single line would turn into a
// quoted one (`"a" "b"`) is written as pieces, and so is an item whose own tag would start or
// continue a run. An unquoted empty value (only Ini_PutRawString makes one) is written as ""
// and so reads back as a quoted empty string.
//
// Escaping (Ini_PutString; undone by the non-raw string getters): tab "\t", line feed "\n",
// carriage return "\r", double quote "\"", backslash "\\", any other control character
// (below 32, and 127) "\x" with two lowercase hex digits. Unescaping reads "\n", "\r", "\t"
// and "\xHH" (either case); a backslash before any other character gives that character; "\x"
// without two hex digits gives "x"; a backslash at the very end is kept. Double-byte characters
// are copied whole; in multibyte mode a lead byte followed by a control character is not a
// double-byte character and is escaped as "\xHH" itself, so no line end ever reaches the text.
//
// Typed values: integers in decimal (64-bit ones too); doubles with "%.16g" (so 17-digit
// values lose their last digit), infinities as "Inf" and "-Inf", NaNs as "Nan", except the
// negative default NaN of x86 arithmetic (0.0 / 0.0), which is "Ind" (both read back to the
// NaN they stand for); booleans as "True" and "False"; data (bytes) as the toolbox's data
// text (tekit/toolbox/DataText.h), quoted. Getters accept white space around numbers; "True",
// "False", "Nan", "Ind" and "Inf" in any case.
//
// Bad input never crashes and gives these results: a line longer than 640 bytes is cut to its
// first 640 bytes and then read like any other line; NUL, a lone CR and a lone LF each end a
// line (CR LF and LF CR are one line end); in multibyte mode a lead byte at the end of a line
// is a single byte. A failed read keeps the sections read so far.
//
// Files. Ini_ReadFromFile reads the file in binary mode through the toolbox's line reader.
// Ini_WriteToFile writes a temporary file "ini$$" + six characters + ".tmp" beside the target,
// flushes it to the disk and renames it over the target in one step (on Windows
// MoveFileExA with MOVEFILE_REPLACE_EXISTING, so the target is never missing); lines end in
// CR LF on Windows and LF elsewhere. The new file takes the target's permission bits (POSIX; a
// new target those of a plainly created file); a symbolic link as the target is replaced by the
// file. On any failure the temporary file is removed and the target is left byte for byte as it
// was.
//
// Concurrency: an object is not locked; one thread uses it at a time. The pointer getters of
// one object share one buffer.
#pragma once

#include "tekit/Export.h"
#include "tekit/errors/StatusDefinitions.h"

#include <cstdint>
#include <locale.h>

/// The status codes of the INI store (the negative results of its functions).
enum IniStatus : std::int32_t {
#define INI_STATUS(symbol, value, key, text) TEKIT_STATUS_ENUMERATOR(symbol, value)
#include "tekit/errors/IniStatus.def"
};

/// A C run-time locale: used for the case-insensitive comparisons and the number conversions
/// of one object. Null means the library's own "C" locale.
#if defined(_WIN32)
typedef _locale_t IniLocale;
#else
typedef locale_t IniLocale;
#endif

/// An INI object (opaque).
typedef struct IniObjectRec* IniHandle;
/// A section of an INI object (opaque): valid until the section is removed or the object is
/// disposed; sorting and reading do not move it.
typedef struct IniSectionRec* IniSection;

/// Reads the next line: at most `bufferSize` (640) characters and a terminator into `buffer`.
/// Sets `*endOfInput` to 1 when there is no more input (a line returned with the flag is still
/// read) and may set `*lineNumber` (preset to the previous line's number + 1). Returns a
/// negative error, which ends the read with it, or a non-negative count. The line is the text
/// up to the first NUL of `buffer`.
typedef int(TEKIT_STDCALL* IniReadLineCallback)(void* data, char* buffer, int bufferSize,
                                                int* endOfInput, int* lineNumber);
/// Writes one line (NUL-terminated, without a line end). A negative result ends the write with
/// that result.
typedef int(TEKIT_STDCALL* IniWriteLineCallback)(void* data, char const* line);
/// Decides whether the reader keeps a section: 0 skips the section and its items.
typedef int(TEKIT_STDCALL* IniSectionFilterCallback)(IniHandle ini, void* data,
                                                     char const* sectionName);

extern "C" {

// ---- The object -----------------------------------------------------------------------------

/// A new empty object. With `sortFlag` non-zero the object sorts automatically: sections and
/// items are sorted after every read, and puts keep them in order. `locale` may be null (the
/// library's "C" locale); it must outlive the object. Null when memory is exhausted.
TEKIT_API IniHandle TEKIT_STDCALL Ini_New(int sortFlag, IniLocale locale);
/// Frees the object, its sections, items and buffers. Null is ignored.
TEKIT_API void TEKIT_STDCALL Ini_Dispose(IniHandle ini);

/// Replaces the tokens given: section start and end characters (0 keeps the current one), the
/// tag/value separator and the comment token (null or "" keeps the current one; cut to 7
/// bytes at a character boundary). The separator is written with one blank on each side.
/// Defaults: '[', ']', "=", ";". Returns 0.
TEKIT_API int TEKIT_STDCALL Ini_SetTokens(IniHandle ini, char sectionStart, char sectionEnd,
                                          char const* separator, char const* comment);
/// Duplicate checking (on by default): a put first removes every item with the same tag in the
/// section. Returns the previous setting (0 or 1).
TEKIT_API int TEKIT_STDCALL Ini_SetDuplicateChecking(IniHandle ini, int on);
/// The reader calls `filter(ini, data, name)` for each section header; null keeps every
/// section. Returns 0.
TEKIT_API int TEKIT_STDCALL Ini_SetSectionFilter(IniHandle ini, IniSectionFilterCallback filter,
                                                 void* data);

/// Sorts the sections by name and each section's items by tag (stable: equal names keep their
/// order), and keeps them in order from now on: new sections and items are inserted in order.
TEKIT_API int TEKIT_STDCALL Ini_Sort(IniHandle ini);
/// Stops keeping sections and items in order (also after later reads); the order stays.
TEKIT_API int TEKIT_STDCALL Ini_DisableSorting(IniHandle ini);
/// Builds sorted indexes of the sections and of each section's items, kept up to date from
/// now on, so lookups binary-search while the order stays as it is. INI_ERR_OUT_OF_MEMORY
/// leaves the object without indexes.
TEKIT_API int TEKIT_STDCALL Ini_SortInternally(IniHandle ini);
/// Drops the sorted indexes.
TEKIT_API int TEKIT_STDCALL Ini_DisableInternalSorting(IniHandle ini);

// ---- Reading and writing ------------------------------------------------------------------

/// Adds the text that `readLine` delivers (see IniReadLineCallback) to the object, then joins
/// multi-line items, sorts when the object sorts automatically and rebuilds the indexes when
/// it has them. Returns 0, INI_ERR_OUT_OF_MEMORY or the callback's negative result; the
/// sections read before a failure stay.
TEKIT_API int TEKIT_STDCALL Ini_ReadGeneric(IniHandle ini, IniReadLineCallback readLine,
                                            void* data);
/// Reads the file `path` (binary). INI_ERR_CANT_OPEN_FILE when it cannot be opened,
/// INI_ERR_CANT_READ_FILE when reading fails; line numbers are the file's.
TEKIT_API int TEKIT_STDCALL Ini_ReadFromFile(IniHandle ini, char const* path);
/// Writes the object line by line: for each section "[name]", its items, then an empty line.
/// Returns 0, INI_ERR_TOO_MANY_LINES, INI_ERR_OUT_OF_MEMORY or the callback's negative result.
TEKIT_API int TEKIT_STDCALL Ini_WriteGeneric(IniHandle ini, IniWriteLineCallback writeLine,
                                             void* data);
/// Writes the object to `path` atomically (see the file's opening comment). Returns 0;
/// INI_ERR_CANT_WRITE_FILE when the target is read-only, is a directory or its directory
/// refuses the temporary file; INI_ERR_WRITE_FAILED when writing, flushing or renaming fails
/// (a full disk, say); the target is then unchanged and no temporary file is left.
TEKIT_API int TEKIT_STDCALL Ini_WriteToFile(IniHandle ini, char const* path);

// ---- Sections -----------------------------------------------------------------------------

/// The number of sections (>= 0).
TEKIT_API int TEKIT_STDCALL Ini_NumberOfSections(IniHandle ini);
/// The name of section `index` (1 .. count, list order): 1 and `*name` (valid until the
/// section is removed), or 0 when there is no such section.
TEKIT_API int TEKIT_STDCALL Ini_NthSectionName(IniHandle ini, int index, char const** name);
/// Section `index` as a pointer: 1 and `*section`, or 0.
TEKIT_API int TEKIT_STDCALL Ini_NthSection(IniHandle ini, int index, IniSection* section);
TEKIT_API int TEKIT_STDCALL Ini_SectionExists(IniHandle ini, char const* section);
/// Whether a section name starts with `prefix`; `*fullName` (may be null) gets the first such
/// name in list order.
TEKIT_API int TEKIT_STDCALL Ini_PartialSectionNameExists(IniHandle ini, char const* prefix,
                                                         char const** fullName);
/// Removes the (first) section of that name with its items: 1, or 0 when there is none.
TEKIT_API int TEKIT_STDCALL Ini_RemoveSection(IniHandle ini, char const* section);
/// Copies section `section` of `source` into `dest`, another object: with `replace` non-zero a
/// section of that name in `dest` is emptied first, otherwise its items are put one by one
/// (with `dest`'s duplicate checking). A missing section is created as a put would. 1 when
/// copied, 0 when `source` has no such section; copying an object onto itself changes nothing
/// and gives 1.
TEKIT_API int TEKIT_STDCALL Ini_CopySection(IniHandle source, IniHandle dest, char const* section,
                                            int replace);
/// The (first) section of that name as a pointer: 1 and `*sectionPtr`, or 0.
TEKIT_API int TEKIT_STDCALL Ini_GetSectionPtr(IniHandle ini, char const* section,
                                              IniSection* sectionPtr);
/// A section's name and the line number of its header (-1 for a section made by a put).
/// `name` and `line` may be null. Returns 1.
TEKIT_API int TEKIT_STDCALL Ini_SectionInfoSP(IniHandle ini, IniSection section, char const** name,
                                              int* line);

// ---- Items (each with its section-pointer twin) -------------------------------------------

/// The number of items of the section (0 when it is absent).
TEKIT_API int TEKIT_STDCALL Ini_NumberOfItems(IniHandle ini, char const* section);
TEKIT_API int TEKIT_STDCALL Ini_NumberOfItemsSP(IniHandle ini, IniSection section);
/// The tag of item `index` (1 .. count, list order): 1 and `*tag`, or 0.
TEKIT_API int TEKIT_STDCALL Ini_NthItemName(IniHandle ini, char const* section, int index,
                                            char const** tag);
TEKIT_API int TEKIT_STDCALL Ini_NthItemNameSP(IniHandle ini, IniSection section, int index,
                                              char const** tag);
/// Everything about item `index`: its tag, its stored (raw) value, the line it was read from
/// (-1 for an item made by a put) and its quoted flag. Outputs may be null; pointers stay
/// valid until the item changes. 1, or 0 when there is no such item.
TEKIT_API int TEKIT_STDCALL Ini_NthItemSP(IniHandle ini, IniSection section, int index,
                                          char const** tag, char const** rawValue, int* line,
                                          int* quoted);
TEKIT_API int TEKIT_STDCALL Ini_ItemExists(IniHandle ini, char const* section, char const* tag);
TEKIT_API int TEKIT_STDCALL Ini_ItemExistsSP(IniHandle ini, IniSection section, char const* tag);
/// Whether the item exists, or a piece of a multi-line item of that tag (`tag Line<digits>`,
/// left unjoined).
TEKIT_API int TEKIT_STDCALL Ini_ItemOrMultiLineItemExists(IniHandle ini, char const* section,
                                                          char const* tag);
TEKIT_API int TEKIT_STDCALL Ini_ItemOrMultiLineItemExistsSP(IniHandle ini, IniSection section,
                                                            char const* tag);
/// Whether a tag of the section starts with `prefix`; `*fullTag` (may be null) gets the first
/// such tag in list order.
TEKIT_API int TEKIT_STDCALL Ini_PartialItemNameExists(IniHandle ini, char const* section,
                                                      char const* prefix, char const** fullTag);
TEKIT_API int TEKIT_STDCALL Ini_PartialItemNameExistsSP(IniHandle ini, IniSection section,
                                                        char const* prefix, char const** fullTag);
/// The same, but when the first match is a piece of a multi-line item (`base Line<digits>`),
/// `*fullTag` is its base tag (held in the object's shared buffer, see Ini_GetPointerToString).
TEKIT_API int TEKIT_STDCALL Ini_PartialItemNameOrMultiLineItemExists(IniHandle ini,
                                                                     char const* section,
                                                                     char const* prefix,
                                                                     char const** fullTag);
TEKIT_API int TEKIT_STDCALL Ini_PartialItemNameOrMultiLineItemExistsSP(IniHandle ini,
                                                                       IniSection section,
                                                                       char const* prefix,
                                                                       char const** fullTag);
/// Removes every item with that tag: 1, or 0 when there is none.
TEKIT_API int TEKIT_STDCALL Ini_RemoveItem(IniHandle ini, char const* section, char const* tag);
TEKIT_API int TEKIT_STDCALL Ini_RemoveItemSP(IniHandle ini, IniSection section, char const* tag);

// ---- Setters: 0 or a negative status. A put on a missing section creates it. ----------------

/// Stores the escaped text, quoted.
TEKIT_API int TEKIT_STDCALL Ini_PutString(IniHandle ini, char const* section, char const* tag,
                                          char const* value);
TEKIT_API int TEKIT_STDCALL Ini_PutStringSP(IniHandle ini, IniSection section, char const* tag,
                                            char const* value);
/// Stores the text as given, unquoted. It should hold no line end (CR, LF), which would end
/// its line in the written text.
TEKIT_API int TEKIT_STDCALL Ini_PutRawString(IniHandle ini, char const* section, char const* tag,
                                             char const* value);
TEKIT_API int TEKIT_STDCALL Ini_PutRawStringSP(IniHandle ini, IniSection section, char const* tag,
                                               char const* value);
TEKIT_API int TEKIT_STDCALL Ini_PutInt(IniHandle ini, char const* section, char const* tag,
                                       int value);
TEKIT_API int TEKIT_STDCALL Ini_PutIntSP(IniHandle ini, IniSection section, char const* tag,
                                         int value);
TEKIT_API int TEKIT_STDCALL Ini_PutUInt(IniHandle ini, char const* section, char const* tag,
                                        unsigned int value);
TEKIT_API int TEKIT_STDCALL Ini_PutUIntSP(IniHandle ini, IniSection section, char const* tag,
                                          unsigned int value);
TEKIT_API int TEKIT_STDCALL Ini_PutInt64(IniHandle ini, char const* section, char const* tag,
                                         std::int64_t value);
TEKIT_API int TEKIT_STDCALL Ini_PutInt64SP(IniHandle ini, IniSection section, char const* tag,
                                           std::int64_t value);
TEKIT_API int TEKIT_STDCALL Ini_PutUInt64(IniHandle ini, char const* section, char const* tag,
                                          std::uint64_t value);
TEKIT_API int TEKIT_STDCALL Ini_PutUInt64SP(IniHandle ini, IniSection section, char const* tag,
                                            std::uint64_t value);
TEKIT_API int TEKIT_STDCALL Ini_PutDouble(IniHandle ini, char const* section, char const* tag,
                                          double value);
TEKIT_API int TEKIT_STDCALL Ini_PutDoubleSP(IniHandle ini, IniSection section, char const* tag,
                                            double value);
/// "True" for non-zero, "False" for 0.
TEKIT_API int TEKIT_STDCALL Ini_PutBoolean(IniHandle ini, char const* section, char const* tag,
                                           int value);
TEKIT_API int TEKIT_STDCALL Ini_PutBooleanSP(IniHandle ini, IniSection section, char const* tag,
                                             int value);
/// Stores `size` bytes as data text, quoted. `data` may be null when `size` is 0.
TEKIT_API int TEKIT_STDCALL Ini_PutData(IniHandle ini, char const* section, char const* tag,
                                        void const* data, int size);
TEKIT_API int TEKIT_STDCALL Ini_PutDataSP(IniHandle ini, IniSection section, char const* tag,
                                          void const* data, int size);

// ---- Getters: 1 found, 0 absent or blank, or a negative status -----------------------------

/// The unescaped value in the object's shared buffer, valid until the next call that uses it
/// (Ini_GetPointerToString, Ini_PartialItemNameOrMultiLineItemExists, their twins) or
/// Ini_Dispose.
TEKIT_API int TEKIT_STDCALL Ini_GetPointerToString(IniHandle ini, char const* section,
                                                   char const* tag, char const** value);
TEKIT_API int TEKIT_STDCALL Ini_GetPointerToStringSP(IniHandle ini, IniSection section,
                                                     char const* tag, char const** value);
/// The unescaped value in a new block, freed with TBFree (tekit/toolbox/MemoryHelpers.h).
TEKIT_API int TEKIT_STDCALL Ini_GetStringCopy(IniHandle ini, char const* section, char const* tag,
                                              char** value);
TEKIT_API int TEKIT_STDCALL Ini_GetStringCopySP(IniHandle ini, IniSection section, char const* tag,
                                                char** value);
/// The unescaped value in `buffer` of `bufferSize` bytes, cut at a character boundary to
/// fit; `bufferSize` must be at least 1.
TEKIT_API int TEKIT_STDCALL Ini_GetStringIntoBuffer(IniHandle ini, char const* section,
                                                    char const* tag, char* buffer, int bufferSize);
TEKIT_API int TEKIT_STDCALL Ini_GetStringIntoBufferSP(IniHandle ini, IniSection section,
                                                      char const* tag, char* buffer,
                                                      int bufferSize);
/// The stored text itself, valid until the item changes.
TEKIT_API int TEKIT_STDCALL Ini_GetPointerToRawString(IniHandle ini, char const* section,
                                                      char const* tag, char const** value);
TEKIT_API int TEKIT_STDCALL Ini_GetPointerToRawStringSP(IniHandle ini, IniSection section,
                                                        char const* tag, char const** value);
TEKIT_API int TEKIT_STDCALL Ini_GetRawStringCopy(IniHandle ini, char const* section,
                                                 char const* tag, char** value);
TEKIT_API int TEKIT_STDCALL Ini_GetRawStringCopySP(IniHandle ini, IniSection section,
                                                   char const* tag, char** value);
TEKIT_API int TEKIT_STDCALL Ini_GetRawStringIntoBuffer(IniHandle ini, char const* section,
                                                       char const* tag, char* buffer,
                                                       int bufferSize);
TEKIT_API int TEKIT_STDCALL Ini_GetRawStringIntoBufferSP(IniHandle ini, IniSection section,
                                                         char const* tag, char* buffer,
                                                         int bufferSize);
/// A whole decimal integer in range (white space around it allowed; no sign for the unsigned
/// forms), else INI_ERR_INVALID_INTEGER.
TEKIT_API int TEKIT_STDCALL Ini_GetInt(IniHandle ini, char const* section, char const* tag,
                                       int* value);
TEKIT_API int TEKIT_STDCALL Ini_GetIntSP(IniHandle ini, IniSection section, char const* tag,
                                         int* value);
TEKIT_API int TEKIT_STDCALL Ini_GetUInt(IniHandle ini, char const* section, char const* tag,
                                        unsigned int* value);
TEKIT_API int TEKIT_STDCALL Ini_GetUIntSP(IniHandle ini, IniSection section, char const* tag,
                                          unsigned int* value);
TEKIT_API int TEKIT_STDCALL Ini_GetInt64(IniHandle ini, char const* section, char const* tag,
                                         std::int64_t* value);
TEKIT_API int TEKIT_STDCALL Ini_GetInt64SP(IniHandle ini, IniSection section, char const* tag,
                                           std::int64_t* value);
TEKIT_API int TEKIT_STDCALL Ini_GetUInt64(IniHandle ini, char const* section, char const* tag,
                                          std::uint64_t* value);
TEKIT_API int TEKIT_STDCALL Ini_GetUInt64SP(IniHandle ini, IniSection section, char const* tag,
                                            std::uint64_t* value);
/// A whole number in the object's locale, or "Nan", "Ind", "Inf", "-Inf"; else
/// INI_ERR_INVALID_DOUBLE.
TEKIT_API int TEKIT_STDCALL Ini_GetDouble(IniHandle ini, char const* section, char const* tag,
                                          double* value);
TEKIT_API int TEKIT_STDCALL Ini_GetDoubleSP(IniHandle ini, IniSection section, char const* tag,
                                            double* value);
/// "True" gives 1 and "False" 0 (any case, white space around allowed); anything else is
/// INI_ERR_INVALID_BOOLEAN.
TEKIT_API int TEKIT_STDCALL Ini_GetBoolean(IniHandle ini, char const* section, char const* tag,
                                           int* value);
TEKIT_API int TEKIT_STDCALL Ini_GetBooleanSP(IniHandle ini, IniSection section, char const* tag,
                                             int* value);
/// The bytes of a data value in a new block (freed with TBFree; never null on success) and
/// their count. INI_ERR_INVALID_DATA when the text is not data text, INI_ERR_DATA_TOO_LARGE
/// when it holds 2147483647 bytes or more.
TEKIT_API int TEKIT_STDCALL Ini_GetData(IniHandle ini, char const* section, char const* tag,
                                        void** data, int* size);
TEKIT_API int TEKIT_STDCALL Ini_GetDataSP(IniHandle ini, IniSection section, char const* tag,
                                          void** data, int* size);

/// The line number of the item found by the last getter that found one (-1 before any, and
/// for an item made by a put rather than read).
TEKIT_API int TEKIT_STDCALL Ini_LineOfLastAccess(IniHandle ini);

/// The message key of a status code in the message table section "INI_ERRORS" (for example
/// `tekit::RString("INI_ERRORS", Ini_GetErrorKey(rc))`); null for a code that is not an
/// IniStatus.
TEKIT_API char const* TEKIT_STDCALL Ini_GetErrorKey(int status);

} // extern "C"
