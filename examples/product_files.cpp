// Writes one small "SequenceFile" in each of the product's three file forms, through the public
// interface only, then reads each back with the file-type detection:
//
//   product_files [DIR]      # DIR/sequence.seq, DIR/sequence.xml, DIR/sequence.ini
//
// binary  the 1296-byte header record, then stream values (OVBinaryFileStream)
// XML     the header as the root element, the values as elements (OVXmlMemoryStream)
// INI     a "__Header__" section, then sections of items (IniObj, IniHeader)
//
// The output is the same on every run: no times, and format version 773, from which on the
// path a file was saved from is no longer recorded. The checked-in examples/files/ are this
// program's output (INI text has the platform's line ends).
#include "tekit/tekit.h"

#include <cstdio>
#include <iterator>
#include <string>

using namespace tekit;

namespace {

char const kType[] = "SequenceFile";
int const kFormatVersion = 773;
char const kProductVersion[] = "4.2.1.77";
char const kCompatibleVersion[] = "4.2";
char const kBuildVersion[] = "4.2.1f1";

/// A sequence of two steps: what each form holds.
struct Step {
    char const* name;
    double limit;
    bool enabled;
};
Step const kSteps[] = {{"Power on", 5.0, true}, {"Measure & log", 0.25, false}};

OVFileHeader Header() {
    OVFileHeader header;
    header.SetData(kType, kFormatVersion, IniHeader::kProductName, kProductVersion,
                   kCompatibleVersion, kBuildVersion, nullptr);
    return header;
}

/// The values in the order a reader takes them; the names become elements in XML.
void WriteSteps(OVStream& stream) {
    stream.WriteInt("NumSteps", static_cast<int>(std::size(kSteps)));
    for (Step const& step : kSteps) {
        stream.WriteString("Name", DynamicString(step.name));
        stream.WriteDouble("Limit", step.limit);
        stream.WriteBool("Enabled", step.enabled);
    }
}

void WriteBinary(std::string const& file) {
    OVBinaryFileStream out(file.c_str(), kOVFileStreamCreateForWrite);
    Header().Write(&out, false);
    WriteSteps(out);
    out.Flush();
}

void WriteXml(std::string const& file) {
    OVXmlMemoryStream xml;
    OVFileHeader const header = Header();
    header.Write(&xml, true);
    xml.WriteElementStart("Steps");
    WriteSteps(xml);
    xml.WriteElementEnd("Steps");
    OVFileHeader::WriteEndOfXmlFile(&xml);
    OVBinaryFileStream out(file.c_str(), kOVFileStreamCreateForWrite);
    out.WriteStream(xml, 0, OVStream::kToEnd);
    out.Flush();
}

void WriteIni(std::string const& file) {
    IniObj ini;
    IniHeader header(kType, kProductVersion, kCompatibleVersion, kFormatVersion,
                     "Two steps of an example sequence", Path(""));
    header.SetProductDisplayVersion(kBuildVersion);
    header.Write(ini);
    ini.Set("Steps", "NumSteps", static_cast<long>(std::size(kSteps)));
    int index = 0;
    for (Step const& step : kSteps) {
        std::string const section = "Step" + std::to_string(index++);
        ini.Set(section.c_str(), "Name", step.name);
        ini.Set(section.c_str(), "Limit", step.limit);
        ini.Set(section.c_str(), "Enabled", step.enabled);
    }
    ini.WriteFile(Path(file.c_str()));
}

} // namespace

int main(int argc, char** argv) {
    std::string const directory = argc > 1 ? argv[1] : ".";
    try {
        for (char const* name : {"sequence.seq", "sequence.xml", "sequence.ini"}) {
            std::string const file = directory + "/" + name;
            std::string const extension = file.substr(file.size() - 3);
            if (extension == "seq")
                WriteBinary(file);
            else if (extension == "xml")
                WriteXml(file);
            else
                WriteIni(file);
            OVFileHeader header;
            FileWritingFormats const format = TEGetFileHeader(Path(file.c_str()), header);
            std::printf("%s: %s, %s version %d, written by %s %s\n", file.c_str(),
                        format == kBinaryFileFormat ? "binary"
                        : format == kXmlFileFormat  ? "XML"
                                                    : "INI text",
                        header.GetType(), header.GetFileVersion(), header.GetProductName(),
                        header.GetProductVersion());
        }
    } catch (TEException const& e) {
        std::fprintf(stderr, "product_files: %s (%s)\n", e.GetDescription(), e.GetFunctionName());
        return 1;
    }
    return 0;
}
