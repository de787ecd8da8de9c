// IniHeader: the header section "__Header__" of an INI document, read, checked and written.
#include "tekit/ini/IniHeader.h"

#include "ini/IniObject.h"
#include "tekit/paths/Path.h"
#include "tekit/toolbox/List.h"
#include "tekit/toolbox/Version.h"

#include <cstring>

namespace tekit {

StaticString<64> const IniHeader::kSBCS("SBCS");
StaticString<64> const IniHeader::kDBCS("DBCS");
StaticString<64> const IniHeader::kUnicode("Unicode");

namespace {

/// The section filter that keeps the header section only.
int TEKIT_STDCALL OnlyTheHeader(IniHandle, void*, char const* sectionName) {
    return std::strcmp(sectionName, IniHeader::kHeaderSectionName) == 0 ? 1 : 0;
}

/// Puts the header section first in an object that keeps no order, where a reader of the
/// text finds it first.
void MoveHeaderToFront(IniHandle ini) {
    if (ini->keepSorted)
        return;
    IniSectionRec* const* const sections = ini::SectionsOf(*ini);
    std::int32_t const count = ini::SectionCount(*ini);
    for (std::int32_t i = 1; i < count; ++i)
        if (std::strcmp(sections[i]->name, IniHeader::kHeaderSectionName) == 0) {
            // Removing and inserting one item never grows the list, so nothing can fail.
            IniSectionRec* section = nullptr;
            ListRemoveItem(ini->sections, &section, i + 1);
            ListInsertItem(ini->sections, &section, LIST_POS_FRONT);
            return;
        }
}

} // namespace

IniHeader::IniHeader() = default;

IniHeader::IniHeader(IniObj& ini) {
    Read(ini);
}

IniHeader::IniHeader(Path const& path) {
    Read(path);
}

IniHeader::IniHeader(char const* type, char const* productVersion, char const* compatibleVersion,
                     long formatVersion, char const* description, Path const& path) {
    SetRequiredInfo(type, productVersion, compatibleVersion, formatVersion, description, path);
}

IniHeader::~IniHeader() = default;

void IniHeader::Read(IniObj& ini) {
    if (&ini == &m_ini)
        return;
    Ini_RemoveSection(m_ini.GetHandle(), kHeaderSectionName);
    m_ini.CopySection(ini, kHeaderSectionName, true);
}

void IniHeader::Read(Path const& path) {
    IniObj header;
    Ini_SetSectionFilter(header.GetHandle(), OnlyTheHeader, nullptr);
    header.ReadFile(path);
    Ini_SetSectionFilter(header.GetHandle(), nullptr, nullptr);
    Read(header);
}

void IniHeader::Write(IniObj& ini) const {
    Ini_RemoveSection(ini.GetHandle(), kHeaderSectionName);
    if (ini.CopySection(m_ini, kHeaderSectionName, true))
        MoveHeaderToFront(ini.GetHandle());
}

bool IniHeader::Exists() const {
    return Ini_SectionExists(m_ini.GetHandle(), kHeaderSectionName) == 1;
}

bool IniHeader::IsValid() const {
    if (!Exists() || GetType().IsEmpty())
        return false;
    long version = 0;
    bool converted = false;
    return !m_ini.Get(kHeaderSectionName, kFormatVersionTag, version, converted) || converted;
}

DynamicString IniHeader::GetText(char const* tag) const {
    DynamicString value;
    m_ini.Get(kHeaderSectionName, tag, value);
    return value;
}

DynamicString IniHeader::GetType() const {
    return GetText(kTypeTag);
}

long IniHeader::GetFormatVersion() const {
    long version = 0;
    bool converted = false;
    m_ini.Get(kHeaderSectionName, kFormatVersionTag, version, converted);
    return converted ? version : 0;
}

DynamicString IniHeader::GetProductName() const {
    return GetText(kProductNameTag);
}

DynamicString IniHeader::GetProductVersion() const {
    return GetText(kProductVersionTag);
}

DynamicString IniHeader::GetCompatibleProductVersion() const {
    return GetText(kCompatibleProductVersionTag);
}

DynamicString IniHeader::GetProductDisplayVersion() const {
    return GetText(kProductDisplayVersionTag);
}

DynamicString IniHeader::GetDescription() const {
    return GetText(kDescriptionTag);
}

DynamicString IniHeader::GetCharacterEncoding() const {
    DynamicString const encoding = GetText(kCharEncodingTag);
    return encoding.IsEmpty() ? DynamicString(kSBCS) : encoding;
}

DynamicString IniHeader::GetPath_InternalForUseWithOVFileHeaderOnly() const {
    return GetText(kPathTag);
}

void IniHeader::SetText(char const* tag, char const* value) {
    m_ini.Set(kHeaderSectionName, tag, value ? value : "");
}

void IniHeader::SetRequiredInfo(char const* type, char const* productVersion,
                                char const* compatibleVersion, long formatVersion,
                                char const* description, Path const& path) {
    SetType(type);
    SetFormatVersion(formatVersion);
    SetProductName(kProductName);
    SetProductVersion(productVersion);
    SetCompatibleProductVersion(compatibleVersion);
    SetDescription(description);
    SetPath(path);
}

void IniHeader::SetFormatVersion(long formatVersion) {
    m_ini.Set(kHeaderSectionName, kFormatVersionTag, formatVersion);
}

void IniHeader::SetDescription(char const* description) {
    SetText(kDescriptionTag, description);
}

void IniHeader::SetCharacterEncoding(char const* encoding) {
    SetText(kCharEncodingTag, encoding);
}

void IniHeader::SetProductDisplayVersion(char const* displayVersion) {
    SetText(kProductDisplayVersionTag, displayVersion);
}

void IniHeader::SetType(char const* type) {
    SetText(kTypeTag, type);
}

void IniHeader::SetProductName(char const* productName) {
    SetText(kProductNameTag, productName);
}

void IniHeader::SetProductVersion(char const* productVersion) {
    SetText(kProductVersionTag, productVersion);
}

void IniHeader::SetCompatibleProductVersion(char const* compatibleVersion) {
    SetText(kCompatibleProductVersionTag, compatibleVersion);
}

void IniHeader::SetPath(Path const& path) {
    m_ini.Set(kHeaderSectionName, kPathTag, path);
}

bool IniHeader::IsCompatibleProductVersion(Version const& productVersion) const {
    if (!productVersion.IsValid())
        return false;
    DynamicString const compatible = GetCompatibleProductVersion();
    if (compatible.IsEmpty())
        return true;
    Version const oldest(compatible);
    return oldest.IsValid() && productVersion >= oldest;
}

} // namespace tekit
