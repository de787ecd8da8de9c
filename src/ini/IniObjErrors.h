// How IniObj reports failures: the store's status codes and failed system calls as TEErrors,
// with messages of the "ERR_DESCR" and "INI_ERRORS" tables.
#pragma once

#include "platform/SystemError.h"
#include "tekit/errors/TEError.h"
#include "tekit/strings/DynamicString.h"

#include <initializer_list>

namespace tekit::ini {

/// The "ERR_DESCR" message `key` with `arguments` as %1, %2, ... (filled from the last one
/// back, so a '%' in an argument is never taken for a placeholder).
DynamicString Message(char const* key, std::initializer_list<char const*> arguments);

/// The TEError that a status code of the store stands for.
TEError StatusToTEError(int status);

/// Raises `status` in `function` with the store's own message.
[[noreturn]] void RaiseStatus(int status, char const* function);

/// Raises a failed read of `path`: the file is missing (TE_FILE_NOT_FOUND, "CANT_FIND_FILE"),
/// cannot be opened (TE_UNABLE_TO_OPEN_FILE) or read (`readCode`), each with the read
/// elaboration; exhausted memory as TE_OUT_OF_MEMORY. `failure` is the failed call, if known.
[[noreturn]] void RaiseReadFailure(int status, platform::SystemError const& failure,
                                   char const* path, char const* function,
                                   TEError readCode = TE_IO_ERROR);

/// Raises a failed save of `path` by ReplaceFileAtomically's `status` and `failure`: a
/// read-only target with its own elaboration, a failed call as the TEError of its native error
/// (a full disk is TE_DISK_FULL), other refusals as TE_ACCESS_DENIED or TE_IO_ERROR.
[[noreturn]] void RaiseWriteFailure(int status, platform::SystemError const& failure,
                                    char const* path, char const* function);

/// Raises TE_BAD_FILE_FORMAT in `function`: "'path' is not a valid binary INI file: reason".
[[noreturn]] void RaiseBadBinaryFile(char const* path, DynamicString const& reason,
                                     char const* function);

} // namespace tekit::ini
