// IniObj: construction, typed values, sections, comparison and order over the flat store.
#include "tekit/ini/IniObj.h"

#include "ini/IniObjErrors.h"
#include "ini/IniObject.h"
#include "platform/CLocale.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/paths/Path.h"

#include <climits>
#include <cstdint>
#include <cstring>

namespace tekit {

using ini::RaiseStatus;

namespace {

/// Whether `status` says that a value is there but does not convert.
bool IsConversionFailure(int status) {
    return status == INI_ERR_INVALID_INTEGER || status == INI_ERR_INVALID_DOUBLE ||
           status == INI_ERR_INVALID_BOOLEAN || status == INI_ERR_INVALID_DATA ||
           status == INI_ERR_DATA_TOO_LARGE;
}

/// A getter's status as found (true) or absent (false); a failure raises in "IniObj::Get",
/// naming the section and tag.
bool Found(int status, char const* section, char const* tag, char const* function = "IniObj::Get") {
    if (status >= 0)
        return status == 1;
    if (!IsConversionFailure(status))
        RaiseStatus(status, function);
    DynamicString const message(
        static_cast<char const*>(RString("INI_ERRORS", Ini_GetErrorKey(status))));
    TE_RAISE(ini::StatusToTEError(status),
             ini::Message("INI_BAD_VALUE_1_2_3",
                          {message.GetBufferReadPtr(), section ? section : "", tag ? tag : ""}),
             function);
}

/// The found-flag form: a value that does not convert is reported in `converted`.
bool FoundOrNotConverted(int status, bool& converted) {
    converted = status == 1;
    if (status < 0 && !IsConversionFailure(status))
        RaiseStatus(status, "IniObj::Get");
    return status != 0;
}

void Check(int status, char const* function) {
    if (status < 0)
        RaiseStatus(status, function);
}

constexpr bool kLong64 = sizeof(long) == 8;

/// The name of an SP form's section, for messages.
char const* NameOf(IniHandle ini, IniSection section) {
    char const* name = nullptr;
    if (section && Ini_SectionInfoSP(ini, section, &name, nullptr) == 1 && name)
        return name;
    return "";
}

} // namespace

// ---- Construction -------------------------------------------------------------------------

IniObj::IniObj(bool sortFlag, char const* localeName) {
    if (localeName && *localeName) {
        m_locale = platform::CreateNamedCLocale(localeName);
        if (m_locale == IniLocale{})
            TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE, ini::Message("INI_UNKNOWN_LOCALE_1", {localeName}),
                     "IniObj::IniObj");
    }
    m_ini = Ini_New(sortFlag ? 1 : 0, m_locale);
    if (!m_ini) {
        platform::FreeCLocale(m_locale);
        ThrowOutOfMemory();
    }
}

IniObj::IniObj(bool sortFlag, String const& text, char const* localeName)
    : IniObj(sortFlag, localeName) {
    ReadString(text);
}

IniObj::IniObj(bool sortFlag, Path const& path, char const* localeName)
    : IniObj(sortFlag, localeName) {
    ReadFile(path);
}

IniObj::~IniObj() {
    Ini_Dispose(m_ini);
    platform::FreeCLocale(m_locale);
}

IniHandle IniObj::NewHandle() const {
    IniHandle const fresh = Ini_New(m_ini->keepSorted ? 1 : 0, m_locale);
    if (!fresh)
        ThrowOutOfMemory();
    fresh->sectionStart = m_ini->sectionStart;
    fresh->sectionEnd = m_ini->sectionEnd;
    std::memcpy(fresh->separator, m_ini->separator, sizeof fresh->separator);
    std::memcpy(fresh->writtenSeparator, m_ini->writtenSeparator, sizeof fresh->writtenSeparator);
    std::memcpy(fresh->comment, m_ini->comment, sizeof fresh->comment);
    fresh->duplicateChecking = m_ini->duplicateChecking;
    fresh->filter = m_ini->filter;
    fresh->filterData = m_ini->filterData;
    return fresh;
}

void IniObj::Adopt(IniHandle fresh, int status, char const* function) {
    if (status >= 0 && m_ini->sectionIndex.list)
        status = Ini_SortInternally(fresh);
    if (status < 0) {
        Ini_Dispose(fresh);
        RaiseStatus(status, function);
    }
    Ini_Dispose(m_ini);
    m_ini = fresh;
}

// ---- Getters ------------------------------------------------------------------------------

bool IniObj::Get(char const* section, char const* tag, long& value) {
    if constexpr (kLong64) {
        std::int64_t v = 0;
        if (!Found(Ini_GetInt64(m_ini, section, tag, &v), section, tag))
            return false;
        value = static_cast<long>(v);
    } else {
        int v = 0;
        if (!Found(Ini_GetInt(m_ini, section, tag, &v), section, tag))
            return false;
        value = v;
    }
    return true;
}

bool IniObj::Get(char const* section, char const* tag, long& value, bool& converted) {
    if constexpr (kLong64) {
        std::int64_t v = 0;
        bool const exists = FoundOrNotConverted(Ini_GetInt64(m_ini, section, tag, &v), converted);
        if (converted)
            value = static_cast<long>(v);
        return exists;
    } else {
        int v = 0;
        bool const exists = FoundOrNotConverted(Ini_GetInt(m_ini, section, tag, &v), converted);
        if (converted)
            value = v;
        return exists;
    }
}

bool IniObj::Get(char const* section, char const* tag, unsigned long& value) {
    if constexpr (kLong64) {
        std::uint64_t v = 0;
        if (!Found(Ini_GetUInt64(m_ini, section, tag, &v), section, tag))
            return false;
        value = static_cast<unsigned long>(v);
    } else {
        unsigned int v = 0;
        if (!Found(Ini_GetUInt(m_ini, section, tag, &v), section, tag))
            return false;
        value = v;
    }
    return true;
}

bool IniObj::Get(char const* section, char const* tag, unsigned long& value, bool& converted) {
    if constexpr (kLong64) {
        std::uint64_t v = 0;
        bool const exists = FoundOrNotConverted(Ini_GetUInt64(m_ini, section, tag, &v), converted);
        if (converted)
            value = static_cast<unsigned long>(v);
        return exists;
    } else {
        unsigned int v = 0;
        bool const exists = FoundOrNotConverted(Ini_GetUInt(m_ini, section, tag, &v), converted);
        if (converted)
            value = v;
        return exists;
    }
}

bool IniObj::Get(char const* section, char const* tag, double& value) {
    return Found(Ini_GetDouble(m_ini, section, tag, &value), section, tag);
}

bool IniObj::Get(char const* section, char const* tag, double& value, bool& converted) {
    return FoundOrNotConverted(Ini_GetDouble(m_ini, section, tag, &value), converted);
}

bool IniObj::Get(char const* section, char const* tag, bool& value) {
    int v = 0;
    if (!Found(Ini_GetBoolean(m_ini, section, tag, &v), section, tag))
        return false;
    value = v != 0;
    return true;
}

bool IniObj::Get(char const* section, char const* tag, bool& value, bool& converted) {
    int v = 0;
    bool const exists = FoundOrNotConverted(Ini_GetBoolean(m_ini, section, tag, &v), converted);
    if (converted)
        value = v != 0;
    return exists;
}

bool IniObj::Get(char const* section, char const* tag, Path& value) {
    char const* text = nullptr;
    if (!Found(Ini_GetPointerToString(m_ini, section, tag, &text), section, tag))
        return false;
    value = text;
    return true;
}

bool IniObj::Get(char const* section, char const* tag, String& value) {
    char const* text = nullptr;
    if (!Found(Ini_GetPointerToString(m_ini, section, tag, &text), section, tag))
        return false;
    value.Assign(text);
    return true;
}

bool IniObj::Get(char const* section, char const* tag, char** value) {
    return Found(Ini_GetStringCopy(m_ini, section, tag, value), section, tag);
}

bool IniObj::Get(char const* section, char const* tag, unsigned char** data, long* size) {
    void* bytes = nullptr;
    int count = 0;
    if (!data || !size)
        RaiseStatus(INI_ERR_INVALID_ARGUMENT, "IniObj::Get");
    if (!Found(Ini_GetData(m_ini, section, tag, &bytes, &count), section, tag))
        return false;
    *data = static_cast<unsigned char*>(bytes);
    *size = count;
    return true;
}

bool IniObj::GetRaw(char const* section, char const* tag, String& value) {
    char const* text = nullptr;
    if (!Found(Ini_GetPointerToRawString(m_ini, section, tag, &text), section, tag,
               "IniObj::GetRaw"))
        return false;
    value.Assign(text);
    return true;
}

bool IniObj::GetSectionPtr(char const* name, IniSection& section) {
    return Found(Ini_GetSectionPtr(m_ini, name, &section), name, "", "IniObj::GetSectionPtr");
}

bool IniObj::GetSP(IniSection section, char const* tag, long& value) {
    if constexpr (kLong64) {
        std::int64_t v = 0;
        if (!Found(Ini_GetInt64SP(m_ini, section, tag, &v), NameOf(m_ini, section), tag,
                   "IniObj::GetSP"))
            return false;
        value = static_cast<long>(v);
    } else {
        int v = 0;
        if (!Found(Ini_GetIntSP(m_ini, section, tag, &v), NameOf(m_ini, section), tag,
                   "IniObj::GetSP"))
            return false;
        value = v;
    }
    return true;
}

bool IniObj::GetSP(IniSection section, char const* tag, unsigned long& value) {
    if constexpr (kLong64) {
        std::uint64_t v = 0;
        if (!Found(Ini_GetUInt64SP(m_ini, section, tag, &v), NameOf(m_ini, section), tag,
                   "IniObj::GetSP"))
            return false;
        value = static_cast<unsigned long>(v);
    } else {
        unsigned int v = 0;
        if (!Found(Ini_GetUIntSP(m_ini, section, tag, &v), NameOf(m_ini, section), tag,
                   "IniObj::GetSP"))
            return false;
        value = v;
    }
    return true;
}

bool IniObj::GetSP(IniSection section, char const* tag, double& value) {
    return Found(Ini_GetDoubleSP(m_ini, section, tag, &value), NameOf(m_ini, section), tag,
                 "IniObj::GetSP");
}

bool IniObj::GetSP(IniSection section, char const* tag, bool& value) {
    int v = 0;
    if (!Found(Ini_GetBooleanSP(m_ini, section, tag, &v), NameOf(m_ini, section), tag,
               "IniObj::GetSP"))
        return false;
    value = v != 0;
    return true;
}

bool IniObj::GetSP(IniSection section, char const* tag, String& value) {
    char const* text = nullptr;
    if (!Found(Ini_GetPointerToStringSP(m_ini, section, tag, &text), NameOf(m_ini, section), tag,
               "IniObj::GetSP"))
        return false;
    value.Assign(text);
    return true;
}

bool IniObj::GetRawSP(IniSection section, char const* tag, String& value) {
    char const* text = nullptr;
    if (!Found(Ini_GetPointerToRawStringSP(m_ini, section, tag, &text), NameOf(m_ini, section), tag,
               "IniObj::GetRawSP"))
        return false;
    value.Assign(text);
    return true;
}

// ---- Setters ------------------------------------------------------------------------------

void IniObj::Set(char const* section, char const* tag, long value) {
    Check(Ini_PutInt64(m_ini, section, tag, value), "IniObj::Set");
}

void IniObj::Set(char const* section, char const* tag, unsigned long value) {
    Check(Ini_PutUInt64(m_ini, section, tag, value), "IniObj::Set");
}

void IniObj::Set(char const* section, char const* tag, double value) {
    Check(Ini_PutDouble(m_ini, section, tag, value), "IniObj::Set");
}

void IniObj::Set(char const* section, char const* tag, bool value) {
    Check(Ini_PutBoolean(m_ini, section, tag, value ? 1 : 0), "IniObj::Set");
}

void IniObj::Set(char const* section, char const* tag, Path const& value) {
    Check(Ini_PutString(m_ini, section, tag, value.CStr()), "IniObj::Set");
}

void IniObj::Set(char const* section, char const* tag, String const& value) {
    Check(Ini_PutString(m_ini, section, tag, value.GetBufferReadPtr()), "IniObj::Set");
}

void IniObj::Set(char const* section, char const* tag, char const* value) {
    Check(Ini_PutString(m_ini, section, tag, value), "IniObj::Set");
}

void IniObj::Set(char const* section, char const* tag, unsigned char const* data, long size) {
    if (size < 0 || size > INT_MAX)
        RaiseStatus(INI_ERR_INVALID_ARGUMENT, "IniObj::Set");
    Check(Ini_PutData(m_ini, section, tag, data, static_cast<int>(size)), "IniObj::Set");
}

void IniObj::SetRaw(char const* section, char const* tag, char const* value) {
    Check(Ini_PutRawString(m_ini, section, tag, value), "IniObj::SetRaw");
}

void IniObj::SetSP(IniSection section, char const* tag, long value) {
    Check(Ini_PutInt64SP(m_ini, section, tag, value), "IniObj::SetSP");
}

void IniObj::SetSP(IniSection section, char const* tag, unsigned long value) {
    Check(Ini_PutUInt64SP(m_ini, section, tag, value), "IniObj::SetSP");
}

void IniObj::SetSP(IniSection section, char const* tag, double value) {
    Check(Ini_PutDoubleSP(m_ini, section, tag, value), "IniObj::SetSP");
}

void IniObj::SetSP(IniSection section, char const* tag, bool value) {
    Check(Ini_PutBooleanSP(m_ini, section, tag, value ? 1 : 0), "IniObj::SetSP");
}

void IniObj::SetSP(IniSection section, char const* tag, String const& value) {
    Check(Ini_PutStringSP(m_ini, section, tag, value.GetBufferReadPtr()), "IniObj::SetSP");
}

void IniObj::SetRawSP(IniSection section, char const* tag, char const* value) {
    Check(Ini_PutRawStringSP(m_ini, section, tag, value), "IniObj::SetRawSP");
}

// ---- Sections, comparison, order ----------------------------------------------------------

bool IniObj::CopySection(IniObj& source, char const* const name, bool replace) {
    int const status = Ini_CopySection(source.m_ini, m_ini, name, replace ? 1 : 0);
    Check(status, "IniObj::CopySection");
    return status == 1;
}

bool IniObj::Compare(IniObj& other) {
    int const count = Ini_NumberOfSections(m_ini);
    if (count != Ini_NumberOfSections(other.m_ini))
        return false;
    for (int s = 1; s <= count; ++s) {
        IniSection a = nullptr, b = nullptr;
        char const* nameA = nullptr;
        char const* nameB = nullptr;
        Ini_NthSection(m_ini, s, &a);
        Ini_NthSection(other.m_ini, s, &b);
        Ini_SectionInfoSP(m_ini, a, &nameA, nullptr);
        Ini_SectionInfoSP(other.m_ini, b, &nameB, nullptr);
        int const items = Ini_NumberOfItemsSP(m_ini, a);
        if (std::strcmp(nameA, nameB) != 0 || items != Ini_NumberOfItemsSP(other.m_ini, b))
            return false;
        for (int i = 1; i <= items; ++i) {
            char const *tagA = nullptr, *tagB = nullptr, *valueA = nullptr, *valueB = nullptr;
            int quotedA = 0, quotedB = 0;
            Ini_NthItemSP(m_ini, a, i, &tagA, &valueA, nullptr, &quotedA);
            Ini_NthItemSP(other.m_ini, b, i, &tagB, &valueB, nullptr, &quotedB);
            if (std::strcmp(tagA, tagB) != 0 || std::strcmp(valueA, valueB) != 0 ||
                quotedA != quotedB)
                return false;
        }
    }
    return true;
}

void IniObj::Sort() {
    Check(Ini_Sort(m_ini), "IniObj::Sort");
}

void IniObj::DisableSorting() {
    Check(Ini_DisableSorting(m_ini), "IniObj::DisableSorting");
}

void IniObj::SortInternally() {
    Check(Ini_SortInternally(m_ini), "IniObj::SortInternally");
}

void IniObj::DisableInternalSorting() {
    Check(Ini_DisableInternalSorting(m_ini), "IniObj::DisableInternalSorting");
}

} // namespace tekit
