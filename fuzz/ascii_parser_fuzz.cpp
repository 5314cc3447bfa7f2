// Arbitrary text through the ASCII parser. The first bytes choose the template: delimiter, decimal
// separator, delimiter flags, date/time option and column, header rows and options; the rest is
// the file. Every operation must end, without a crash, whatever the layout.
#include "parsers/AsciiFilePreviewParser.h"
#include "parsers/FileException.h"
#include "templates/AsciiSpecification.h"
#include "tests/support/ScratchFile.h"

#include <cstdint>
#include <cstdio>
#include <string>

namespace {

constexpr size_t kSettingBytes = 12;

void ApplySettings(const uint8_t* s, CAsciiSpecification& spec)
{
    static const char* const kDelimiters[] = {"Tab", "Comma", "Semi Colon", "Space", "User Defined", "Bogus"};
    static const char* const kUserDelimiters[] = {"", ";", "|", "ab", " "};
    static const char* const kDecimals[] = {"Dot", "Comma", "User Locale", "Other"};
    static const char* const kFormats[] = {"YYYY/MM/DD HH:mm:ss", "HH:mm", "", "DD.MM.YYYY", "Y M D h m s x"};
    spec.m_strDelimiter = kDelimiters[s[0] % 6];
    spec.m_strDefDelimiter = kUserDelimiters[s[1] % 5];
    spec.m_strDecimalSeparator = kDecimals[s[2] % 4];
    spec.m_bIgnoreConsecutiveDelimiters = s[3] & 1;
    spec.m_bIgnoreBegginingOfLineDelimiters = (s[3] >> 1) & 1;
    spec.m_TimeDesc.m_nDateTimeOption = (s[4] % 5) - 1; // -1 to 3: outside values included
    spec.m_TimeDesc.m_strDateTimeFormat = kFormats[s[5] % 5];
    spec.m_TimeDesc.m_strTimeFormat = kFormats[(s[5] / 5) % 5];
    spec.m_TimeDesc.m_strDateFormat = kFormats[(s[5] / 25) % 5];
    spec.m_TimeDesc.m_nDateTimeCol = spec.m_TimeDesc.m_nTimeCol = spec.m_TimeDesc.m_nDateCol = (s[6] % 5) - 1;
    spec.m_DataDesc.m_nUnitTypeOption = s[7] % 4;
    spec.m_DataDesc.m_nUnitOption = (s[7] / 4) % 4;
    spec.m_DataDesc.m_nValueTypeOption = (s[7] / 16) % 4;
    spec.m_DataDesc.m_nItemTitleOption = (s[7] / 64) % 3;
    spec.m_DataDesc.m_nUnitTypeRow = s[8] % 4;
    spec.m_DataDesc.m_nUnitRow = (s[8] / 4) % 4;
    spec.m_DataDesc.m_nValueTypeRow = (s[8] / 16) % 4;
    spec.m_DataDesc.m_nItemDescriptionRow = s[9] % 6 - 1;
    spec.m_DataDesc.m_nStartRow = (s[9] / 6) % 8 - 1;
    spec.m_DataDesc.m_nDeleteValueCheck = s[10] & 1;
    spec.m_DataDesc.m_nDeleteValueRadio = (s[10] >> 1) & 1;
    spec.m_DataDesc.m_nDeleteValueRow = (s[10] >> 2) % 5;
    if (s[11] & 1)
        spec.m_DataDesc.m_vecItemDefs = {{"A", "Discharge", "m", "Instantaneous"}, {"B", "x", "y", "Bad"}};
    spec.m_arrSelItems = {static_cast<unsigned>(s[11] >> 4), 0};
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    if (size < kSettingBytes)
        return 0;
    const testsupport::ScratchFile input("velmora-ascii-fuzz", ".txt", data + kSettingBytes, size - kSettingBytes);
    if (input.Path().empty())
        return 0;
    const std::string& path = input.Path();

    ui::SilentUserInterface silent;
    ui::ScopedUserInterface scope(silent);
    CAsciiSpecification spec;
    ApplySettings(data, spec);
    CAsciiFilePreviewParser parser;
    parser.m_pSpecification = &spec;
    parser.SetFile(path);
    try {
        CStringList list;
        int count = 0;
        parser.GetItemCount(count);
        parser.GetItemNames(list);
        parser.GetItemTypes(list);
        parser.GetUnits(list);
        parser.GetValueTypes(list);
        parser.Parse(path);
        parser.BuildPreviewRows();
        parser.BuildPreviewTitles();
        parser.ReadRawLines("");
    } catch (const CFileException&) {
        // A file that exists but cannot be read is the one exception a parser lets through.
    }
    return 0;
}
