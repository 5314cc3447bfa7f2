// velmora preview FILE --format ascii|excel|rbx0 [--template T.xml] [--items 2,0] [--json]: reads a data
// file the way the wizard's preview does and prints what the parser made of it.
#include "apps/velmora/Commands.h"
#include "parsers/ParserFactory.h"
#include "platform/system/FileFormat.h"
#include "platform/system/Text.h"
#include "platform/ui/UserInterface.h"

#include <algorithm>
#include <cstdio>
#include <string>
#include <vector>

namespace {

void PrintHelp()
{
    std::printf(
        "Usage: velmora preview FILE --format ascii|excel|rbx0 [--template T.xml] [--items 2,0] [--json]\n\n"
        "Reads FILE with the preview parser of the format, as the setup wizard does: an ASCII file or\n"
        "an Excel workbook through the template T.xml (the template defaults without one), an rbx0 file\n"
        "through its own header. --items selects item positions (from 0, in the order given) for the preview columns.\n\n"
        "Prints the file's first lines (\"Input file\") and the parsed table (\"Import result\"), then\n"
        "\"Parse succeeded.\" or \"Parse failed: \" and why; message boxes the parser shows go to stderr.\n"
        "With --json one object instead:\n"
        "  {\"ok\", \"messages\": [{\"text\", \"caption\"}], \"itemNames\", \"rows\", \"rawLines\",\n"
        "   \"previewTitles\", \"previewRows\"}, plus \"error\" when the parse failed: the file, the line\n"
        "   where one is concerned, and why (\"FILE:LINE: reason\").\n\n"
        "Exit status: 0 when the parse succeeded, 1 when it failed, 2 for bad usage.\n");
}

struct Options {
    std::string file;
    int format = 0;
    std::string templatePath;
    CUIntArray items;
    bool json = false;
};

// "2,0" into {2, 0}; false for anything but item numbers separated by commas.
bool ParseItemList(const std::string& text, CUIntArray& items)
{
    items.clear();
    std::string number;
    for (size_t i = 0; i <= text.size(); ++i) {
        const char c = i < text.size() ? text[i] : ',';
        if (c >= '0' && c <= '9') {
            number += c;
        } else if (c == ',') {
            if (number.empty() || number.size() > 9)
                return false;
            items.push_back(static_cast<unsigned>(std::stoul(number)));
            number.clear();
        } else if (c != ' ') {
            return false;
        }
    }
    return !items.empty();
}

// Reads the arguments; returns -1 when they are good, else the exit status to end with.
int ReadOptions(int argc, char** argv, Options& options)
{
    std::string formatName;
    for (int i = 1; i < argc; ++i) {
        const std::string arg = argv[i];
        auto value = [&]() -> const char* { return i + 1 < argc ? argv[++i] : nullptr; };
        if (arg == "--json") {
            options.json = true;
        } else if (arg == "--format" || arg == "--template" || arg == "--items") {
            const char* given = value();
            if (!given)
                return host::UsageError("preview", arg + " needs a value");
            if (arg == "--format")
                formatName = given;
            else if (arg == "--template")
                options.templatePath = given;
            else if (!ParseItemList(given, options.items))
                return host::UsageError("preview", "--items takes item numbers from 0 separated by commas, such as 2,0");
        } else if (!arg.empty() && arg[0] == '-') {
            return host::UsageError("preview", "unknown option " + arg);
        } else if (options.file.empty()) {
            options.file = arg;
        } else {
            return host::UsageError("preview", "takes one data file");
        }
    }
    if (options.file.empty())
        return host::UsageError("preview", "needs a data file");
    if (formatName.empty())
        return host::UsageError("preview", "needs --format ascii, --format excel or --format rbx0");
    const sys::FileFormatInfo* named = sys::FindFormatNamed(formatName);
    options.format = named ? sys::Number(named->format) : 0;
    if (!MakeParser(options.format))
        return host::UsageError("preview", "cannot preview the format '" + formatName + "' (ascii, excel or rbx0)");
    if (!options.templatePath.empty() && !MakeSpecification(options.format))
        return host::UsageError("preview", "an " + formatName + " file describes itself; --template does not apply");
    return -1;
}

// The preview rows; without a selection they are the parser's rows, which are used in place because
// an rbx0 table can take gigabytes.
template <typename Use>
void WithPreviewRows(const CFilePreviewParser& parser, Use use)
{
    if (parser.EffectiveSelection().empty())
        use(parser.m_vecRows);
    else
        use(parser.BuildPreviewRows());
}

// --- JSON output -----------------------------------------------------------------------------------

void AppendJsonList(std::string& out, const CStringList& list)
{
    out += '[';
    for (size_t i = 0; i < list.size(); ++i) {
        if (i)
            out += ',';
        text::AppendJsonString(out, list[i]);
    }
    out += ']';
}

// Rows go out one per line and are flushed as they are built, so a large table never exists twice.
void WriteJsonRows(std::FILE* stream, const char* key, const ui::Rows& rows)
{
    std::fprintf(stream, ",\n\"%s\":[", key);
    std::string line;
    for (size_t i = 0; i < rows.size(); ++i) {
        line.clear();
        if (i)
            line += ',';
        line += '\n';
        AppendJsonList(line, rows[i]);
        std::fwrite(line.data(), 1, line.size(), stream);
    }
    std::fputs("]", stream);
}

void WriteJson(const CFilePreviewParser& parser, bool ok, const ui::ScriptedUserInterface& ui)
{
    std::string head = std::string("{\"ok\":") + (ok ? "true" : "false") + ",\n\"messages\":[";
    for (size_t i = 0; i < ui.boxes.size(); ++i) {
        head += i ? "," : "";
        head += "{\"text\":";
        text::AppendJsonString(head, ui.boxes[i].text);
        head += ",\"caption\":";
        text::AppendJsonString(head, ui.boxes[i].caption);
        head += '}';
    }
    head += "]";
    if (!ok) {
        head += ",\n\"error\":";
        text::AppendJsonString(head, parser.m_strFailure);
    }
    head += ",\n\"itemNames\":";
    AppendJsonList(head, parser.m_vecItemNames);
    std::fwrite(head.data(), 1, head.size(), stdout);
    WriteJsonRows(stdout, "rows", parser.m_vecRows);
    WriteJsonRows(stdout, "rawLines", parser.m_vecRawLines);
    std::string titles = ",\n\"previewTitles\":";
    AppendJsonList(titles, parser.BuildPreviewTitles());
    std::fwrite(titles.data(), 1, titles.size(), stdout);
    WithPreviewRows(parser, [](const ui::Rows& rows) { WriteJsonRows(stdout, "previewRows", rows); });
    std::fputs("}\n", stdout);
}

// --- Readable tables -------------------------------------------------------------------------------

void PrintTable(const CStringList& titles, const ui::Rows& rows)
{
    std::vector<size_t> widths(titles.size());
    auto widen = [&widths](const ui::Row& row) {
        if (widths.size() < row.size())
            widths.resize(row.size());
        for (size_t j = 0; j < row.size(); ++j)
            widths[j] = std::max(widths[j], std::min<size_t>(row[j].size(), 40));
    };
    widen(titles);
    for (const ui::Row& row : rows)
        widen(row);
    auto print = [&widths](const ui::Row& row) {
        std::string line;
        for (size_t j = 0; j < row.size(); ++j) {
            line += text::ToUtf8(row[j]);
            if (j + 1 < row.size())
                line.append(row[j].size() < widths[j] ? widths[j] - row[j].size() + 2 : 2, ' ');
        }
        std::printf("%s\n", line.c_str());
    };
    if (!titles.empty()) {
        print(titles);
        size_t total = 0;
        for (size_t w : widths)
            total += w + 2;
        std::printf("%s\n", std::string(total > 2 ? total - 2 : 0, '-').c_str());
    }
    for (const ui::Row& row : rows)
        print(row);
}

void WriteText(const CFilePreviewParser& parser, bool ok, const ui::ScriptedUserInterface& ui)
{
    for (const auto& box : ui.boxes)
        std::fprintf(stderr, "velmora preview: message: %s\n", box.text.c_str());
    if (!parser.m_vecRawLines.empty()) {
        std::printf("Input file\n");
        PrintTable({}, parser.m_vecRawLines);
        std::printf("\n");
    }
    std::printf("Import result\n");
    WithPreviewRows(parser, [&parser](const ui::Rows& rows) { PrintTable(parser.BuildPreviewTitles(), rows); });
    if (ok)
        std::printf("\nParse succeeded.\n");
    else
        std::printf("\nParse failed: %s\n", parser.m_strFailure.c_str());
}

int RunPreview(int argc, char** argv)
{
    if (host::WantsHelp(argc, argv)) {
        PrintHelp();
        return host::kSuccess;
    }
    Options options;
    if (int status = ReadOptions(argc, argv, options); status >= 0)
        return status;

    // Message boxes are collected, not shown: they belong to the report.
    ui::ScriptedUserInterface recorder;
    ui::ScopedUserInterface scope(recorder);

    std::unique_ptr<CSpecification> specification = MakeSpecification(options.format);
    if (specification && !options.templatePath.empty() && !specification->Load(options.templatePath)) {
        std::fprintf(stderr, "velmora preview: cannot load the template %s: %s\n", options.templatePath.c_str(),
                     specification->LastError().c_str());
        return host::kFailed;
    }
    std::unique_ptr<CFilePreviewParser> parser = MakeParser(options.format);
    parser->m_pSpecification = specification.get();
    parser->SetFile(options.file);
    parser->m_arrItems = options.items;

    const bool ok = ParseGuarded(*parser, options.file) != 0;
    if (options.json)
        WriteJson(*parser, ok, recorder);
    else
        WriteText(*parser, ok, recorder);
    std::fflush(stdout);
    return ok ? host::kSuccess : host::kFailed;
}

} // namespace

VELMORA_REGISTER_COMMAND("preview", "read a data file as the wizard's preview does", RunPreview)
