// Writing INI text: the section headers, the items one line each or as numbered pieces, and
// the atomic file replacement behind Ini_WriteToFile.
//
// The writer makes every line read back to what it wrote. Where the plain form would not
// (an unquoted value with white space at a piece's edge, an unquoted value wrapped in quotes,
// a tag that a reader would take for a piece of a multi-line item, a quoted value that ends in
// a lone lead byte), it writes the item as pieces and may put a later piece of an unquoted
// item in quotes: the joined item takes its quoted flag from its first piece, so the quotes of
// the others are not seen.
#include "ini/IniObjSupport.h"
#include "ini/IniObject.h"
#include "ini/IniSeams.h"
#include "ini/IniText.h"

#include "platform/File.h"
#include "platform/FileMode.h"
#include "tekit/strings/String.h"
#include "toolbox/FlatGuard.h"

#include <algorithm>
#include <charconv>
#include <cstring>
#include <string>

namespace tekit::ini {

void (*gBeforeReplaceHook)(char const* temporaryPath) = nullptr;

namespace {

#if defined(_WIN32)
constexpr char kLineEnd[] = "\r\n";
#else
constexpr char kLineEnd[] = "\n";
#endif
constexpr char kTemporaryPrefix[] = "ini$$";

/// Lines handed one by one to the caller's callback.
class CallbackSink {
public:
    CallbackSink(IniWriteLineCallback writeLine, void* data)
        : m_writeLine(writeLine), m_data(data) {}
    void Append(char const* text, std::size_t length) { m_line.append(text, length); }
    int EndLine() {
        int const status = m_writeLine(m_data, m_line.c_str());
        m_line.clear();
        return status < 0 ? status : 0;
    }

private:
    IniWriteLineCallback m_writeLine;
    void* m_data;
    std::string m_line;
};

/// Lines gathered into 64 KiB blocks written to an open file.
class FileSink {
public:
    explicit FileSink(platform::NativeFile file) : m_writer(file) {}
    void Append(char const* text, std::size_t length) { m_writer.Append(text, length); }
    int EndLine() {
        return m_writer.Append(kLineEnd, sizeof kLineEnd - 1) ? 0 : INI_ERR_WRITE_FAILED;
    }
    int Flush() { return m_writer.Flush() ? 0 : INI_ERR_WRITE_FAILED; }
    platform::SystemError const& Failure() const { return m_writer.Failure(); }

private:
    FileBlockWriter m_writer;
};

/// Lines appended to a string in memory.
class StringSink {
public:
    StringSink(std::string& out, char const* lineEnd)
        : m_out(out), m_lineEnd(lineEnd), m_lineEndLength(std::strlen(lineEnd)) {}
    void Append(char const* text, std::size_t length) { m_out.append(text, length); }
    int EndLine() {
        m_out.append(m_lineEnd, m_lineEndLength);
        return 0;
    }

private:
    std::string& m_out;
    char const* m_lineEnd;
    std::size_t m_lineEndLength;
};

template <class Sink> class Writer {
public:
    Writer(IniObjectRec& ini, Sink& sink)
        : m_ini(ini), m_sink(sink), m_mb(String::IsMultiByteSupportEnabled()),
          m_separatorLength(std::strlen(ini.writtenSeparator)) {}

    int Write() {
        IniSectionRec* const* sections = SectionsOf(m_ini);
        std::int32_t const count = SectionCount(m_ini);
        for (std::int32_t i = 0; i < count; ++i)
            if (int const status = Section(*sections[i]); status < 0)
                return status;
        return 0;
    }

private:
    int Section(IniSectionRec const& section) {
        m_sink.Append(&m_ini.sectionStart, 1);
        m_sink.Append(section.name, std::strlen(section.name));
        m_sink.Append(&m_ini.sectionEnd, 1);
        if (int const status = m_sink.EndLine(); status < 0)
            return status;
        m_runPieces = 0;
        Item const* items = ItemsOf(section);
        std::int32_t const count = ItemCount(section);
        for (std::int32_t i = 0; i < count; ++i)
            if (int const status = WriteItem(items[i]); status < 0)
                return status;
        return m_sink.EndLine();
    }

    /// Whether the text reads back as itself when it stands unquoted after the separator.
    bool SafeUnquoted(char const* begin, char const* end) const {
        return begin < end && !IsWhite(*begin) && TrimEnd(begin, end, m_mb) == end &&
               !(end - begin >= 2 && *begin == '"' && EndsWithChar(begin, end, '"', m_mb));
    }

    /// Whether the text ends in a lead byte standing alone, which a closing quote after it
    /// would pair with.
    bool EndsInLoneLead(char const* begin, char const* end) const {
        if (!m_mb || begin == end)
            return false;
        char const* const last = LastChar(begin, end, true);
        return end - last == 1 && mbcs::IsLeadByte(*last);
    }

    /// The longest first piece of an unquoted value (whose first character is not white
    /// space) that reads back as itself.
    std::size_t FirstCut(char const* value, char const* end) const {
        std::size_t best = 0;
        bool const opensWithQuote = *value == '"';
        for (char const* p = value;
             p < end && p - value < static_cast<std::ptrdiff_t>(kMaxPieceBytes);) {
            std::size_t const size = CharSize(p, end, m_mb);
            std::size_t const boundary = static_cast<std::size_t>(p - value) + size;
            if (boundary > kMaxPieceBytes)
                break;
            bool const single = size == 1;
            if (!(single && IsWhite(*p)) &&
                !(single && opensWithQuote && *p == '"' && boundary >= 2))
                best = boundary;
            p += size;
        }
        return best;
    }

    void Line(char const* tag, std::size_t tagLength, char const* value, std::size_t valueLength,
              bool quoted) {
        m_sink.Append(tag, tagLength);
        m_sink.Append(m_ini.writtenSeparator, m_separatorLength);
        if (quoted)
            m_sink.Append("\"", 1);
        m_sink.Append(value, valueLength);
        if (quoted)
            m_sink.Append("\"", 1);
    }

    int WriteItem(Item const& item) {
        std::size_t const tagLength = std::strlen(item.tag);
        std::size_t const length = std::strlen(item.value);
        char const* const value = item.value;
        char const* const end = value + length;
        bool pieces = length > kMaxPieceBytes;
        std::size_t baseLength = 0;
        std::int32_t number = 0;
        if (ParsePieceTag(item.tag, tagLength, baseLength, number, m_mb) &&
            (number == 1 ||
             (m_runPieces > 0 && number - 1 == m_runPieces && baseLength == m_runTagLength &&
              std::memcmp(item.tag, m_runTag, baseLength) == 0)))
            pieces = true; // on its own line it would start or continue a run
        if (TrimEnd(item.tag, item.tag + tagLength, m_mb) != item.tag + tagLength)
            pieces = true; // the blank before " Line" keeps the tag's trailing white space
        bool quoted = item.quoted != 0;
        if (!quoted) {
            if (length == 0 || IsWhite(*value))
                quoted = true; // no unquoted line holds it: keep the text, lose the flag
            else if (!SafeUnquoted(value, end))
                pieces = true;
        }
        if (quoted && EndsInLoneLead(value, end))
            pieces = true;
        m_runPieces = 0;
        if (!pieces) {
            Line(item.tag, tagLength, value, length, quoted);
            return m_sink.EndLine();
        }

        std::int64_t count = 0;
        std::size_t position = 0;
        std::string tag(item.tag, tagLength);
        do {
            char const* const piece = value + position;
            std::size_t cut = CutAtBoundary(piece, end, kMaxPieceBytes, m_mb);
            if (count == 0 && !quoted)
                cut = FirstCut(value, end);
            // A quoted item's pieces are quoted; an unquoted item's first piece is not, and a
            // later one only where it must be.
            bool quotePiece = quoted || (count > 0 && !SafeUnquoted(piece, piece + cut));
            if (quotePiece && position + cut == length && EndsInLoneLead(piece, piece + cut)) {
                if (cut == 1 && count > 0)
                    quotePiece = false; // the lone lead byte on its own, unquoted
                else
                    --cut; // it goes on alone in the next piece
            }
            if (++count > 0x7FFFFFFF)
                return INI_ERR_TOO_MANY_LINES;
            char number[24] = " Line";
            char digits[16];
            auto const [digitsEnd, error] = std::to_chars(digits, digits + sizeof digits, count);
            (void)error;
            std::size_t const numberLength = static_cast<std::size_t>(digitsEnd - digits);
            std::size_t const pad = numberLength < 4 ? 4 - numberLength : 0;
            std::memset(number + 5, '0', pad);
            std::memcpy(number + 5 + pad, digits, numberLength);
            tag.resize(tagLength);
            tag.append(number, 5 + pad + numberLength);
            Line(tag.data(), tag.size(), piece, cut, quotePiece);
            if (int const status = m_sink.EndLine(); status < 0)
                return status;
            position += cut;
        } while (position < length);
        m_runTag = item.tag;
        m_runTagLength = tagLength;
        m_runPieces = static_cast<std::int32_t>(count);
        return 0;
    }

    IniObjectRec& m_ini;
    Sink& m_sink;
    bool const m_mb;
    std::size_t const m_separatorLength;
    // The item just written, when it went out as pieces: a next item that continues its run
    // must not be written as a plain line.
    char const* m_runTag = nullptr;
    std::size_t m_runTagLength = 0;
    std::int32_t m_runPieces = 0;
};

template <class Sink> int WriteAll(IniObjectRec& ini, Sink& sink) {
    return Writer<Sink>(ini, sink).Write();
}

bool IsMissing(platform::SystemError const& error) {
    return error.code == platform::native::kFileNotFound ||
           error.code == platform::native::kPathNotFound;
}

/// Writes the object to the new file `file`; 0 or a status.
int FillWithText(void* context, platform::NativeFile file, platform::SystemError& failure) {
    FileSink sink(file);
    int status = WriteAll(*static_cast<IniObjectRec*>(context), sink);
    if (status >= 0)
        status = sink.Flush();
    failure = sink.Failure();
    return status;
}

} // namespace

FileBlockWriter::FileBlockWriter(platform::NativeFile file) : m_file(file) {
    m_block.reserve(kWriteBlockSize);
}

bool FileBlockWriter::Append(void const* data, std::size_t size) {
    auto const* bytes = static_cast<char const*>(data);
    while (!m_failure && size > 0) {
        std::size_t const take = std::min(size, kWriteBlockSize - m_block.size());
        m_block.append(bytes, take);
        bytes += take;
        size -= take;
        if (m_block.size() == kWriteBlockSize)
            Flush();
    }
    return !m_failure;
}

bool FileBlockWriter::Flush() {
    if (!m_failure && !m_block.empty())
        m_failure = platform::WriteToFile(m_file, m_block.data(), m_block.size());
    m_block.clear();
    return !m_failure;
}

int ReplaceFileAtomically(char const* path, FileFiller fill, void* context,
                          platform::SystemError& failure) {
    failure = {};
    platform::FileInfo info;
    platform::SystemError const queried = platform::QueryFile(path, info);
    bool const exists = !queried;
    if (queried && !IsMissing(queried)) {
        failure = queried;
        return INI_ERR_CANT_WRITE_FILE;
    }
    if (exists && (info.isDirectory || info.isReadOnly))
        return INI_ERR_CANT_WRITE_FILE;

    std::string temporary;
    platform::NativeFile file = platform::kNoFile;
    if (platform::SystemError const error =
            platform::CreateUniqueFile(path, kTemporaryPrefix, temporary, &file)) {
        failure = error;
        return error.code == platform::native::kDiskFull ? INI_ERR_WRITE_FAILED
                                                         : INI_ERR_CANT_WRITE_FILE;
    }
    // The replacement gets the target's permissions, or a new file's. Where the file system
    // refuses (some do not keep them), the file stays as it was created: for its owner only.
    (void)platform::CopyFilePermissions(exists ? path : nullptr, file);
    int status =
        toolbox::Guarded<int>(INI_ERR_OUT_OF_MEMORY, [&] { return fill(context, file, failure); });
    if (status >= 0)
        if ((failure = platform::FlushFile(file)))
            status = INI_ERR_WRITE_FAILED;
    if (platform::SystemError const closed = platform::CloseFile(file); closed && status >= 0) {
        failure = closed;
        status = INI_ERR_WRITE_FAILED;
    }
    if (status >= 0) {
        if (gBeforeReplaceHook)
            gBeforeReplaceHook(temporary.c_str());
        // One rename replaces the target: on Windows MoveFileExA with
        // MOVEFILE_REPLACE_EXISTING, so there is no moment without a target (deleting first
        // and then renaming would leave one).
        if ((failure = platform::RenameFile(temporary.c_str(), path, true)))
            status = INI_ERR_WRITE_FAILED;
    }
    if (status < 0)
        platform::RemoveFileOrDirectory(temporary.c_str());
    return status;
}

int WriteTextFile(IniHandle ini, char const* path, platform::SystemError& failure) {
    failure = {};
    if (!IsValid(ini) || !path || !*path)
        return INI_ERR_INVALID_ARGUMENT;
    return ReplaceFileAtomically(path, FillWithText, ini, failure);
}

int WriteToMemory(IniHandle ini, std::string& out, char const* lineEnd) {
    if (!IsValid(ini) || !lineEnd)
        return INI_ERR_INVALID_ARGUMENT;
    return toolbox::Guarded<int>(INI_ERR_OUT_OF_MEMORY, [&] {
        StringSink sink(out, lineEnd);
        return WriteAll(*ini, sink);
    });
}

} // namespace tekit::ini

using namespace tekit::ini;

extern "C" int TEKIT_STDCALL Ini_WriteGeneric(IniHandle ini, IniWriteLineCallback writeLine,
                                              void* data) {
    if (!IsValid(ini) || !writeLine)
        return INI_ERR_INVALID_ARGUMENT;
    return tekit::toolbox::Guarded<int>(INI_ERR_OUT_OF_MEMORY, [&] {
        CallbackSink sink(writeLine, data);
        return WriteAll(*ini, sink);
    });
}

extern "C" int TEKIT_STDCALL Ini_WriteToFile(IniHandle ini, char const* path) {
    tekit::platform::SystemError failure;
    return WriteTextFile(ini, path, failure);
}
