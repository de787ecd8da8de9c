// StringsFile: one strings file read and checked, its rows ready to enter the message table.
//
//   StringsFile german;
//   german.Read(Path("/opt/tekit/lib/language/German/tekit.strings.ini"));
//   for (int i = 0; i < german.GetNumRows(); ++i)
//       std::printf("%d: [%s] %s\n", german.GetLine(i), german.GetSection(i), german.GetKey(i));
//   german.Use();                        // what RString::UseStringsFile does in one call
//
// A strings file translates message-table rows. It is an INI file, read by the INI store's
// reader, so its sections are the message table's sections, its tags the keys and its values
// the texts, with the INI store's escapes (\t, \n, \r, \", \\, \xHH) and long texts as pieces
// "KEY Line0001", "KEY Line0002", ...:
//
//   ; German messages of the station software
//   [ERR_DESCR]
//   CANT_FIND_FILE = "Die Datei '%1' wurde nicht gefunden."
//   [TE_ERRORS]
//   TE_FILE_NOT_FOUND = Datei nicht gefunden.
//
// The file is UTF-8 (a leading byte-order mark is skipped), with LF or CR LF line ends. Each
// line is converted to the string family's narrow code page (the process's ANSI code page on
// Windows, the code page set with SetMultiByteCodePage elsewhere, Latin-1 when that is 0)
// before the INI reader sees it, so "\xHH" escapes give bytes of that code page and a
// character the code page cannot hold becomes '?'.
//
// Where the INI reader quietly ignores a line, a strings file is refused, since a translation
// lost to a typing mistake would go unnoticed: reading raises TE_BAD_FILE_FORMAT naming the
// file and the line of the first problem, which is one of: a line longer than 640 bytes, a
// line that is not UTF-8 or holds a control character other than tab, text before the first
// section header, a broken section header, a line that is neither a header, a comment (";")
// nor "KEY = text", an empty key or text (an empty text is written ""), and a key given twice
// in one section. A file larger than 16 MB is refused before it is read. A failed read leaves
// the rows held as they were.
#pragma once

#include "tekit/Export.h"

#include <cstddef>

namespace tekit {

class Path;

class TEKIT_API StringsFile {
public:
    /// Limits of a strings file: its size and the bytes of one line without its line end.
    static constexpr std::size_t kMaxFileBytes = 16u * 1024 * 1024;
    static constexpr std::size_t kMaxLineBytes = 640;

    StringsFile();
    ~StringsFile();
    StringsFile(StringsFile const&) = delete;
    StringsFile& operator=(StringsFile const&) = delete;

    /// Reads the file `file`, replacing the rows held. Raises the file's system error
    /// (TE_FILE_NOT_FOUND, TE_ACCESS_DENIED, ...), or TE_BAD_FILE_FORMAT.
    void Read(Path const& file);
    /// The same over `size` bytes in memory (standard input, say); `name` stands for the file
    /// in messages.
    void ReadText(char const* name, void const* bytes, std::size_t size);

    /// The rows in file order: section, key, text (unescaped, narrow) and the line the row
    /// starts at. An index outside 0 .. GetNumRows() - 1 raises TE_INDEX_OUT_OF_RANGE.
    int GetNumRows() const;
    char const* GetSection(int index) const;
    char const* GetKey(int index) const;
    char const* GetText(int index) const;
    int GetLine(int index) const;

    /// Enters the rows into the global message table in one step, each replacing the row of
    /// its section and key. Raises TE_OBJECT_LOCKED once RString::FinishedLoadingStrings has
    /// marked the table complete.
    void Use() const;

private:
    struct Rows;
    Rows* m_rows;
};

} // namespace tekit
