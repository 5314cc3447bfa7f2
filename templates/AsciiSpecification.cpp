#include "templates/AsciiSpecification.h"

#include "templates/TemplateXml.h"

namespace tmplfile {
namespace {

using F = ValueForm;
// Attribute order is the order of writing; readers of older files depend on nothing else.
const AttributeRule kAsciiAttributes[] = {
    {"DateCol", F::NumberLine, [](CSpecification& s) { return &s.m_TimeDesc.m_nDateCol; }, nullptr},
    {"DateFormat", F::Text, nullptr, [](CSpecification& s) { return &s.m_TimeDesc.m_strDateFormat; }},
    {"DateTimeCol", F::NumberLine, [](CSpecification& s) { return &s.m_TimeDesc.m_nDateTimeCol; }, nullptr},
    {"DateTimeFormat", F::Text, nullptr, [](CSpecification& s) { return &s.m_TimeDesc.m_strDateTimeFormat; }},
    {"DecimalSeparator", F::Text, nullptr, [](CSpecification& s) { return &s.m_strDecimalSeparator; }},
    {"DeleteValue", F::Text, nullptr, [](CSpecification& s) { return &s.m_DataDesc.m_strDeleteValue; }},
    {"DeleteValueRow", F::NumberLine, [](CSpecification& s) { return &s.m_DataDesc.m_nDeleteValueRow; }, nullptr},
    {"Delimiter", F::Text, nullptr, [](CSpecification& s) { return &s.m_strDelimiter; }},
    {"GlobalDate", F::Text, nullptr, [](CSpecification& s) { return &s.m_TimeDesc.m_strGlobalDate; }},
    {"GlobalTime", F::Text, nullptr, [](CSpecification& s) { return &s.m_TimeDesc.m_strGlobalTime; }},
    {"GlobalUnit", F::Text, nullptr, [](CSpecification& s) { return &s.m_DataDesc.m_strGlobalUnit; }},
    {"GlobalUnitType", F::Text, nullptr, [](CSpecification& s) { return &s.m_DataDesc.m_strGlobalUnitType; }},
    {"GlobalValueType", F::Text, nullptr, [](CSpecification& s) { return &s.m_DataDesc.m_strGlobalValueType; }},
    {"IgnoreBegginingOfLineDelimiters", F::Flag,
     [](CSpecification& s) { return &s.m_bIgnoreBegginingOfLineDelimiters; }, nullptr},
    {"IgnoreConsecutiveDelimiters", F::Flag, [](CSpecification& s) { return &s.m_bIgnoreConsecutiveDelimiters; },
     nullptr},
    {"ItemDescriptionRow", F::NumberLine, [](CSpecification& s) { return &s.m_DataDesc.m_nItemDescriptionRow; },
     nullptr},
    {"StartRow", F::NumberLine, [](CSpecification& s) { return &s.m_DataDesc.m_nStartRow; }, nullptr},
    {"TimeCol", F::NumberLine, [](CSpecification& s) { return &s.m_TimeDesc.m_nTimeCol; }, nullptr},
    {"TimeFormat", F::Text, nullptr, [](CSpecification& s) { return &s.m_TimeDesc.m_strTimeFormat; }},
    {"UnitRow", F::NumberLine, [](CSpecification& s) { return &s.m_DataDesc.m_nUnitRow; }, nullptr},
    {"UnitTypeRow", F::NumberLine, [](CSpecification& s) { return &s.m_DataDesc.m_nUnitTypeRow; }, nullptr},
    {"ValueTypeRow", F::NumberLine, [](CSpecification& s) { return &s.m_DataDesc.m_nValueTypeRow; }, nullptr},
    {"DateTimeOption", F::NumberLine, [](CSpecification& s) { return &s.m_TimeDesc.m_nDateTimeOption; }, nullptr},
    {"UnitOption", F::NumberLine, [](CSpecification& s) { return &s.m_DataDesc.m_nUnitOption; }, nullptr},
    {"UnitTypeOption", F::NumberLine, [](CSpecification& s) { return &s.m_DataDesc.m_nUnitTypeOption; }, nullptr},
    {"ValueTypeOption", F::NumberLine, [](CSpecification& s) { return &s.m_DataDesc.m_nValueTypeOption; }, nullptr},
    {"DeleteValueCheck", F::NumberLine, [](CSpecification& s) { return &s.m_DataDesc.m_nDeleteValueCheck; },
     nullptr},
    {"DeleteValueRadio", F::NumberLine, [](CSpecification& s) { return &s.m_DataDesc.m_nDeleteValueRadio; },
     nullptr},
    {"DefDelimiter", F::Text, nullptr, [](CSpecification& s) { return &s.m_strDefDelimiter; }},
    {"SelItems", F::SelItems, nullptr, nullptr},
    {"ItemTitleOption", F::Number, [](CSpecification& s) { return &s.m_DataDesc.m_nItemTitleOption; }, nullptr},
};

const FileLayout kAsciiLayout {"ascii", "ASCIITSBridgeSpecification", "ASCIITSBridgeSpecificationExtension",
                               kAsciiAttributes, true};

} // namespace

const FileLayout& AsciiFileLayout() { return kAsciiLayout; }

} // namespace tmplfile

int CAsciiSpecification::Save(const CString& path)
{
    const CString& target = path.empty() ? m_strSaveFile : path;
    m_lastStatus = tmplfile::WriteTemplate(*this, tmplfile::AsciiFileLayout(), target);
    return m_lastStatus ? 1 : 0;
}

int CAsciiSpecification::Load(const CString& path)
{
    std::string bytes;
    m_lastStatus = tmplfile::ReadFileBytes(path, bytes);
    if (!m_lastStatus)
        return 0;
    return LoadFromMemory(bytes, path);
}

int CAsciiSpecification::LoadFromMemory(std::string_view bytes, const CString& path)
{
    m_lastStatus = tmplfile::LoadInto(*this, tmplfile::AsciiFileLayout(), bytes, path);
    if (!m_lastStatus)
        return 0;
    return CSpecification::Load(path);
}
