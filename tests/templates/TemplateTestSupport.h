#pragma once
// Helpers for the template tests: a full listing of a template's values so that two templates
// compare with a readable difference, and a template with every value set.
#include "templates/Specification.h"
#include "tests/support/Files.h"
#include "tests/support/ScratchFolder.h"
#include "tests/support/Utf16.h"

#include <gtest/gtest.h>

#include <sstream>
#include <string>

namespace testsupport {

// Every value of a template, one per line, in a fixed order.
inline std::string Describe(const CSpecification& s)
{
    std::ostringstream out;
    const CTimeDescription& t = s.m_TimeDesc;
    const CDataDescription& d = s.m_DataDesc;
    out << "consecutive=" << s.m_bIgnoreConsecutiveDelimiters << "\nleading=" << s.m_bIgnoreBegginingOfLineDelimiters
        << "\ndelimiter=" << s.m_strDelimiter << "\nuser delimiter=" << s.m_strDefDelimiter
        << "\ndecimal=" << s.m_strDecimalSeparator << "\ndate/time option=" << t.m_nDateTimeOption
        << "\ndate/time format=" << t.m_strDateTimeFormat << "\ndate/time col=" << t.m_nDateTimeCol
        << "\nglobal date=" << t.m_strGlobalDate << "\ntime format=" << t.m_strTimeFormat
        << "\ntime col=" << t.m_nTimeCol << "\nglobal time=" << t.m_strGlobalTime << "\ndate format=" << t.m_strDateFormat
        << "\ndate col=" << t.m_nDateCol << "\nuse dt=" << t.m_bUseDTFormat << "\nuse t=" << t.m_bUseTFormat
        << "\nuse d=" << t.m_bUseDFormat << "\nitem type option=" << d.m_nUnitTypeOption
        << "\nunit option=" << d.m_nUnitOption << "\nvalue type option=" << d.m_nValueTypeOption
        << "\ndelete radio=" << d.m_nDeleteValueRadio << "\ndelete check=" << d.m_nDeleteValueCheck
        << "\nglobal item type=" << d.m_strGlobalUnitType << "\nitem type row=" << d.m_nUnitTypeRow
        << "\nglobal unit=" << d.m_strGlobalUnit << "\nunit row=" << d.m_nUnitRow
        << "\nglobal value type=" << d.m_strGlobalValueType << "\nvalue type row=" << d.m_nValueTypeRow
        << "\nitem name row=" << d.m_nItemDescriptionRow << "\nstart row=" << d.m_nStartRow
        << "\ndelete value=" << d.m_strDeleteValue << "\nsheet=" << d.m_nExcelSheet
        << "\ndelete value row=" << d.m_nDeleteValueRow << "\nitem title option=" << d.m_nItemTitleOption << "\n";
    for (const CItemDefinition& item : d.m_vecItemDefs)
        out << "item=" << item.m_strTitle << "|" << item.m_strType << "|" << item.m_strUnit << "|"
            << item.m_strValueType << "\n";
    out << "selected=";
    for (unsigned item : s.m_arrSelItems)
        out << item << ",";
    out << "\nsave file=" << s.m_strSaveFile << "\ntemplate file=" << s.m_strTemplateFile
        << "\nloaded=" << s.m_bLoaded << "\n";
    return out.str();
}

// Sets every value stored by either kind of file to something other than its default.
inline void SetUnusualValues(CSpecification& s)
{
    s.m_bIgnoreConsecutiveDelimiters = 1;
    s.m_bIgnoreBegginingOfLineDelimiters = 1;
    s.m_strDelimiter = "User Defined";
    s.m_strDefDelimiter = "\t#";
    s.m_strDecimalSeparator = "Comma";
    CTimeDescription& t = s.m_TimeDesc;
    t.m_nDateTimeOption = 2;
    t.m_strDateTimeFormat = "DD.MM.YYYY|hh:mm";
    t.m_nDateTimeCol = 11;
    t.m_strGlobalDate = "2001-02-03";
    t.m_strTimeFormat = "hh|mm";
    t.m_nTimeCol = 12;
    t.m_strGlobalTime = "04:05:06";
    t.m_strDateFormat = "YYYY-MM-DD";
    t.m_nDateCol = -13;
    t.m_bUseDTFormat = 1;
    t.m_bUseTFormat = 1;
    t.m_bUseDFormat = 1;
    CDataDescription& d = s.m_DataDesc;
    d.m_nUnitTypeOption = 2;
    d.m_nUnitOption = 0;
    d.m_nValueTypeOption = 2;
    d.m_nDeleteValueRadio = 0;
    d.m_nDeleteValueCheck = 1;
    d.m_strGlobalUnitType = "Flow <&> \"rate\"";
    d.m_nUnitTypeRow = 14;
    d.m_strGlobalUnit = "m\xC2\xB3/s";
    d.m_nUnitRow = 15;
    d.m_strGlobalValueType = "Accumulated";
    d.m_nValueTypeRow = 16;
    d.m_nItemDescriptionRow = 17;
    d.m_nStartRow = 2147483647;
    d.m_strDeleteValue = "  -999 ";
    d.m_nExcelSheet = 4;
    d.m_nDeleteValueRow = 18;
    d.m_nItemTitleOption = 1;
    d.m_vecItemDefs = {{"Level 1", "Length", "m", "Instantaneous"},
                       {"Flow", "Flow", "m\xC2\xB3/s", "Mean_Step_Accumulated"},
                       {"", "", "", ""},
                       {" spaced ", "a&b", "<c>", "\xE6\xB0\xB4"}};
    s.m_arrSelItems = {3, 0, 2};
}

} // namespace testsupport
