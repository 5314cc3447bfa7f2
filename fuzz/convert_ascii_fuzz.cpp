// The engine's ASCII reader on arbitrary bytes, through a new template's defaults and through a
// comma template that ignores consecutive and leading delimiters; the fast splitter must also give
// NextField's calls for every line, and the date/time reader's shortcut its token-by-token reading.
#include "converter/AsciiSeriesReader.h"
#include "converter/StampText.h"
#include "delimited/FieldSplitter.h"
#include "platform/system/OleDateTime.h"
#include "platform/ui/UserInterface.h"
#include "templates/AsciiSpecification.h"
#include "tests/support/ScratchFile.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <string>

namespace {

// `passOver`: rows that do not read are passed over, as a dry run reads them.
void ReadWhole(const CSpecification& spec, const std::string& path, bool passOver = false)
{
    converter::AsciiSeriesReader reader(spec);
    if (!reader.Open(path))
        return;
    reader.PassOverFaultyRows(passOver);
    converter::Row row;
    while (reader.Next(row)) {
    }
}

void CompareSplits(const CSpecification& spec, const std::string& line)
{
    delimited::FieldSplitter splitter(spec.GetDialect());
    splitter.Split(line);
    CString copy = line;
    int pos = 0;
    size_t call = 0;
    do {
        const CString field = spec.NextField(copy, pos);
        if (call >= splitter.Calls().size() || splitter.Calls()[call].text != field || splitter.Calls()[call].end != pos)
            __builtin_trap();
        ++call;
    } while (pos != -1);
    if (call != splitter.Calls().size())
        __builtin_trap();
}

// The date/time reader's compact shortcut reads a text as its token-by-token reading does, and the
// stamp of the fields exists when the automation date of the same fields does.
void CompareStamps(const std::string& text)
{
    for (const char* format : {"YYYY/MM/DD HH:mm:ss", "DD.MM.YYYY hh:mm", "y-M-d", "YYYY-MM-DDTHH:mm:ss"}) {
        const sys::DateFormat dateFormat(format);
        sys::DateTimeFields reference, fields;
        const bool referenceOk = dateFormat.ReadTokens(text, reference);
        if (dateFormat.Read(text, fields) != referenceOk)
            __builtin_trap();
        if (!referenceOk)
            continue;
        if (std::memcmp(&fields, &reference, sizeof fields) != 0)
            __builtin_trap();
        COleDateTime automation;
        automation.SetDateTime(fields.year, fields.month, fields.day, fields.hour, fields.minute, fields.second);
        if (converter::StampFromFields(fields).has_value() != automation.IsValid())
            __builtin_trap();
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    static ui::SilentUserInterface silent;
    static ui::ScopedUserInterface scope(silent);
    const testsupport::ScratchFile input("velmora-convert-ascii-fuzz", ".txt", data, size);
    if (input.Path().empty())
        return 0;
    const std::string& path = input.Path();

    CAsciiSpecification defaults;
    ReadWhole(defaults, path);
    CAsciiSpecification comma;
    comma.m_strDelimiter = "Comma";
    comma.m_bIgnoreConsecutiveDelimiters = 1;
    comma.m_bIgnoreBegginingOfLineDelimiters = size % 2;
    comma.m_DataDesc.m_nUnitTypeOption = 0;
    comma.m_DataDesc.m_nUnitOption = 0;
    comma.m_DataDesc.m_nValueTypeOption = 0;
    ReadWhole(comma, path, (size / 2) % 2 == 1);

    const std::string text(reinterpret_cast<const char*>(data), size < 4096 ? size : 4096);
    size_t start = 0;
    while (start <= text.size()) {
        size_t end = text.find('\n', start);
        if (end == std::string::npos)
            end = text.size();
        CompareSplits(comma, text.substr(start, end - start));
        CompareStamps(text.substr(start, end - start));
        start = end + 1;
    }
    return 0;
}
