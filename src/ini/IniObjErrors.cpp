// IniObj's failures as TEExceptions: codes and messages.
#include "ini/IniObjErrors.h"

#include "errors/NativeError.h"
#include "platform/File.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/ini/Ini.h"

#include <vector>

namespace tekit::ini {

namespace {

bool IsMissing(platform::SystemError const& error) {
    return error.code == platform::native::kFileNotFound ||
           error.code == platform::native::kPathNotFound;
}

/// The store's message for `status` ("INI_ERRORS").
DynamicString StatusMessage(int status) {
    char const* const key = Ini_GetErrorKey(status);
    return DynamicString(key ? static_cast<char const*>(RString("INI_ERRORS", key))
                             : static_cast<char const*>(TEErrorToRString(StatusToTEError(status))));
}

[[noreturn]] void Raise(TEError code, DynamicString const& description, char const* function,
                        platform::SystemError const& failure) {
    if (failure)
        TE_RAISE_API(code, description, function, failure.apiFunction, failure.code);
    TE_RAISE(code, description, function);
}

} // namespace

DynamicString Message(char const* key, std::initializer_list<char const*> arguments) {
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", key)), true);
    std::vector<char const*> const values(arguments);
    for (long n = static_cast<long>(values.size()); n > 0; --n)
        message.Format(values[static_cast<std::size_t>(n - 1)], n);
    return message;
}

TEError StatusToTEError(int status) {
    switch (status) {
    case INI_ERR_CANT_OPEN_FILE:
        return TE_UNABLE_TO_OPEN_FILE;
    case INI_ERR_CANT_READ_FILE:
    case INI_ERR_WRITE_FAILED:
        return TE_IO_ERROR;
    case INI_ERR_CANT_WRITE_FILE:
        return TE_ACCESS_DENIED;
    case INI_ERR_TOO_MANY_LINES:
        return TE_TOO_MANY_ITEMS;
    case INI_ERR_OUT_OF_MEMORY:
        return TE_OUT_OF_MEMORY;
    default: // values that do not convert, invalid arguments, data too large
        return TE_INVALID_OR_OUT_OF_RANGE;
    }
}

void RaiseStatus(int status, char const* function) {
    TE_RAISE(StatusToTEError(status), StatusMessage(status), function);
}

void RaiseReadFailure(int status, platform::SystemError const& failure, char const* path,
                      char const* function, TEError readCode) {
    if (status == INI_ERR_OUT_OF_MEMORY)
        RaiseStatus(status, function);
    DynamicString description;
    TEError code = readCode;
    platform::FileInfo info;
    if (status == INI_ERR_CANT_OPEN_FILE) {
        platform::SystemError const queried = platform::QueryFile(path, info);
        bool const missing = failure ? IsMissing(failure) : (queried && IsMissing(queried));
        code = missing ? TE_FILE_NOT_FOUND : TE_UNABLE_TO_OPEN_FILE;
        description = Message(missing ? "CANT_FIND_FILE" : "TE_UNABLE_TO_OPEN_FILE_DESC", {path});
    } else {
        description = Message("CANT_READ_FILE_1", {path});
    }
    description += " ";
    description += RString("ERR_DESCR", "TE_CANT_READ_FILE_ELAB");
    Raise(code, description, function, failure);
}

void RaiseWriteFailure(int status, platform::SystemError const& failure, char const* path,
                       char const* function) {
    if (status != INI_ERR_CANT_WRITE_FILE && status != INI_ERR_WRITE_FAILED)
        RaiseStatus(status, function);
    platform::FileInfo info;
    bool const readOnly =
        !failure && !platform::QueryFile(path, info) && info.isReadOnly && !info.isDirectory;
    TEError const code = failure ? detail::NativeErrorToTEError(failure, StatusToTEError(status))
                                 : StatusToTEError(status);
    Raise(
        code,
        Message(readOnly ? "TE_CANT_WRITE_READONLY_FILE_ELAB" : "TE_CANT_WRITE_FILE_ELAB", {path}),
        function, failure);
}

void RaiseBadBinaryFile(char const* path, DynamicString const& reason, char const* function) {
    TE_RAISE(TE_BAD_FILE_FORMAT,
             Message("INI_BINARY_MALFORMED_1_2", {path, reason.GetBufferReadPtr()}), function);
}

} // namespace tekit::ini
