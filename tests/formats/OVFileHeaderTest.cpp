// The header record, its binary and XML forms against hand-built bytes, and reading them back.
#include "tekit/formats/OVFileHeader.h"

#include "support/MultiByteFixture.h"
#include "tekit/streams/OVMemoryStream.h"
#include "tekit/toolbox/Version.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

namespace tekit {
namespace {

std::string Bytes(OVMemoryStream const& s) {
    return std::string(reinterpret_cast<char const*>(s.GetDataPtr()), s.GetSize());
}

OVFileHeader Sample(int version, char const* type = "SequenceFile", char const* compat = "4.2.1") {
    OVFileHeader h;
    h.SetData(type, version, "Orvane", "4.2.1.77", compat, "4.2.1f1", "C:\\seq\\a.seq");
    return h;
}

std::string Written(OVFileHeader const& h, bool asXml) {
    OVMemoryStream out;
    h.Write(&out, asXml);
    return Bytes(out);
}

/// Reads a header from `bytes`; `isXml` starts as the opposite of `expectXml`.
OVFileHeader ReadFrom(std::string const& bytes, bool& isXml, bool expectXml = false) {
    OVMemoryStream s;
    s.WriteBytes(bytes.data(), static_cast<unsigned>(bytes.size()));
    s.SetOffset(0);
    OVFileHeader h;
    isXml = !expectXml;
    h.Read(&s, isXml, nullptr);
    return h;
}

TEST(OVFileHeader, ClearedAndSetRecordsHaveTheBinaryLayout) {
    std::string expected(1296, '\0');
    expected.replace(0, 4, "XXXX");
    EXPECT_EQ(std::string(reinterpret_cast<char const*>(OVFileHeader().GetBytes()), 1296),
              expected);
    expected.replace(0, 4, "TOF1");
    expected.replace(10, 12, "SequenceFile");
    expected.replace(60, 4, std::string("\x04\x03\0\0", 4)); // 772 little-endian
    expected.replace(64, 6, "Orvane");
    expected.replace(114, 8, "4.2.1.77");
    expected.replace(164, 5, "4.2.1");
    expected.replace(214, 7, "4.2.1f1");
    expected.replace(272, 12, "C:\\seq\\a.seq");
    OVFileHeader h = Sample(772);
    EXPECT_EQ(Written(h, false), expected);
    EXPECT_TRUE(h.ValidHeader());
    h.MarkAsInvalid();
    EXPECT_FALSE(h.ValidHeader());
    EXPECT_STREQ(h.GetType(), "SequenceFile");
}

class OVFileHeaderText : public testing::MultiByteFixture {};

TEST_F(OVFileHeaderText, SetDataCutsTextsToTheirFieldsAndKeepsThePathBelow773) {
    std::string const fifty(50, 't'), longPath(1100, 'p');
    OVFileHeader h;
    h.SetData(fifty.c_str(), 772, nullptr, "", fifty.c_str(), "b", longPath.c_str());
    EXPECT_EQ(std::string(h.GetType()), fifty.substr(0, 49));
    EXPECT_EQ(std::string(h.GetCompatibleVersion()), fifty.substr(0, 49));
    EXPECT_EQ(std::string(h.GetOrigFilePath()), longPath.substr(0, 1023));
    UseShiftJis(); // never in the middle of a double-byte character
    h.SetData((std::string(48, 'a') + "\x82\xA0").c_str(), 773, "", "", "", "", "C:\\a.seq");
    EXPECT_EQ(std::string(h.GetType()), std::string(48, 'a'));
    EXPECT_STREQ(h.GetOrigFilePath(), "");
}

TEST(OVFileHeader, XmlFormHasTheDocumentedBytes) {
    std::string const start = "\xEF\xBB\xBF<?xml version=\"1.0\" encoding=\"UTF-8\"?>\r\n"
                              "<orvanefileheader type='SequenceFile' fileversion='77";
    std::string const fields = "' productname='Orvane' productversion='4.2.1.77' "
                               "compatibleversion='4.2.1' buildversion='4.2.1f1' ";
    std::string const end = "xmlns:xsi='http://www.w3.org/2001/XMLSchema-instance' "
                            "xmlns='http://www.orvane.example/Orvane/4.2/SequenceFile'>\r\n";
    EXPECT_EQ(Written(Sample(772), true),
              start + "2" + fields + "origfilepath='C:\\seq\\a.seq' " + end);
    EXPECT_EQ(Written(Sample(773), true), start + "3" + fields + end);
    OVMemoryStream tail;
    OVFileHeader::WriteEndOfXmlFile(&tail);
    EXPECT_EQ(Bytes(tail), "</orvanefileheader>\r\n");

    // The namespace: the type's kind, the compatible version up to its second period.
    struct Case {
        char const *type, *compatible, *path;
    } const cases[] = {
        {"SequenceFile", "4.2.1.77", "/4.2/SequenceFile'"},
        {"SequenceFile", "4", "/4/SequenceFile'"},
        {"StationGlobals", "", "//PropertyObjectFile'"},
        {"sequencefile", "5.0", "/5.0/PropertyObjectFile'"},
    };
    for (Case const& c : cases)
        EXPECT_NE(Written(Sample(773, c.type, c.compatible), true)
                      .find(std::string("xmlns='http://www.orvane.example/Orvane") + c.path),
                  std::string::npos)
            << c.type << " " << c.compatible;
}

TEST(OVFileHeader, BothFormsReadBackAndLeaveTheStreamAfterTheHeader) {
    for (bool asXml : {false, true}) {
        OVMemoryStream s;
        s.WriteBytes("abc", 3); // the header need not start at offset 0
        OVFileHeader const written = Sample(772);
        written.Write(&s, asXml);
        unsigned const end = s.GetOffset();
        s.WriteInt("", 42);
        s.SetOffset(3);
        OVFileHeader read;
        bool isXml = !asXml;
        int extra = -1;
        read.Read(&s, isXml, &extra);
        EXPECT_EQ(isXml, asXml);
        EXPECT_EQ(std::memcmp(read.GetBytes(), written.GetBytes(), 1296), 0);
        // The XML form stops just after the start tag's ">", before its line end, and counts
        // the line ends before it (the prolog's).
        EXPECT_EQ(s.GetOffset(), asXml ? end - 2 : end);
        EXPECT_EQ(extra, asXml ? 1 : 0);
    }
    std::string const xml =
        "<!-- by hand -->\n<orvanefileheader fileversion=\"-3\" type=\"A&amp;B\" "
        "productname='" +
        std::string(60, 'n') + "'>\n<x/>";
    bool isXml = false;
    OVFileHeader const h = ReadFrom(xml, isXml, true);
    ASSERT_TRUE(isXml && h.ValidHeader());
    EXPECT_STREQ(h.GetType(), "A&B");
    EXPECT_EQ(h.GetFileVersion(), -3);
    EXPECT_EQ(std::string(h.GetProductName()), std::string(49, 'n')); // cut to its field
}

TEST(OVFileHeader, BadHeadersReadAsInvalidWithoutRaising) {
    std::string const root = "<orvanefileheader type='T' fileversion='7'";
    std::string nesting;
    for (int i = 0; i < 3500000; ++i)
        nesting += "<a>";
    struct Case {
        char const* what;
        std::string bytes;
        bool isXml, valid;
    } const cases[] = {
        {"empty", "", false, false},
        {"short binary", std::string("TOF1\0", 5) + std::string(1000, '\0'), false, false},
        {"byte-order mark alone", "\xEF\xBB\xBF", false, false},
        {"type missing", "<orvanefileheader fileversion='7'>", true, false},
        {"fileversion missing", "<orvanefileheader type='T'>", true, false},
        {"fileversion no integer", "<orvanefileheader type='T' fileversion='7x'>", true, false},
        {"repeated attribute", root + " type='U'>", true, false},
        {"start tag cut", root, true, false},
        {"start tag beyond 10 KiB", "<orvanefileheader" + std::string(20000, ' ') + ">", true,
         false},
        {"other root", "<?xml version='1.0'?><sequence/>", false, false},
        {"10 MB of nesting", nesting, false, false},
        {"text fields without NUL", std::string("TOF1\0\0\0\0\0\0", 10) + std::string(1286, 'x'),
         false, true},
    };
    for (Case const& c : cases) {
        bool isXml = false;
        OVFileHeader const h = ReadFrom(c.bytes, isXml, c.isXml);
        EXPECT_EQ(isXml, c.isXml) << c.what;
        EXPECT_EQ(h.ValidHeader(), c.valid) << c.what;
        EXPECT_LT(std::strlen(h.GetBuildVersion()), 50u) << c.what;
        EXPECT_LT(std::strlen(h.GetOrigFilePath()), 1024u) << c.what;
    }
}

TEST(OVFileHeader, CompatibilityComparesWithTheCompatibleVersion) {
    struct Case {
        char const *compatible, *product;
        bool expected;
    } const cases[] = {
        {"4.2", "4.2.0.1", true}, {"4.2.1", "4.2", false}, {"4.2", "10.0", true},
        {"", "1.0", true},        {"n/a", "1.0", true},    {"4.2", "garbage", false},
    };
    for (Case const& c : cases)
        EXPECT_EQ(Sample(773, "T", c.compatible).IsCompatibleProductVersion(Version(c.product)),
                  c.expected)
            << c.compatible << " vs " << c.product;
}

} // namespace
} // namespace tekit
