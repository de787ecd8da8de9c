// Telling the three file forms apart from files on disk, and what detection does with files it
// cannot read.
#include "tekit/formats/FileTypeDetection.h"

#include "support/FaultInjection.h"
#include "support/Raises.h"
#include "support/ScratchDirectory.h"
#include "tekit/ini/IniHeader.h"
#include "tekit/ini/IniObj.h"
#include "tekit/paths/Path.h"
#include "tekit/streams/OVBinaryFileStream.h"
#include "tekit/strings/DynamicString.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

namespace tekit {
namespace {

class FileTypeDetection : public ::testing::Test {
protected:
    std::string File(char const* name) const { return (m_scratch.Root() / name).string(); }
    std::string Write(char const* name, std::string const& bytes) const {
        testing::WriteFileBytes(File(name), bytes);
        return File(name);
    }
    std::string WriteHeaderFile(char const* name, bool asXml) const {
        OVFileHeader header;
        header.SetData(asXml ? "StationGlobals" : "SequenceFile", 773, "Orvane", "4.2.1.77", "4.2",
                       "4.2.1f1", "");
        OVBinaryFileStream out(File(name).c_str(), kOVFileStreamCreateForWrite);
        header.Write(&out, asXml);
        OVFileHeader::WriteEndOfXmlFile(&out);
        return File(name);
    }
    std::string WriteIniFile(char const* name, bool binary, bool asText) const {
        IniObj ini;
        IniHeader("LimitsFile", "4.2.1.77", "4.0", 3, "Limits", Path("C:\\l.ini")).Write(ini);
        ini.Set("Limits", "High", 9L);
        ini.WriteFile(Path(File(name).c_str()), binary, asText);
        return File(name);
    }

    testing::ScratchDirectory m_scratch{"formats"};
};

TEST_F(FileTypeDetection, TellsEveryFormReadsItsHeaderAndChangesNothing) {
    struct Case {
        std::string file;
        FileWritingFormats format;
        char const* type;
        int version;
    } const cases[] = {
        {WriteHeaderFile("a.seq", false), kBinaryFileFormat, "SequenceFile", 773},
        {WriteHeaderFile("a.xml", true), kXmlFileFormat, "StationGlobals", 773},
        {WriteIniFile("a.ini", false, false), kTextFileFormat, "LimitsFile", 3},
        {WriteIniFile("b.ini", true, false), kTextFileFormat, "LimitsFile", 3},
        {WriteIniFile("c.ini", true, true), kTextFileFormat, "LimitsFile", 3},
    };
    for (Case const& c : cases) {
        std::string const before = testing::ReadFileBytes(c.file);
        Path const path(c.file.c_str());
        FileWritingFormats format = FileWritingFormats(0);
        OVFileHeader header;
        ASSERT_TRUE(OVGetHeaderInformation(path, format, header, kHeaderInfoDefault)) << c.file;
        EXPECT_EQ(format, c.format) << c.file;
        EXPECT_STREQ(header.GetType(), c.type) << c.file;
        // An INI header section without display version gives the product version as build.
        EXPECT_STREQ(header.GetBuildVersion(), c.version == 3 ? "4.2.1.77" : "4.2.1f1");
        EXPECT_EQ(TEGetFileVersion(path), c.version) << c.file;
        DynamicString type;
        TEGetFileType(path, type);
        EXPECT_STREQ(type.GetBufferReadPtr(), c.type);
        format = FileWritingFormats(0);
        EXPECT_TRUE(OVGetHeaderInformation(path, format, header, kHeaderInfoDetectFormatOnly));
        EXPECT_EQ(format, c.format);
        EXPECT_EQ(header.ValidHeader(), c.format != kTextFileFormat) << c.file;
        EXPECT_EQ(testing::ReadFileBytes(c.file), before);
    }
}

TEST_F(FileTypeDetection, UnknownFilesRaiseOrReturnFalse) {
    for (std::string const& bytes :
         {std::string(), std::string("hello"), std::string("<?xml version='1.0'?>\r\n<other/>"),
          std::string("[Limits]\nHigh = 9\n"), std::string("TOF1\0\0", 6) + std::string(99, 'x'),
          std::string("OrvaneBinaryText!!")}) {
        Path const path(Write("unknown.bin", bytes).c_str());
        FileWritingFormats format = kBinaryFileFormat;
        OVFileHeader header;
        EXPECT_RAISES_IN(OVGetHeaderInformation(path, format, header, kHeaderInfoDefault),
                         TE_BAD_FILE_FORMAT, "OVGetHeaderInformation");
        EXPECT_FALSE(OVGetHeaderInformation(path, format, header, kHeaderInfoNoErrorIfUnknown));
        EXPECT_FALSE(header.ValidHeader());
        EXPECT_FALSE(TEIsValidOVFile(path));
    }
}

TEST_F(FileTypeDetection, FilesThatCannotBeReadOrWrittenRaiseTheStreamsErrors) {
    {
        testing::ScopedFault const full(testing::FaultKind::Write, 1, testing::native::kDiskFull);
        OVBinaryFileStream out(File("full.xml").c_str(), kOVFileStreamCreateForWrite);
        OVFileHeader().Write(&out, true);
        EXPECT_RAISES(out.Flush(), TE_DISK_FULL);
    }
    std::filesystem::create_directory(File("directory"));
    EXPECT_RAISES(TEIsValidOVFile(Path(File("directory").c_str())), TE_ACCESS_DENIED);
    EXPECT_RAISES(TEIsValidOVFile(Path(File("missing").c_str())), TE_FILE_NOT_FOUND);
    Path const path(WriteHeaderFile("locked.seq", false).c_str());
    {
        OVBinaryFileStream writer(path.CStr(), kOVFileStreamOpenForWrite);
        EXPECT_RAISES(TEIsValidOVFile(path), TE_SHARING_VIOLATION);
    }
    {
        testing::ScopedFault const failure(testing::FaultKind::Read, 1, testing::native::kDiskFull);
        EXPECT_RAISES(TEIsValidOVFile(path), TE_DISK_FULL);
        EXPECT_TRUE(failure.Fired());
    }
    EXPECT_TRUE(TEIsValidOVFile(path));
}

} // namespace
} // namespace tekit
