#include "guess/TemplateGuess.h"

#include "converter/Converter.h"
#include "guess/DialectGuess.h"
#include "guess/ItemGuess.h"
#include "guess/SheetSample.h"
#include "guess/TimeGuess.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"

#include <algorithm>

namespace guess {
namespace {

// Data rows the engine's own reader reads with the guessed template before it is proposed.
constexpr size_t kRowsProved = 50;

void SetTime(CSpecification& spec, const TimeLayout& time)
{
    CTimeDescription& t = spec.m_TimeDesc;
    t.m_nDateTimeOption = time.option;
    switch (time.option) {
    case 1:
        t.m_strTimeFormat = time.format;
        t.m_nTimeCol = time.column;
        t.m_strGlobalDate = time.globalDate;
        t.m_bUseTFormat = time.useFormat ? 1 : 0;
        break;
    case 2:
        t.m_strDateFormat = time.format;
        t.m_nDateCol = time.column;
        t.m_strGlobalTime = time.globalTime;
        t.m_bUseDFormat = time.useFormat ? 1 : 0;
        break;
    default:
        t.m_strDateTimeFormat = time.format;
        t.m_nDateTimeCol = time.column;
        t.m_bUseDTFormat = time.useFormat ? 1 : 0;
        break;
    }
}

void SetItems(CSpecification& spec, const ItemLayout& items, long startRow)
{
    CDataDescription& d = spec.m_DataDesc;
    d.m_nItemTitleOption = items.titleOption;
    if (items.titleOption == 0)
        d.m_nItemDescriptionRow = items.nameRow;
    d.m_nUnitTypeOption = items.options[0];
    d.m_nUnitOption = items.options[1];
    d.m_nValueTypeOption = items.options[2];
    d.m_nUnitTypeRow = items.rows[0];
    d.m_nUnitRow = items.rows[1];
    d.m_nValueTypeRow = items.rows[2];
    d.m_nStartRow = static_cast<int>(startRow);
    if (items.deleteInUse) {
        d.m_nDeleteValueCheck = 1;
        d.m_nDeleteValueRadio = 0;
        d.m_strDeleteValue = items.deleteValue;
    }
    d.m_vecItemDefs = items.definitions;
    spec.m_arrSelItems = items.selected;
}

// Reads the head of the file with the engine's reader and the guessed template: a guess the
// engine would not read is not proposed.
std::optional<Refusal> Prove(const std::string& path, InputKind kind, const CSpecification& spec, size_t rows)
{
    try {
        const sys::FileFormat format = kind == InputKind::Excel ? sys::FileFormat::Excel : sys::FileFormat::Ascii;
        std::unique_ptr<converter::SeriesReader> reader = converter::MakeReader(format, &spec);
        sys::Status opened = reader->Open(path);
        // Items that hold no numbers are left out of the selection, and so are not read.
        if (opened && !spec.m_arrSelItems.empty())
            reader->Select(std::vector<size_t>(spec.m_arrSelItems.begin(), spec.m_arrSelItems.end()));
        converter::Row row;
        for (size_t i = 0; opened && i < rows && reader->Next(row); ++i) {
        }
        const sys::Status& status = opened ? reader->status() : opened;
        if (status)
            return std::nullopt;
        return Refusal{status.problem().line,
                       "the template guessed does not read the file as the engine reads it: " + status.problem().message};
    } catch (const std::exception& e) {
        return Refusal{0, std::string("the template guessed cannot be tried: ") + e.what()};
    }
}

} // namespace

InputKind KindOfFile(const std::string& path)
{
    const std::string extension = text::ToLower(sys::FileExtension(path));
    return extension == ".xls" || extension == ".xlsx" ? InputKind::Excel : InputKind::Ascii;
}

namespace {

// What the reading of a file gives the guess: its rows, how they split, the decimal separator.
struct ReadHead {
    Sample sample;
    TimeContext context;
    std::optional<DialectGuess> dialect; // text files
    std::string decimal = ".";
};

bool ReadAsciiHead(const std::string& path, const GuessLimits& limits, TemplateGuess& guess, ReadHead& read)
{
    TextHead head;
    std::string error;
    if (!ReadTextHead(path, limits.lines, limits.bytes, head, error)) {
        guess.refusal = Refusal{0, error};
        return false;
    }
    guess.rowsRead = head.lines.empty() ? 0 : head.lines.back().number;
    guess.bytesRead = head.bytesRead;
    guess.wholeFile = head.wholeFile;
    Refusal refusal;
    read.dialect = GuessDialect(head, refusal);
    if (!read.dialect) {
        guess.refusal = refusal;
        return false;
    }
    guess.findings = read.dialect->findings;
    read.sample = SplitHead(head, read.dialect->dialect);
    read.context.delimiter = read.dialect->dialect.Text();
    read.context.fieldCount = read.dialect->fieldCount;
    if (read.dialect->decimalName == "Comma")
        read.decimal = std::string(1, ',');
    return true;
}

bool ReadExcelHead(const std::string& path, const GuessLimits& limits, TemplateGuess& guess, ReadHead& read)
{
    std::string error;
    Sample& sample = read.sample;
    if (!ReadSheetSample(path, limits.lines, sample, error)) {
        guess.refusal = Refusal{0, error};
        return false;
    }
    guess.rowsRead = sample.rowsRead;
    guess.wholeFile = sample.wholeFile;
    guess.sheet = sample.sheet;
    if (sample.rows.empty()) {
        guess.refusal = Refusal{0, "the workbook's sheets hold no cells"};
        return false;
    }
    for (const SampleRow& row : sample.rows)
        read.context.fieldCount = std::max(read.context.fieldCount, row.cells.size());
    for (SampleRow& row : sample.rows)
        row.cells.resize(read.context.fieldCount);
    if (sample.sheet != 1)
        guess.findings.push_back({"ExcelSheet", std::to_string(sample.sheet), "the sheets before it hold no cells", ""});
    return true;
}

std::unique_ptr<CSpecification> MakeTemplate(InputKind kind, const ReadHead& read)
{
    if (kind == InputKind::Excel) {
        auto excel = std::make_unique<CExcelSpecification>();
        excel->m_DataDesc.m_nExcelSheet = read.sample.sheet;
        return excel;
    }
    auto ascii = std::make_unique<CAsciiSpecification>();
    const Dialect& dialect = read.dialect->dialect;
    ascii->m_strDelimiter = dialect.delimiterName;
    ascii->m_strDefDelimiter = dialect.userDelimiter;
    ascii->m_bIgnoreConsecutiveDelimiters = dialect.consecutive ? 1 : 0;
    ascii->m_bIgnoreBegginingOfLineDelimiters = dialect.leading ? 1 : 0;
    ascii->m_strDecimalSeparator = read.dialect->decimalName;
    return ascii;
}

} // namespace

TemplateGuess GuessTemplate(const std::string& path, InputKind kind, const GuessLimits& limits)
{
    TemplateGuess guess;
    guess.file = path;
    guess.kind = kind;
    ReadHead read;
    read.context.fileName = sys::FileTitle(path);
    const bool readable = kind == InputKind::Ascii ? ReadAsciiHead(path, limits, guess, read)
                                                   : ReadExcelHead(path, limits, guess, read);
    if (!readable)
        return guess;

    Refusal refusal;
    const std::optional<TimeLayout> time = GuessTime(read.sample, read.context, guess.findings, refusal);
    const std::optional<ItemLayout> items =
        time ? GuessItems(read.sample, *time, read.context, read.decimal, guess.findings, refusal) : std::nullopt;
    if (!items) {
        guess.refusal = refusal;
        return guess;
    }
    guess.spec = MakeTemplate(kind, read);
    SetTime(*guess.spec, *time);
    SetItems(*guess.spec, *items, time->startRow);
    guess.refusal = Prove(path, kind, *guess.spec, std::min(kRowsProved, time->dataRows.size()));
    if (guess.refusal)
        guess.spec.reset();
    return guess;
}

} // namespace guess
