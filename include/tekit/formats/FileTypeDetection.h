// File-type detection: which of the three product file forms a file has, and its header.
//
//   FileWritingFormats format;
//   OVFileHeader header;
//   if (OVGetHeaderInformation(path, format, header, kHeaderInfoNoErrorIfUnknown))
//       std::printf("%s, version %d\n", header.GetType(), header.GetFileVersion());
//
//   long version = TEGetFileVersion(path);         // TE_BAD_FILE_FORMAT when unknown
//
// The file's first bytes decide: a binary header record ("TOF1") or an XML file whose root is
// the header element; failing both, the file is read as INI text (either binary INI form
// included) and its "__Header__" section must be valid. Detection only reads: it opens the
// file for reading, sharing read and delete access, and never retries, so a file that another
// stream holds for writing raises TE_SHARING_VIOLATION at once.
//
// Failures: a file of no known form raises TE_BAD_FILE_FORMAT (-17100) with the context
// "OVGetHeaderInformation" (or returns false with kHeaderInfoNoErrorIfUnknown); failures to
// open or read the file (missing, a directory, locked, unreadable) raise the binary file
// stream's errors.
#pragma once

#include "tekit/formats/OVFileHeader.h"

namespace tekit {

class Path;
class String;

/// Bits of OVGetHeaderInformation's options.
enum HeaderInformationOptions {
    kHeaderInfoDefault = 0,
    /// Only tell an INI file's form: the header is not filled from its header section.
    kHeaderInfoDetectFormatOnly = 1,
    /// A file of no known form returns false instead of raising.
    kHeaderInfoNoErrorIfUnknown = 2,
};
constexpr HeaderInformationOptions operator|(HeaderInformationOptions a,
                                             HeaderInformationOptions b) {
    return static_cast<HeaderInformationOptions>(static_cast<int>(a) | static_cast<int>(b));
}

/// Tells the file's form and reads its header: true with `format` and `header` set; a file
/// of no known form raises, or returns false (header invalid) with kHeaderInfoNoErrorIfUnknown.
/// With kHeaderInfoDetectFormatOnly an INI file's header is left invalid.
TEKIT_API bool OVGetHeaderInformation(Path const& path, FileWritingFormats& format,
                                      OVFileHeader& header, HeaderInformationOptions options);

/// The file's header; returns its form. A file of no known form raises.
TEKIT_API FileWritingFormats TEGetFileHeader(Path const& path, OVFileHeader& header);
/// The file's type ("SequenceFile", ...). A file of no known form raises.
TEKIT_API void TEGetFileType(Path const& path, String& type);
/// The file's format version. A file of no known form raises.
TEKIT_API long TEGetFileVersion(Path const& path);
/// True when the file has a valid header in any of the three forms, false when it is of no
/// known form; a file that cannot be opened or read still raises.
TEKIT_API bool TEIsValidOVFile(Path const& path);

} // namespace tekit
