// File-type detection: the header record or element at the start of a file, else an INI file's
// header section.
#include "tekit/formats/FileTypeDetection.h"

#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/errors/TEException.h"
#include "tekit/ini/IniHeader.h"
#include "tekit/paths/Path.h"
#include "tekit/streams/OVBinaryFileStream.h"
#include "tekit/strings/DynamicString.h"

namespace tekit {

namespace {

/// Reads the header at the start of the file; false when there is none in either form.
bool ReadFileHeader(Path const& path, FileWritingFormats& format, OVFileHeader& header) {
    // Sharing delete access, so that detection never keeps another program from removing the
    // file; no retry, so that a locked file is reported at once.
    OVBinaryFileStream file(path.CStr(), kOVFileStreamOpenForRead, true, 0, false);
    bool isXml = false;
    header.Read(&file, isXml, nullptr);
    if (!header.ValidHeader())
        return false;
    format = isXml ? kXmlFileFormat : kBinaryFileFormat;
    return true;
}

/// The file read as INI text or a binary INI form; false when its header section is not valid.
/// Text that the INI reader refuses is no INI file; failures of the file itself and of memory
/// are raised.
bool ReadIniHeader(Path const& path, IniHeader& iniHeader) {
    try {
        iniHeader.Read(path);
    } catch (TEException const& e) {
        TEError const code = e.GetErrorCode();
        if (code == TE_OUT_OF_MEMORY || (code <= TE_IO_ERROR && code > TE_IO_ERROR - 100))
            throw;
        return false;
    }
    return iniHeader.IsValid();
}

} // namespace

bool OVGetHeaderInformation(Path const& path, FileWritingFormats& format, OVFileHeader& header,
                            HeaderInformationOptions options) {
    if (ReadFileHeader(path, format, header))
        return true;
    header.Clear();
    IniHeader iniHeader;
    if (!ReadIniHeader(path, iniHeader)) {
        if (options & kHeaderInfoNoErrorIfUnknown)
            return false;
        DynamicString message(
            static_cast<char const*>(RString("ERR_DESCR", "FILE_FORMAT_UNKNOWN_1")), true);
        message.Format(path.CStr(), 1);
        TE_RAISE(TE_BAD_FILE_FORMAT, message, "OVGetHeaderInformation");
    }
    if (!(options & kHeaderInfoDetectFormatOnly))
        header.SetDataFromIniHeader(iniHeader);
    format = kTextFileFormat;
    return true;
}

FileWritingFormats TEGetFileHeader(Path const& path, OVFileHeader& header) {
    FileWritingFormats format = kBinaryFileFormat;
    OVGetHeaderInformation(path, format, header, kHeaderInfoDefault);
    return format;
}

void TEGetFileType(Path const& path, String& type) {
    OVFileHeader header;
    TEGetFileHeader(path, header);
    type.Assign(header.GetType());
}

long TEGetFileVersion(Path const& path) {
    OVFileHeader header;
    TEGetFileHeader(path, header);
    return header.GetFileVersion();
}

bool TEIsValidOVFile(Path const& path) {
    OVFileHeader header;
    FileWritingFormats format = kBinaryFileFormat;
    return OVGetHeaderInformation(path, format, header, kHeaderInfoNoErrorIfUnknown);
}

} // namespace tekit
