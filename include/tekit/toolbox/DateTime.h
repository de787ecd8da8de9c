// The current local date and time as text in the international (ISO 8601) form, the same
// whatever the user's regional settings, for logs and reports read everywhere.
//
//   char date[11], time[9];
//   InternationalDate(date, sizeof date);     // "2024-03-07"
//   InternationalTime(time, sizeof time);     // "14:05:09"
#pragma once

#include "tekit/Export.h"

/// Writes today's local date as "YYYY-MM-DD" and a terminator (11 bytes); returns 10. A null
/// buffer or one smaller than 11 bytes gives TE_INVALID_POINTER or TE_INVALID_OR_OUT_OF_RANGE
/// and is not written.
extern "C" TEKIT_API int TEKIT_STDCALL InternationalDate(char* buffer, int bufferSize);
/// Writes the local time of day as "HH:MM:SS" (24 hours) and a terminator (9 bytes); returns
/// 8, with the failures of InternationalDate.
extern "C" TEKIT_API int TEKIT_STDCALL InternationalTime(char* buffer, int bufferSize);
