// TEException: the one exception class of the library, thrown by value.
//
// It carries a TEError, the message shown to the user, and where the failure was raised: the
// qualified function name, the source file's base name, the line and the file's compilation
// date and time. An operating-system or outside function whose failure caused this one is
// named with its error code. Raise sites use the macros of Raise.h:
//
//   try {
//       stream.ReadInt("count", &count);
//   } catch (TEException const& e) {
//       if (e.GetErrorCode() == TE_BAD_FILE_FORMAT)
//           Report(e.GetDescription());
//   }
//
// Copying is cheap: the texts share their blocks.
#pragma once

#include "tekit/Export.h"
#include "tekit/errors/TEError.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <cstdint>
#include <iosfwd>

namespace tekit {

class Path;

class TEKIT_API TEException {
public:
    /// Code 0, every text empty, line 0.
    TEException();
    /// A null or empty `description` with a non-zero code takes the code's own message. A null
    /// text is taken as empty. With `debugOnConstruction` the new exception writes its Debug
    /// dump ("Debugging When Exception Constructed") to the debug output at once.
    TEException(char const* description, char const* function, TEError code,
                bool debugOnConstruction, char const* apiFunction, long apiErrorCode,
                char const* source, char const* file, long line, char const* date,
                char const* time);
    TEException(String const& description, char const* function, TEError code,
                bool debugOnConstruction, char const* apiFunction, long apiErrorCode,
                char const* source, char const* file, long line, char const* date,
                char const* time);
    TEException(TEException const& other);
    TEException& operator=(TEException const& other);

    // The virtual operations, in slot order.
    virtual ~TEException();
    virtual void SetLine(long line);
    virtual long GetLine() const;
    virtual void SetErrorCode(TEError code);
    virtual TEError GetErrorCode() const;
    virtual void SetAPIErrorCode(long code);
    virtual long GetAPIErrorCode() const;
    virtual void SetFunctionName(String const& name);
    virtual void SetFunctionName(char const* name);
    virtual void GetFunctionName(String& name) const;
    virtual char const* GetFunctionName() const;
    virtual void SetAPIFunctionName(String const& name);
    virtual void SetAPIFunctionName(char const* name);
    virtual void GetAPIFunctionName(String& name) const;
    virtual char const* GetAPIFunctionName() const;
    virtual void SetDescription(String const& description);
    virtual void SetDescription(char const* description);
    virtual void GetDescription(String& description) const;
    virtual char const* GetDescription() const;
    virtual void SetCompilationDate(String const& date);
    virtual void SetCompilationDate(char const* date);
    virtual void GetCompilationDate(String& date) const;
    virtual char const* GetCompilationDate() const;
    virtual void SetCompilationTime(String const& time);
    virtual void SetCompilationTime(char const* time);
    virtual void GetCompilationTime(String& time) const;
    virtual char const* GetCompilationTime() const;
    virtual void SetFileName(String const& file);
    virtual void SetFileName(char const* file);
    virtual void GetFileName(String& file) const;
    virtual char const* GetFileName() const;
    virtual void SetSource(String const& source);
    virtual void SetSource(char const* source);
    virtual void GetSource(String& source) const;
    virtual char const* GetSource() const;
    virtual void PrependToDescription(String const& text);
    virtual void AppendToDescription(String const& text);
    virtual void SetWinHelpID(unsigned long helpID);
    virtual unsigned long GetWinHelpID() const;
    // The help file is a path of at most 260 characters; the String forms take and give the
    // same text.
    virtual void SetWinHelpFile(Path const& helpFile);
    virtual void SetWinHelpFile(String const& helpFile);
    virtual char const* GetWinHelpFile() const;
    virtual void GetWinHelpFile(Path& helpFile) const;
    virtual void GetWinHelpFile(String& helpFile) const;
    /// Writes every field, one per line, after the line `prefix` (null: no prefix line); a null
    /// `stream` sends the dump to the debug output.
    virtual void Debug(char const* prefix, std::ostream* stream) const;

    /// For a catch block inside a destructor, where nothing may be thrown: reports what was
    /// caught (a TEException's fields, a std::exception's what(), or "unknown exception") to
    /// the debug output as a warning naming this function, file and line, whatever the
    /// diagnostic level, because an exception lost in a destructor is always a defect. Never
    /// throws.
    static void HandleDestructorException(char const* function, char const* file, long line,
                                          char const* date, char const* time) noexcept;

private:
    void Init(char const* function, TEError code, char const* apiFunction, long apiErrorCode,
              char const* source, char const* file, long line, char const* date, char const* time);
    void Finish(bool debugOnConstruction);

    TEError m_errorCode = TE_NO_ERROR;
    DynamicString m_description;
    DynamicString m_functionName;
    DynamicString m_apiFunctionName;
    std::int32_t m_apiErrorCode = 0;
    DynamicString m_source;
    DynamicString m_fileName;
    std::int32_t m_line = 0;
    DynamicString m_compilationDate;
    DynamicString m_compilationTime;
    std::uint32_t m_winHelpID = 0;
    StaticString<260> m_winHelpFile;
};

} // namespace tekit
