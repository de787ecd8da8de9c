// TEException: the library's one exception type, its fields, reporting and COM translation.
#include "tekit/errors/TEException.h"

#include "errors/Warning.h"
#include "tekit/errors/DebugOutput.h"

#include <exception>
#include <ostream>
#include <sstream>
#include <string>

namespace tekit {

namespace {

char const* Text(char const* text) {
    return text ? text : "";
}

} // namespace

TEException::TEException() = default;

TEException::TEException(char const* description, char const* function, TEError code,
                         bool debugOnConstruction, char const* apiFunction, long apiErrorCode,
                         char const* source, char const* file, long line, char const* date,
                         char const* time) {
    Init(function, code, apiFunction, apiErrorCode, source, file, line, date, time);
    if (description && *description)
        m_description = description;
    Finish(debugOnConstruction);
}

TEException::TEException(String const& description, char const* function, TEError code,
                         bool debugOnConstruction, char const* apiFunction, long apiErrorCode,
                         char const* source, char const* file, long line, char const* date,
                         char const* time) {
    Init(function, code, apiFunction, apiErrorCode, source, file, line, date, time);
    m_description = description;
    Finish(debugOnConstruction);
}

TEException::TEException(TEException const& other) = default;
TEException& TEException::operator=(TEException const& other) = default;
TEException::~TEException() = default;

void TEException::Init(char const* function, TEError code, char const* apiFunction,
                       long apiErrorCode, char const* source, char const* file, long line,
                       char const* date, char const* time) {
    m_errorCode = code;
    m_functionName = Text(function);
    m_apiFunctionName = Text(apiFunction);
    m_apiErrorCode = std::int32_t(apiErrorCode);
    m_source = Text(source);
    m_fileName = Text(file);
    m_line = std::int32_t(line);
    m_compilationDate = Text(date);
    m_compilationTime = Text(time);
}

/// A raise without a description shows the code's own message.
void TEException::Finish(bool debugOnConstruction) {
    if (m_description.IsEmpty() && m_errorCode != TE_NO_ERROR)
        m_description = TEErrorToRString(m_errorCode).GetString();
    if (debugOnConstruction)
        Debug("Debugging When Exception Constructed", nullptr);
}

// ---- Numbers ------------------------------------------------------------------------------

void TEException::SetLine(long line) {
    m_line = std::int32_t(line);
}
long TEException::GetLine() const {
    return m_line;
}
void TEException::SetErrorCode(TEError code) {
    m_errorCode = code;
}
TEError TEException::GetErrorCode() const {
    return m_errorCode;
}
void TEException::SetAPIErrorCode(long code) {
    m_apiErrorCode = std::int32_t(code);
}
long TEException::GetAPIErrorCode() const {
    return m_apiErrorCode;
}

// ---- Texts --------------------------------------------------------------------------------

#define TE_EXCEPTION_TEXT_FIELD(Name, member)                                                      \
    void TEException::Set##Name(String const& value) {                                             \
        member = value;                                                                            \
    }                                                                                              \
    void TEException::Set##Name(char const* value) {                                               \
        member = Text(value);                                                                      \
    }                                                                                              \
    void TEException::Get##Name(String& value) const {                                             \
        value.Assign(member);                                                                      \
    }                                                                                              \
    char const* TEException::Get##Name() const {                                                   \
        return member.GetBufferReadPtr();                                                          \
    }

TE_EXCEPTION_TEXT_FIELD(FunctionName, m_functionName)
TE_EXCEPTION_TEXT_FIELD(APIFunctionName, m_apiFunctionName)
TE_EXCEPTION_TEXT_FIELD(Description, m_description)
TE_EXCEPTION_TEXT_FIELD(CompilationDate, m_compilationDate)
TE_EXCEPTION_TEXT_FIELD(CompilationTime, m_compilationTime)
TE_EXCEPTION_TEXT_FIELD(FileName, m_fileName)
TE_EXCEPTION_TEXT_FIELD(Source, m_source)

#undef TE_EXCEPTION_TEXT_FIELD

void TEException::PrependToDescription(String const& text) {
    m_description.InsertSubstring(text, 0);
}

void TEException::AppendToDescription(String const& text) {
    m_description += text;
}

// ---- Help ---------------------------------------------------------------------------------

void TEException::SetWinHelpID(unsigned long helpID) {
    m_winHelpID = std::uint32_t(helpID);
}
unsigned long TEException::GetWinHelpID() const {
    return m_winHelpID;
}
void TEException::SetWinHelpFile(String const& helpFile) {
    m_winHelpFile = helpFile;
}
char const* TEException::GetWinHelpFile() const {
    return m_winHelpFile.GetBufferReadPtr();
}
void TEException::GetWinHelpFile(String& helpFile) const {
    helpFile.Assign(m_winHelpFile);
}

// ---- Reporting ----------------------------------------------------------------------------

void TEException::Debug(char const* prefix, std::ostream* stream) const {
    std::ostringstream dump;
    if (prefix)
        dump << prefix << '\n';
    dump << "  Error Code: " << int(m_errorCode) << " (" << TEErrorToStringSymbol(m_errorCode)
         << ")\n"
         << "  Description: " << GetDescription() << '\n'
         << "  Function: " << GetFunctionName() << '\n'
         << "  API Function: " << GetAPIFunctionName() << '\n'
         << "  API Error Code: " << m_apiErrorCode << '\n'
         << "  Source: " << GetSource() << '\n'
         << "  File: " << GetFileName() << '\n'
         << "  Line: " << m_line << '\n'
         << "  Compilation Date: " << GetCompilationDate() << '\n'
         << "  Compilation Time: " << GetCompilationTime() << '\n'
         << "  Help ID: " << m_winHelpID << '\n'
         << "  Help File: " << GetWinHelpFile() << '\n';
    if (stream)
        *stream << dump.str();
    else
        FlushStringStreamToCDebug(dump);
}

namespace {

/// The warning text for what a destructor caught; a TEException also names its API function.
std::string DescribeCaught(DynamicString& apiFunction, long& apiErrorCode) {
    std::string const lead = "Exception caught in destructor: ";
    std::exception_ptr const caught = std::current_exception();
    try {
        if (caught)
            std::rethrow_exception(caught);
    } catch (TEException const& e) {
        apiFunction = e.GetAPIFunctionName();
        apiErrorCode = e.GetAPIErrorCode();
        return lead + e.GetDescription() + " (error " + std::to_string(int(e.GetErrorCode())) +
               " " + TEErrorToStringSymbol(e.GetErrorCode()) + " raised in " + e.GetFunctionName() +
               ", file " + e.GetFileName() + ", line " + std::to_string(e.GetLine()) + ")";
    } catch (std::exception const& e) {
        return lead + e.what();
    } catch (...) {
    }
    return lead + "unknown exception";
}

} // namespace

void TEException::HandleDestructorException(char const* function, char const* file, long line,
                                            char const* date, char const* time) noexcept {
    try {
        DynamicString apiFunction;
        long apiErrorCode = 0;
        std::string const message = DescribeCaught(apiFunction, apiErrorCode);
        detail::WriteWarning(message.c_str(), function,
                             apiFunction.IsEmpty() ? nullptr : apiFunction.GetBufferReadPtr(),
                             apiErrorCode, file, line, date, time);
    } catch (...) {
        // Reporting failed (out of memory): the exception is dropped, as it must be.
    }
}

} // namespace tekit
