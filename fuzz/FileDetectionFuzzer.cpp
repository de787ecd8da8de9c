// Fuzzes file-type detection over arbitrary files: the input is written to a file of its own,
// which OVGetHeaderInformation then reads in its three forms (binary header, XML header, INI
// text or a binary INI form).
//
// Detection of an unknown file returns false (it may raise only for damaged binary INI data);
// a valid result has a valid header unless only the format was asked for; the file is never
// changed.
#include "tekit/errors/TEException.h"
#include "tekit/formats/FileTypeDetection.h"
#include "tekit/paths/Path.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <string>

#if defined(_WIN32)
#include <process.h>
#define TEKIT_GETPID _getpid
#else
#include <unistd.h>
#define TEKIT_GETPID getpid
#endif

namespace {

using namespace tekit;

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

std::string const& FileName() {
    static std::string const name = [] {
        char const* directory = std::getenv("TMPDIR");
        return std::string(directory && *directory ? directory : "/tmp") + "/tekit-detection-" +
               std::to_string(TEKIT_GETPID()) + ".bin";
    }();
    return name;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    std::string const bytes(reinterpret_cast<char const*>(data), size);
    std::ofstream(FileName(), std::ios::binary | std::ios::trunc) << bytes;
    Path const path(FileName().c_str());
    for (HeaderInformationOptions options :
         {kHeaderInfoNoErrorIfUnknown, kHeaderInfoNoErrorIfUnknown | kHeaderInfoDetectFormatOnly}) {
        FileWritingFormats format = FileWritingFormats(0);
        OVFileHeader header;
        try {
            if (OVGetHeaderInformation(path, format, header, options)) {
                Check(format >= kTextFileFormat && format <= kXmlFileFormat);
                Check(header.ValidHeader() ||
                      (format == kTextFileFormat && (options & kHeaderInfoDetectFormatOnly)));
            } else {
                Check(!header.ValidHeader());
            }
        } catch (TEException const&) {
            // Damaged binary INI data (a bad compressed block) is raised as the INI reader's
            // error; nothing else may be.
            Check(size >= 12 && bytes.compare(0, 12, "OrvaneBinary") == 0);
        }
    }
    std::ifstream in(FileName(), std::ios::binary);
    Check(std::string(std::istreambuf_iterator<char>(in), {}) == bytes);
    return 0;
}
