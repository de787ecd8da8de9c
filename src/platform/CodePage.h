// The process's ANSI code page and the lead bytes of double-byte code pages.
#pragma once

namespace tekit::platform {

/// The process's ANSI code page: GetACP() on Windows; 0 (single-byte) elsewhere.
unsigned GetAnsiCodePage();
/// Fills `isLead` with the lead bytes of `codePage`; false when the code page is unknown.
bool GetLeadBytes(unsigned codePage, bool (&isLead)[256]);

} // namespace tekit::platform
