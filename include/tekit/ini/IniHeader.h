// IniHeader: the reserved section "__Header__" that every INI-format file of the product
// carries, naming the file's type, format version and the product versions that wrote it and
// can read it.
//
//   IniHeader header(Path("limits.ini"));           // reads only the header section
//   if (header.IsValid() && header.GetType() == "SequenceFile")
//       Load(header.GetFormatVersion());
//
//   IniObj ini;
//   IniHeader made("LimitsFile", "4.2.1.77", "4.0", 3, "Station limits", Path("C:\\l.ini"));
//   made.Write(ini);                                 // the header section of `ini`
//   ini.WriteFile(Path("limits.ini"));
//
// The section is an ordinary section to the INI store; its tags:
//
//   Type                    the file's type ("SequenceFile", ...)
//   Version                 the format version, a decimal integer
//   ProductName             the product that wrote the file ("Orvane")
//   ProductVersion          its version ("4.2.1.77", see tekit/toolbox/Version.h)
//   CompatibleProdVersion   the oldest product version that can read the file
//   ProductVersionString    the product version as shown to users
//   Description             free text
//   Path                    where the file was saved
//   CharEncoding            "SBCS", "DBCS" or "Unicode"
//
// Choices this class makes:
//   - The getters read the tags of the header section held in GetIniObj(); a missing tag is
//     "" (GetFormatVersion: 0; GetCharacterEncoding: "SBCS"). The setters write them there.
//   - IsValid: the section exists, its Type is not empty, and a Version present is a whole
//     decimal integer. The other tags are optional.
//   - IsCompatibleProductVersion(v): true when `v` is a valid version and not lower than
//     CompatibleProdVersion; a missing CompatibleProdVersion accepts every valid `v`, one that
//     is not a version (tekit/toolbox/Version.h) accepts none.
//   - Read(Path) reads only the header section of an INI text file (a binary form is
//     decompressed whole, then reduced to it); Read(IniObj) copies the section. Either
//     replaces what this header held; a source without the section leaves it empty
//     (Exists() false). Write(IniObj) replaces the section in the target.
//   - SetRequiredInfo also sets ProductName to kProductName.
#pragma once

#include "tekit/Export.h"
#include "tekit/ini/IniObj.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

namespace tekit {

class Path;
class Version;

class TEKIT_API IniHeader {
public:
    static constexpr char kHeaderSectionName[] = "__Header__";
    static constexpr char kTypeTag[] = "Type";
    static constexpr char kFormatVersionTag[] = "Version";
    static constexpr char kProductNameTag[] = "ProductName";
    static constexpr char kProductVersionTag[] = "ProductVersion";
    static constexpr char kCompatibleProductVersionTag[] = "CompatibleProdVersion";
    static constexpr char kProductDisplayVersionTag[] = "ProductVersionString";
    static constexpr char kDescriptionTag[] = "Description";
    static constexpr char kPathTag[] = "Path";
    static constexpr char kCharEncodingTag[] = "CharEncoding";
    /// The product name that SetRequiredInfo writes.
    static constexpr char kProductName[] = "Orvane";

    /// The character-encoding values.
    static StaticString<64> const kSBCS;
    static StaticString<64> const kDBCS;
    static StaticString<64> const kUnicode;

    /// No header section.
    IniHeader();
    /// The header section of `ini` (Read).
    explicit IniHeader(IniObj& ini);
    /// The header section of the file `path`, in any of the three forms (Read).
    explicit IniHeader(Path const& path);
    /// A header section with these tags (SetRequiredInfo).
    IniHeader(char const* type, char const* productVersion, char const* compatibleVersion,
              long formatVersion, char const* description, Path const& path);
    ~IniHeader();
    IniHeader(IniHeader const&) = delete;
    IniHeader& operator=(IniHeader const&) = delete;

    void Read(IniObj& ini);
    void Read(Path const& path);
    /// Replaces the header section of `ini` with this one (removes it when this has none).
    void Write(IniObj& ini) const;
    /// Whether the header section exists.
    bool Exists() const;
    /// Whether it is a usable header (see the file's opening comment).
    bool IsValid() const;

    DynamicString GetType() const;
    long GetFormatVersion() const;
    DynamicString GetProductName() const;
    DynamicString GetProductVersion() const;
    DynamicString GetCompatibleProductVersion() const;
    DynamicString GetProductDisplayVersion() const;
    DynamicString GetDescription() const;
    DynamicString GetCharacterEncoding() const;
    static char const* GetHeaderSectionName() { return kHeaderSectionName; }
    /// The Path tag: the place the file was saved from, for OVFileHeader's record.
    DynamicString GetPath_InternalForUseWithOVFileHeaderOnly() const;

    /// Sets Type, ProductName (kProductName), ProductVersion, CompatibleProdVersion, Version,
    /// Description and Path.
    void SetRequiredInfo(char const* type, char const* productVersion,
                         char const* compatibleVersion, long formatVersion, char const* description,
                         Path const& path);
    void SetFormatVersion(long formatVersion);
    void SetDescription(char const* description);
    void SetCharacterEncoding(char const* encoding);
    void SetProductDisplayVersion(char const* displayVersion);

    /// Whether a product of version `productVersion` can read the file (see above).
    bool IsCompatibleProductVersion(Version const& productVersion) const;

    /// The document holding the header section.
    IniObj& GetIniObj() { return m_ini; }
    IniObj const& GetIniObj() const { return m_ini; }
    bool GetHasPassByRefPointerCommonCParameter() const {
        return m_ini.GetHasPassByRefPointerCommonCParameter();
    }
    void SetHasPassByRefPointerCommonCParameter(bool value) {
        m_ini.SetHasPassByRefPointerCommonCParameter(value);
    }

protected:
    void SetType(char const* type);
    void SetProductName(char const* productName);
    void SetProductVersion(char const* productVersion);
    void SetCompatibleProductVersion(char const* compatibleVersion);
    void SetPath(Path const& path);

private:
    DynamicString GetText(char const* tag) const;
    void SetText(char const* tag, char const* value);

    mutable IniObj m_ini;
};

} // namespace tekit
