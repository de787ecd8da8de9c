// Fuzzes OVFileHeader::Read over arbitrary bytes: the XML path (byte-order mark, prolog, the
// root element's attributes) and the binary record.
//
//   byte 0     where the header starts in the stream (0 .. 3 bytes of prefix)
//   the rest   the stream's contents after the prefix
//
// Reading never raises for the stream's contents. Every text field ends within its field; a
// valid binary header leaves the stream just after its 1296 bytes; a valid header written
// again in the form it was read in reads back to the same record.
#include "tekit/errors/TEException.h"
#include "tekit/formats/OVFileHeader.h"
#include "tekit/streams/OVMemoryStream.h"

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace {

using namespace tekit;

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

bool Terminated(char const* field, std::size_t size) {
    return std::memchr(field, 0, size) != nullptr;
}

void CheckFields(OVFileHeader const& h) {
    for (char const* field : {h.GetType(), h.GetProductName(), h.GetProductVersion(),
                              h.GetCompatibleVersion(), h.GetBuildVersion()})
        Check(Terminated(field, OVFileHeader::kTextFieldSize));
    Check(Terminated(h.GetOrigFilePath(), OVFileHeader::kPathFieldSize));
}

/// Only printable ASCII is sure to survive the trip through UTF-8 and XML escaping unchanged.
bool PrintableAscii(OVFileHeader const& h) {
    for (char const* field : {h.GetType(), h.GetProductName(), h.GetProductVersion(),
                              h.GetCompatibleVersion(), h.GetBuildVersion(), h.GetOrigFilePath()})
        for (char const* p = field; *p; ++p)
            if (*p < 0x20 || *p > 0x7E)
                return false;
    return true;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    if (size == 0)
        return 0;
    unsigned const prefix = data[0] % 4;
    OVMemoryStream stream;
    stream.WriteBytes("\0\0\0", prefix);
    stream.WriteBytes(data + 1, static_cast<unsigned>(size - 1));
    stream.SetOffset(prefix);

    OVFileHeader header;
    bool isXml = false;
    int extra = -1;
    header.Read(&stream, isXml, &extra); // raises nothing for any contents
    CheckFields(header);
    Check(extra >= 0);
    if (!header.ValidHeader())
        return 0;
    if (!isXml)
        Check(stream.GetOffset() == prefix + OVFileHeader::kSize);
    else
        Check(stream.GetOffset() > prefix && stream.GetOffset() <= stream.GetSize());

    if (isXml && !PrintableAscii(header))
        return 0;
    OVMemoryStream again;
    header.Write(&again, isXml);
    again.SetOffset(0);
    OVFileHeader back;
    bool backIsXml = !isXml;
    back.Read(&again, backIsXml, nullptr);
    Check(backIsXml == isXml && back.ValidHeader());
    // From version 773 on the XML form drops the saved-from path that an input may carry.
    bool const pathDropped =
        isXml && header.GetFileVersion() >= OVFileHeader::kFirstVersionWithoutPath;
    std::size_t const compared =
        pathDropped ? OVFileHeader::kSize - OVFileHeader::kPathFieldSize : OVFileHeader::kSize;
    Check(std::memcmp(back.GetBytes(), header.GetBytes(), compared) == 0);
    Check(!pathDropped || back.GetOrigFilePath()[0] == '\0');
    return 0;
}
