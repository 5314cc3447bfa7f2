// Feeds arbitrary bytes to the spreadsheet application as a workbook file and walks it the way
// the Excel parser does (sheets, used range, the texts of the first 20 rows). With the first
// byte 'F' the rest is a number format code instead, rendered over a few values.
#include "formats/workbook/NumberFormat.h"
#include "platform/spreadsheet/SpreadsheetApplication.h"

#include <cstdint>
#include <cstdio>
#include <string>
#include <unistd.h>

namespace {

void RenderFormat(const std::string& code)
{
    sheet::NumberFormat format(code);
    for (double value : {0.0, -1.5, 44333.75, 1e300, -1e-300, 0.5})
        format.RenderNumber(value);
    format.RenderText("text");
}

std::string WriteTemporary(const uint8_t* data, size_t size)
{
    char path[] = "/tmp/velmora_spreadsheet_fuzz_XXXXXX";
    int fd = mkstemp(path);
    if (fd < 0)
        return std::string();
    size_t written = 0;
    while (written < size) {
        ssize_t n = write(fd, data + written, size - written);
        if (n <= 0)
            break;
        written += static_cast<size_t>(n);
    }
    close(fd);
    return path;
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
    std::string path = WriteTemporary(data, size);
    if (path.empty())
        return 0;
    WalkWorkbook(path);
    unlink(path.c_str());
    return 0;
}
