// The engine's ASCII reader under many template layouts, each file read three times: by delimiter
// blocks, by the one-pass walk and by the splitter alone. The three readings must give the same
// rows and end with the same problem. The first bytes choose the template; the rest is the file.
#include "converter/AsciiSeriesReader.h"
#include "platform/ui/UserInterface.h"
#include "templates/AsciiSpecification.h"
#include "tests/support/ScratchFile.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

namespace {

constexpr size_t kSettingBytes = 8;
// Enough rows to pass every code path many times; the input is at most a few tens of kilobytes.
constexpr size_t kMaxRows = 20000;

void ApplySettings(const uint8_t* s, CAsciiSpecification& spec)
{
    static const char* const kDelimiters[] = {"Tab", "Comma", "Semi Colon", "Space", "User Defined", "User Defined"};
    static const char* const kUserDelimiters[] = {"|", "ab"};
    static const char* const kDates[] = {"YYYY/MM/DD", "DD.MM.YYYY", "M-D-Y"};
    static const char* const kTimes[] = {"HH:mm:ss", "HH:mm", "h"};
    spec.m_strDelimiter = kDelimiters[s[0] % 6];
    spec.m_strDefDelimiter = kUserDelimiters[(s[0] / 6) % 2];
    spec.m_strDecimalSeparator = (s[1] & 1) ? "Comma" : "Dot";
    // Mostly both flags off: the lines the fast passes take.
    spec.m_bIgnoreConsecutiveDelimiters = (s[1] & 6) == 6;
    spec.m_bIgnoreBegginingOfLineDelimiters = (s[1] & 24) == 24;

    CTimeDescription& time = spec.m_TimeDesc;
    time.m_nDateTimeOption = s[2] % 3;
    time.m_nDateTimeCol = time.m_nTimeCol = time.m_nDateCol = (s[2] / 3) % 3 + 1;
    time.m_strGlobalDate = "2020-02-29";
    time.m_strGlobalTime = "12:30:00";
    const std::string date = kDates[s[3] % 3];
    const std::string clock = kTimes[(s[3] / 3) % 3];
    // Date and time in one field, or in two fields separated by the delimiter.
    const std::string between = (s[3] & 0x80) ? spec.GetDelimiterString() : std::string(" ");
    time.m_strDateTimeFormat = date + between + clock;
    time.m_strDateFormat = date;
    time.m_strTimeFormat = clock;

    CDataDescription& data = spec.m_DataDesc;
    data.m_nItemTitleOption = s[4] & 1;
    data.m_nItemDescriptionRow = 1;
    data.m_nStartRow = 2 + (s[4] >> 1) % 2;
    data.m_nUnitTypeOption = (s[4] & 4) ? 2 : 0;
    data.m_nUnitOption = (s[4] & 8) ? 1 : 0;
    data.m_nUnitRow = 1;
    data.m_nValueTypeOption = 0;
    if (s[4] & 16)
        data.m_vecItemDefs = {{"A", "Discharge", "m", "Instantaneous"}, {"B", "x", "y", "Bad"}};
    data.m_nDeleteValueCheck = s[5] & 1;
    data.m_nDeleteValueRadio = (s[5] >> 1) & 1;
    data.m_nDeleteValueRow = 1;
    data.m_strDeleteValue = "-999";
}

struct Reading {
    std::vector<converter::Row> rows;
    sys::Status status;
    bool opened = false;
};

Reading ReadAll(const CSpecification& spec, const std::string& path, bool fused, bool blocks, uint8_t pick)
{
    Reading reading;
    converter::AsciiSeriesReader reader(spec);
    reader.UseFusedPass(fused);
    reader.UseBlockPass(blocks);
    reading.opened = reader.Open(path).ok();
    if (reading.opened) {
        if (pick != 0) {
            const size_t items = reader.Header().items.size();
            reader.Select({pick % (items + 2), pick % (items + 1), 0, items});
        }
        converter::Row row;
        while (reading.rows.size() < kMaxRows && reader.Next(row))
            reading.rows.push_back(row);
    }
    reading.status = reader.status();
    return reading;
}

bool SameRow(const converter::Row& a, const converter::Row& b)
{
    return a.stamp == b.stamp && a.values.size() == b.values.size() &&
           std::memcmp(a.values.data(), b.values.data(), a.values.size() * sizeof(double)) == 0;
}

bool SameReading(const Reading& a, const Reading& b)
{
    if (a.opened != b.opened || a.rows.size() != b.rows.size() || a.status.ok() != b.status.ok())
        return false;
    for (size_t i = 0; i < a.rows.size(); ++i)
        if (!SameRow(a.rows[i], b.rows[i]))
            return false;
    const sys::Problem& p = a.status.problem();
    const sys::Problem& q = b.status.problem();
    return p.line == q.line && p.column == q.column && p.message == q.message;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    if (size < kSettingBytes)
        return 0;
    static ui::SilentUserInterface silent;
    static ui::ScopedUserInterface scope(silent);
    const testsupport::ScratchFile input("velmora-convert-ascii-passes-fuzz", ".txt", data + kSettingBytes, size - kSettingBytes);
    if (input.Path().empty())
        return 0;
    const std::string& path = input.Path();

    CAsciiSpecification spec;
    ApplySettings(data, spec);
    const uint8_t pick = data[6];
    const Reading blocks = ReadAll(spec, path, true, true, pick);
    const Reading fused = ReadAll(spec, path, true, false, pick);
    const Reading split = ReadAll(spec, path, false, false, pick);
    if (!SameReading(blocks, split) || !SameReading(fused, split))
        __builtin_trap();
    return 0;
}
