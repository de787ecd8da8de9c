// Exceptions across COM boundaries.
//
// A COM entry point of the product catches TEException and returns a failed HRESULT with the
// exception published as the thread's COM error information; a caller of a COM method turns a
// failed HRESULT back into a TEException:
//
//   catch (TEException const& e) {
//       return SetErrorInfoForTEException(IID_IEngine, &e, nullptr);
//   }
//   ...
//   CheckHrIErrorInfo(engine->Run(), "Client::Run", TE_FILE_BASE_NAME);
#pragma once

#include "tekit/Export.h"
#include "tekit/errors/TEException.h"
#include "tekit/platform/WinTypes.h"

namespace tekit {

/// Publishes `exception` (its description, source and help context) as the thread's COM error
/// information for `interfaceId` and returns its HRESULT: the table's COM code of its TEError,
/// with a bare Win32 number n wrapped as 0x80070000 | n. A null exception gives E_FAIL.
/// `buffer` is accepted for existing callers and never written (its size is not known).
TEKIT_API HRESULT SetErrorInfoForTEException(GUID const& interfaceId, TEException const* exception,
                                             char* buffer);

/// Does nothing for a successful `hr`. For a failure it raises a TEException: the TEError that
/// SystemErrorCodeToTEError gives for `hr` (or for the Win32 number inside a 0x8007xxxx
/// HRESULT), else TE_OPERATION_FAILED; the description of the thread's error information, which
/// is consumed, or else the code's own message; the API error code `hr`.
TEKIT_API void CheckHrIErrorInfo(long hr);
/// The same, naming the caller's function and file in the exception.
TEKIT_API void CheckHrIErrorInfo(long hr, char const* function, char const* file);

} // namespace tekit
