// Feeds arbitrary bytes to the spreadsheet application as a workbook file and walks it the way
// the Excel parser does (sheets, used range, the texts of the first 20 rows). With the first
// byte 'F' the rest is a number format code instead, rendered over a few values.
#include "formats/workbook/NumberFormat.h"
#include "platform/spreadsheet/SpreadsheetApplication.h"

#include "tests/support/ScratchFile.h"

#include <cstdint>
#include <string>

namespace {

void RenderFormat(const std::string& code)
{
    sheet::NumberFormat format(code);
    for (double value : {0.0, -1.5, 44333.75, 1e300, -1e-300, 0.5})
        format.RenderNumber(value);
    format.RenderText("text");
}

void WalkWorkbook(const std::string& path)
{
    sheet::ApplicationSettings settings;
    settings.maxArrayCells = 100000;
    settings.load.retainedRows = 20;
    auto app = sheet::StartApplication(settings);
    try {
        auto sheets = app->Workbooks()->Open(path)->Worksheets();
        for (int s = 1; s <= sheets->Count() && s <= 4; ++s) {
            auto ws = sheets->Item(s);
            auto used = ws->UsedRange();
            used->Count();
            int first = used->Column();
            try {
                used->Value2();
            } catch (const sheet::AutomationError&) {
            }
            for (int row = 1; row <= 20; ++row)
                for (int column = first; column < first + 10; ++column)
                    ws->Range(std::string(1, static_cast<char>('A' + (column - 1) % 26)) + std::to_string(row))->Text();
        }
    } catch (const sheet::AutomationError&) {
    }
    app->Quit();
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    if (size > 0 && data[0] == 'F') {
        RenderFormat(std::string(reinterpret_cast<const char*>(data) + 1, size - 1));
        return 0;
    }
    const testsupport::ScratchFile input("velmora-spreadsheet-fuzz", "", data, size);
    if (!input.Path().empty())
        WalkWorkbook(input.Path());
    return 0;
}
