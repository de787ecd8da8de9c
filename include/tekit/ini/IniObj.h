// IniObj: an INI document as an object. It owns one INI object of the flat store
// (tekit/ini/Ini.h), raises its status codes as TEException, and adds typed Get/Set overloads,
// whole-file and whole-string reading and writing, and the two binary file forms.
//
//   IniObj ini(false, Path("station.ini"));      // reads any of the three file forms
//   long channel = 0;
//   if (ini.Get("Scope", "Channel", channel))    // true: found; a bad value raises
//       Use(channel);
//   ini.Set("Scope", "Label", DynamicString("Supply \"A\""));
//   ini.WriteFile(Path("station.bin"), true, false);   // the compressed binary form
//
// The three file forms. ReadFile tells them apart by their first bytes, "OrvaneBinaryText"
// tested before "OrvaneBinary" (which it also begins with); anything else is INI text.
//
//   INI text                the store's text (see Ini.h)
//   text binary form        "OrvaneBinaryText" (16 bytes, no terminator), then the INI text as
//                           a compressed string (tekit/streams/KaCompressor.h): text only
//   compressed binary form  a 32-byte header, then the INI text as a zlib stream:
//                             offset 0   20 bytes  "OrvaneBinary", NUL-padded
//                             offset 20   4 bytes  offset of the compressed data: 32
//                             offset 24   4 bytes  reserved: 0
//                             offset 28   4 bytes  length of the INI text in bytes
//                             offset 32   n bytes  the compressed text (to the end of the file)
//                           integers unsigned little-endian
//
// Choices this class makes:
//   - ReadFile and ReadString replace the object's content; on any failure the object is as
//     it was (the text is read into a new object that takes the old one's place at the end).
//   - WriteFile(path) writes INI text; WriteFile(path, binary, asText) writes INI text when
//     `binary` is false (asText is then ignored), else the text binary form when `asText`,
//     else the compressed binary form. Every form replaces the file in one step through a
//     temporary file "ini$$......tmp" beside it, written in 64 KiB blocks; on failure the
//     target is unchanged and no temporary file is left.
//   - WriteString(out, compressed, crlf): `out` receives the INI text with lines ending in LF,
//     or CR LF with `crlf`; with `compressed` it receives the text binary form instead (the
//     magic and the compressed string, all text), which ReadString reads back as well.
//   - A file that begins with "OrvaneBinary" but is too short to hold its header, a header
//     whose data offset is not 32 or whose length is beyond what its data can inflate to, data
//     that does not inflate to that length, and a text binary form whose compressed string is
//     malformed, all raise TE_BAD_FILE_FORMAT in "IniObj::ReadAsBinary". A file shorter than 20
//     bytes or without either magic is read as INI text; an empty file is an empty document.
//   - The found-flag forms of the typed getters, Get(section, tag, value, converted), never
//     raise for a value that does not convert: they return whether the item exists and set
//     `converted` to whether its value was taken (the plain forms raise
//     TE_INVALID_OR_OUT_OF_RANGE instead).
//   - Compare is true when both hold the same sections in the same order, each with the same
//     items (tag, stored value, quoted flag) in the same order; line numbers do not count.
//     Sorting both first compares without regard to order.
//   - CopySection copies a section of the argument into this object.
//
// Errors. The store's status codes become TEErrors raised in the name of the IniObj
// operation ("IniObj::ReadFile", "IniObj::WriteFile", "IniObj::ReadString",
// "IniObj::WriteString", "IniObj::Get", "IniObj::Set", ...):
//   a missing file            TE_FILE_NOT_FOUND, "Could not find file '...'." (CANT_FIND_FILE)
//                             and the read elaboration (TE_CANT_READ_FILE_ELAB)
//   a file that cannot be opened or read    TE_UNABLE_TO_OPEN_FILE / TE_IO_ERROR, the same
//   a read-only target        TE_ACCESS_DENIED, TE_CANT_WRITE_READONLY_FILE_ELAB
//   any other failed write    TE_ACCESS_DENIED (not writable) or TE_IO_ERROR (writing failed),
//                             with TE_CANT_WRITE_FILE_ELAB; TE_DISK_FULL for a full disk
//   a value that does not convert, an invalid argument, data too large
//                             TE_INVALID_OR_OUT_OF_RANGE, with the store's message
//   a value too long to write TE_TOO_MANY_ITEMS; exhausted memory TE_OUT_OF_MEMORY
//
// An object is not locked; one thread uses it at a time.
#pragma once

#include "tekit/Export.h"
#include "tekit/ini/Ini.h"
#include "tekit/strings/DynamicString.h"

#include <cstddef>

namespace tekit {

class Path;
class String;

class TEKIT_API IniObj {
public:
    /// An empty document. With `sortFlag` the object sorts automatically (sections and items
    /// in name order after every read and put). `localeName` names the C run-time locale used
    /// for doubles and case-insensitive words ("True", "Nan" ...); null or "" is the library's
    /// "C" locale. An unknown locale name raises TE_INVALID_OR_OUT_OF_RANGE. So
    /// IniObj(false, "station.ini") names a locale: a file to read is given as a Path.
    explicit IniObj(bool sortFlag = false, char const* localeName = nullptr);
    /// A document read from `text` (ReadString).
    IniObj(bool sortFlag, String const& text, char const* localeName = nullptr);
    /// A document read from the file `path` in any of the three forms (ReadFile).
    IniObj(bool sortFlag, Path const& path, char const* localeName = nullptr);
    ~IniObj();
    IniObj(IniObj const&) = delete;
    IniObj& operator=(IniObj const&) = delete;

    // ---- Whole documents. ----------------------------------------------------------------

    /// Replaces the content with the file's, whatever its form.
    void ReadFile(Path const& path);
    /// Writes INI text.
    void WriteFile(Path const& path);
    /// Writes the form chosen by the two flags (see the file's opening comment).
    void WriteFile(Path const& path, bool binary, bool asText);
    /// Replaces the content with the document in `text`: INI text, or the text binary form.
    void ReadString(String const& text);
    /// `out` receives the document (see the file's opening comment for the flags).
    void WriteString(DynamicString& out, bool compressed = false, bool crlf = false);

    // ---- Typed values. Each returns true when the item exists, false (and the output
    // unchanged) when it is absent or its value is blank. --------------------------------------

    bool Get(char const* section, char const* tag, long& value);
    bool Get(char const* section, char const* tag, long& value, bool& converted);
    bool Get(char const* section, char const* tag, unsigned long& value);
    bool Get(char const* section, char const* tag, unsigned long& value, bool& converted);
    bool Get(char const* section, char const* tag, double& value);
    bool Get(char const* section, char const* tag, double& value, bool& converted);
    /// "True" or "False" in any case.
    bool Get(char const* section, char const* tag, bool& value);
    bool Get(char const* section, char const* tag, bool& value, bool& converted);
    /// The unescaped text as a path.
    bool Get(char const* section, char const* tag, Path& value);
    /// The unescaped text.
    bool Get(char const* section, char const* tag, String& value);
    /// The unescaped text in a new block, freed with TBFree (tekit/toolbox/MemoryHelpers.h).
    bool Get(char const* section, char const* tag, char** value);
    /// The bytes of a data value in a new block (freed with TBFree) and their count.
    bool Get(char const* section, char const* tag, unsigned char** data, long* size);
    /// The stored text as it is (not unescaped).
    bool GetRaw(char const* section, char const* tag, String& value);

    /// The section as a pointer for the SP forms: true and `section`, or false.
    bool GetSectionPtr(char const* name, IniSection& section);
    bool GetSP(IniSection section, char const* tag, long& value);
    bool GetSP(IniSection section, char const* tag, unsigned long& value);
    bool GetSP(IniSection section, char const* tag, double& value);
    bool GetSP(IniSection section, char const* tag, bool& value);
    bool GetSP(IniSection section, char const* tag, String& value);
    bool GetRawSP(IniSection section, char const* tag, String& value);

    /// Setters create a missing section; an item of the same tag is replaced.
    void Set(char const* section, char const* tag, long value);
    void Set(char const* section, char const* tag, unsigned long value);
    void Set(char const* section, char const* tag, int value) { Set(section, tag, long(value)); }
    void Set(char const* section, char const* tag, unsigned int value) {
        Set(section, tag, static_cast<unsigned long>(value));
    }
    void Set(char const* section, char const* tag, double value);
    void Set(char const* section, char const* tag, bool value);
    void Set(char const* section, char const* tag, Path const& value);
    /// Stored escaped and quoted.
    void Set(char const* section, char const* tag, String const& value);
    void Set(char const* section, char const* tag, char const* value);
    /// `size` bytes as data text.
    void Set(char const* section, char const* tag, unsigned char const* data, long size);
    /// Stored as given, unquoted: it must hold no line end.
    void SetRaw(char const* section, char const* tag, char const* value);
    void SetSP(IniSection section, char const* tag, long value);
    void SetSP(IniSection section, char const* tag, unsigned long value);
    void SetSP(IniSection section, char const* tag, double value);
    void SetSP(IniSection section, char const* tag, bool value);
    void SetSP(IniSection section, char const* tag, String const& value);
    void SetRawSP(IniSection section, char const* tag, char const* value);

    // ---- Sections, comparison, order. ----------------------------------------------------

    /// Copies section `name` of `source` into this object: with `replace` this object's
    /// section of that name is emptied first, otherwise the items are put one by one
    /// (replacing items of the same tag). True when copied, false when `source` has no such
    /// section.
    bool CopySection(IniObj& source, char const* const name, bool replace);
    /// True when the two documents are equal (see the file's opening comment).
    bool Compare(IniObj& other);
    /// Sorts sections and items by name and keeps them in order from now on.
    void Sort();
    /// Stops keeping sections and items in order (also after later reads).
    void DisableSorting();
    /// Builds sorted indexes so lookups binary-search while the order stays as it is.
    void SortInternally();
    void DisableInternalSorting();

    // ---- Flags kept with the document (not written to the file). -----------------------------

    bool GetHasProtectedData() const { return m_hasProtectedData; }
    void SetHasProtectedData(bool value) { m_hasProtectedData = value; }
    bool GetHasPassByRefPointerCommonCParameter() const { return m_hasPassByRefPointer; }
    void SetHasPassByRefPointerCommonCParameter(bool value) { m_hasPassByRefPointer = value; }

    /// The store's object, for the flat functions (sections, items, tokens ...). It stays
    /// this object's; a ReadFile or ReadString replaces it with a new one.
    IniHandle GetHandle() const { return m_ini; }

    /// The magics of the two binary forms.
    static constexpr char kBinaryMagic[] = "OrvaneBinary";
    static constexpr char kBinaryTextMagic[] = "OrvaneBinaryText";
    /// The size of the compressed binary form's header, and where its data starts.
    static constexpr unsigned kBinaryHeaderSize = 32;

private:
    /// Reads a binary form: false (nothing read) when the file has neither magic.
    bool ReadAsBinary(Path const& path);
    void WriteAsBinary(Path const& path, bool asText);
    /// A new empty store object with this object's settings (order, locale, tokens,
    /// duplicate checking, section filter).
    IniHandle NewHandle() const;
    /// Makes `fresh`, read completely, this object's store object (with sorted indexes when
    /// the old one had them); disposes it and raises for `status` in `function` on failure.
    void Adopt(IniHandle fresh, int status, char const* function);
    /// Reads `size` bytes of INI text into a new store object that then replaces this one's.
    void ReadText(char const* text, std::size_t size, char const* function);

    IniHandle m_ini = nullptr;
    IniLocale m_locale{};
    bool m_hasProtectedData = false;
    bool m_hasPassByRefPointer = false;
};

} // namespace tekit
