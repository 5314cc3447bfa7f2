#include "templates/ExcelSpecification.h"

#include "templates/TemplateXml.h"

namespace tmplfile {
namespace {

using F = ValueForm;
// The option flags come first in the file but the option numbers, read in the second pass, win:
// only the numbers can say "defined manually".
const AttributeRule kExcelAttributes[] = {
    {"ExcelSheet", F::Number, [](CSpecification& s) { return &s.m_DataDesc.m_nExcelSheet; }, nullptr},
    {"DataTimeType", F::Number, [](CSpecification& s) { return &s.m_TimeDesc.m_nDateTimeOption; }, nullptr},
    {"DateTimeCol", F::Number, [](CSpecification& s) { return &s.m_TimeDesc.m_nDateTimeCol; }, nullptr},
    {"UseDTFormat", F::Flag, [](CSpecification& s) { return &s.m_TimeDesc.m_bUseDTFormat; }, nullptr},
    {"DateTimeFormat", F::Text, nullptr, [](CSpecification& s) { return &s.m_TimeDesc.m_strDateTimeFormat; }},
    {"GlobalDate", F::Text, nullptr, [](CSpecification& s) { return &s.m_TimeDesc.m_strGlobalDate; }},
    {"TimeCol", F::Number, [](CSpecification& s) { return &s.m_TimeDesc.m_nTimeCol; }, nullptr},
    {"UseTFormat", F::Flag, [](CSpecification& s) { return &s.m_TimeDesc.m_bUseTFormat; }, nullptr},
    {"GlobalTime", F::Text, nullptr, [](CSpecification& s) { return &s.m_TimeDesc.m_strGlobalTime; }},
    {"TimeFormat", F::Text, nullptr, [](CSpecification& s) { return &s.m_TimeDesc.m_strTimeFormat; }},
    {"DateCol", F::Number, [](CSpecification& s) { return &s.m_TimeDesc.m_nDateCol; }, nullptr},
    {"UseDFormat", F::Flag, [](CSpecification& s) { return &s.m_TimeDesc.m_bUseDFormat; }, nullptr},
    {"DateFormat", F::Text, nullptr, [](CSpecification& s) { return &s.m_TimeDesc.m_strDateFormat; }},
    {"UseUnitTypeRow", F::FlagWhenOne, [](CSpecification& s) { return &s.m_DataDesc.m_nUnitTypeOption; }, nullptr},
    {"GlobalUnitType", F::Text, nullptr, [](CSpecification& s) { return &s.m_DataDesc.m_strGlobalUnitType; }},
    {"UnitTypeRow", F::Number, [](CSpecification& s) { return &s.m_DataDesc.m_nUnitTypeRow; }, nullptr},
    {"UseUnitRow", F::FlagWhenOne, [](CSpecification& s) { return &s.m_DataDesc.m_nUnitOption; }, nullptr},
    {"GlobalUnit", F::Text, nullptr, [](CSpecification& s) { return &s.m_DataDesc.m_strGlobalUnit; }},
    {"UnitRow", F::Number, [](CSpecification& s) { return &s.m_DataDesc.m_nUnitRow; }, nullptr},
    {"UseValueTypeRow", F::FlagWhenOne, [](CSpecification& s) { return &s.m_DataDesc.m_nValueTypeOption; },
     nullptr},
    {"GlobalValueType", F::Text, nullptr, [](CSpecification& s) { return &s.m_DataDesc.m_strGlobalValueType; }},
    {"ValueTypeRow", F::Number, [](CSpecification& s) { return &s.m_DataDesc.m_nValueTypeRow; }, nullptr},
    {"ItemDescriptionRow", F::Number, [](CSpecification& s) { return &s.m_DataDesc.m_nItemDescriptionRow; },
     nullptr},
    {"StartRow", F::Number, [](CSpecification& s) { return &s.m_DataDesc.m_nStartRow; }, nullptr},
    {"UseDelValNotEmpty", F::FlagWhenOne, [](CSpecification& s) { return &s.m_DataDesc.m_nDeleteValueCheck; },
     nullptr},
    {"UseDeleteValueRow", F::FlagWhenOne, [](CSpecification& s) { return &s.m_DataDesc.m_nDeleteValueRadio; },
     nullptr},
    {"DeleteValue", F::Text, nullptr, [](CSpecification& s) { return &s.m_DataDesc.m_strDeleteValue; }},
    {"DeleteValueRow", F::Number, [](CSpecification& s) { return &s.m_DataDesc.m_nDeleteValueRow; }, nullptr},
    {"UseUnitTypeOption", F::Number, [](CSpecification& s) { return &s.m_DataDesc.m_nUnitTypeOption; }, nullptr,
     true},
    {"UseUnitOption", F::Number, [](CSpecification& s) { return &s.m_DataDesc.m_nUnitOption; }, nullptr, true},
    {"UseValueTypeOption", F::Number, [](CSpecification& s) { return &s.m_DataDesc.m_nValueTypeOption; }, nullptr,
     true},
    {"UseItemTitleOption", F::Number, [](CSpecification& s) { return &s.m_DataDesc.m_nItemTitleOption; }, nullptr,
     true},
    {"SelItems", F::SelItems, nullptr, nullptr},
};

const FileLayout kExcelLayout {"excel", "MSExcelTSBridgeSpecification", "MSExcelTSBridgeSpecificationExtension",
                               kExcelAttributes, false};

} // namespace

const FileLayout& ExcelFileLayout() { return kExcelLayout; }

} // namespace tmplfile

int CExcelSpecification::Save(const CString& path)
{
    const CString& target = path.empty() ? m_strSaveFile : path;
    m_lastStatus = tmplfile::WriteTemplate(*this, tmplfile::ExcelFileLayout(), target);
    return m_lastStatus ? 1 : 0;
}

int CExcelSpecification::Load(const CString& path)
{
    std::string bytes;
    m_lastStatus = tmplfile::ReadFileBytes(path, bytes);
    if (!m_lastStatus)
        return 0;
    return LoadFromMemory(bytes, path);
}

int CExcelSpecification::LoadFromMemory(std::string_view bytes, const CString& path)
{
    m_lastStatus = tmplfile::LoadInto(*this, tmplfile::ExcelFileLayout(), bytes, path);
    if (!m_lastStatus)
        return 0;
    return CSpecification::Load(path);
}

int CExcelSpecification::CountFormatColumns(int byOption) const
{
    if (byOption == 0)
        return 1;
    const CTimeDescription& time = m_TimeDesc;
    switch (time.m_nDateTimeOption) {
    case 0: return time.m_bUseDTFormat ? CountFormatTokens(time.m_strDateTimeFormat, "|") : 1;
    case 1: return time.m_bUseTFormat ? CountFormatTokens(time.m_strTimeFormat, "|") : 1;
    case 2: return time.m_bUseDFormat ? CountFormatTokens(time.m_strDateFormat, "|") : 1;
    default: return 1;
    }
}
