#pragma once
// The template: how the values of a delimited ASCII file or an Excel sheet are laid out.
#include "delimited/Dialect.h"
#include "platform/system/Status.h"
#include "platform/system/Types.h"

#include <array>

// The value types by code: "Instantaneous" is 0, the others are the codes GetValueTypeCode gives.
inline constexpr std::array<const char*, 5> kValueTypeNames = {
    "Instantaneous", "Accumulated", "Step_Accumulated", "Mean_Step_Accumulated", "Reverse_Mean_Step_Accumulated"};

// One item column described by hand.
struct CItemDefinition {
    CString m_strTitle;
    CString m_strType;
    CString m_strUnit;
    CString m_strValueType;
};

// Where the dates and times of the data rows stand.
struct CTimeDescription {
    CTimeDescription(); // global date and time from the local clock

    int m_nDateTimeOption = 0; // 0 date/time in rows, 1 one date for all, 2 one time for all
    CString m_strDateTimeFormat = "YYYY/MM/DD HH:mm:ss";
    int m_nDateTimeCol = 1;
    CString m_strGlobalDate;
    CString m_strTimeFormat = "HH:mm:ss";
    int m_nTimeCol = 1;
    CString m_strGlobalTime;
    CString m_strDateFormat = "YYYY/MM/DD";
    int m_nDateCol = 1;
    int m_bUseDTFormat = 0; // Excel only
    int m_bUseTFormat = 0;  // Excel only
    int m_bUseDFormat = 0;  // Excel only
};

// Items, header rows, delete value and sheet.
struct CDataDescription {
    int m_nUnitTypeOption = 1;  // 0 global, 1 in a row, 2 defined manually
    int m_nUnitOption = 1;
    int m_nValueTypeOption = 1;
    int m_nDeleteValueRadio = 1; // 0 the text m_strDeleteValue, 1 read from m_nDeleteValueRow
    int m_nDeleteValueCheck = 0; // 1 a delete value is in use
    CString m_strGlobalUnitType = "Undefined";
    int m_nUnitTypeRow = 1;
    CString m_strGlobalUnit = "Undefined";
    int m_nUnitRow = 1;
    CString m_strGlobalValueType = "Instantaneous";
    int m_nValueTypeRow = 1;
    int m_nItemDescriptionRow = 2;
    int m_nStartRow = 3;
    CString m_strDeleteValue = "-1e-10";
    int m_nExcelSheet = 1;
    int m_nDeleteValueRow = 1;
    int m_nItemTitleOption = 0; // 0 names in the item name row, 1 defined manually
    std::vector<CItemDefinition> m_vecItemDefs;
};

class CSpecification {
public:
    CSpecification() = default;
    virtual ~CSpecification() = default;

    // Writes the template file to `path`, or to m_strSaveFile when `path` is empty; 1 on success.
    virtual int Save(const CString& path) = 0;
    // Reads the template file; the base version only records the path. 1 on success.
    virtual int Load(const CString& path);
    // The number of columns the current date/time spans (byOption 1) or the date/time format spans (0).
    virtual int CountFormatColumns(int byOption) const;
    // The first column of the current date/time option; -1 for an unknown option.
    virtual int GetDateTimeColumn() const;

    // Why the last Save or Load failed, for callers that can show more than a 0: the problem, and
    // its text ("file: reason").
    const sys::Status& LastStatus() const { return m_lastStatus; }
    CString LastError() const { return m_lastStatus.problem().Describe(); }

    void SetTemplateFile(const CString& path);
    CString GetDelimiterString() const;
    CString GetDecimalSeparatorString() const;
    // The separator text of a separator name, compared exactly; "User Locale" asks the user's locale
    // (sys::LocaleDecimalSeparator).
    // 0 (and a blank) for an unknown name.
    static int MapSeparatorName(const CString& name, CString& text);
    // The delimiter, the two delimiter flags and the decimal separator as one value, for the readers
    // of delimited text (delimited/Dialect.h).
    delimited::Dialect GetDialect() const;
    // The next field of `line` from `pos` (0 for the first call); `pos` becomes -1 after the last
    // field: delimited::FieldRule, which may also cut delimiters off the line's start. A user delimiter
    // of several characters separates only where its whole text stands. A malformed quoted field shows
    // message 2305 and gives an empty field.
    CString NextField(CString& line, int& pos) const;

    static int GetValueTypeCode(const CString& name, int& code);
    static int IsValidDateTimeFormat(const CString& format, CString& message);
    static int FormatSelItems(const CUIntArray& items, CString& text);
    static void ParseSelItems(const CString& text, CUIntArray& items);
    // The number of non-empty pieces of `format` between occurrences of `separator`.
    static int CountFormatTokens(const CString& format, const CString& separator);

    int m_bLoaded = 0;
    int m_bIgnoreConsecutiveDelimiters = 0;
    int m_bIgnoreBegginingOfLineDelimiters = 0;
    CString m_strDelimiter = "Tab";
    CString m_strDefDelimiter;
    CString m_strDecimalSeparator = "Dot";
    CTimeDescription m_TimeDesc;
    CDataDescription m_DataDesc;
    CString m_strSaveFile;
    CUIntArray m_arrSelItems;
    CString m_strTemplateFile;

protected:
    // Copies stay within a kind: the loaders stage values in a copy and commit them on success.
    CSpecification(const CSpecification&) = default;
    CSpecification& operator=(const CSpecification&) = default;

    sys::Status m_lastStatus;
};
