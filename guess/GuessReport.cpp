#include "guess/GuessReport.h"

#include "platform/system/Text.h"
#include "templates/TemplateFileLayout.h"
#include "templates/TemplateReport.h"

#include <sstream>

namespace guess {
namespace {

std::string Escaped(std::string_view text) { return text::EscapeControls(text); }

std::string WhatWasRead(const TemplateGuess& guess)
{
    std::string what = guess.kind == InputKind::Excel
                            ? text::Format("Read the first %ld rows of sheet %d of ", guess.rowsRead, guess.sheet)
                            : text::Format("Read the first %ld lines (%llu bytes) of ", guess.rowsRead,
                                           static_cast<unsigned long long>(guess.bytesRead));
    what += Escaped(guess.file);
    what += guess.wholeFile ? ", the whole file." : "; the rest of the file was not read.";
    return what;
}

void AppendJsonField(std::string& out, const char* name, std::string_view value)
{
    out += "\"";
    out += name;
    out += "\":";
    text::AppendJsonString(out, value);
}

} // namespace

std::string ExplainGuess(const TemplateGuess& guess)
{
    std::string out = WhatWasRead(guess) + "\n";
    for (const Finding& finding : guess.findings) {
        out += finding.key + " = " + Escaped(finding.value) + "\n";
        out += "  because: " + finding.evidence + "\n";
        if (!finding.ambiguity.empty())
            out += "  ambiguous: " + finding.ambiguity + "\n";
    }
    if (guess.refusal)
        out += "Refused: " + DescribeRefusal(guess) + "\n";
    return out;
}

std::string DescribeRefusal(const TemplateGuess& guess)
{
    if (!guess.refusal)
        return {};
    std::string where = Escaped(guess.file);
    if (guess.refusal->line > 0)
        where += ":" + std::to_string(guess.refusal->line);
    // A reason from a reader names the file already.
    const std::string& reason = guess.refusal->reason;
    if (reason.rfind(guess.file, 0) == 0)
        return "cannot be read as a time series: " + Escaped(reason);
    return where + ": cannot be read as a time series: " + Escaped(reason);
}

std::string GuessJson(const TemplateGuess& guess)
{
    std::string out = "{\"ok\":";
    out += guess.spec ? "true," : "false,";
    AppendJsonField(out, "file", guess.file);
    out += ",";
    AppendJsonField(out, "kind", guess.kind == InputKind::Excel ? "excel" : "ascii");
    out += text::Format(",\"read\":{\"rows\":%ld,\"bytes\":%llu,\"wholeFile\":%s}", guess.rowsRead,
                        static_cast<unsigned long long>(guess.bytesRead), guess.wholeFile ? "true" : "false");
    if (guess.spec) {
        std::ostringstream json;
        tmplfile::WriteTemplateJson(*guess.spec,
                                    guess.kind == InputKind::Excel ? tmplfile::ExcelFileLayout() : tmplfile::AsciiFileLayout(),
                                    json);
        std::string text = json.str();
        while (!text.empty() && text.back() == '\n')
            text.pop_back();
        out += ",\"template\":" + text;
    }
    out += ",\"findings\":[";
    for (size_t i = 0; i < guess.findings.size(); ++i) {
        const Finding& finding = guess.findings[i];
        out += i ? ",{" : "{";
        AppendJsonField(out, "key", finding.key);
        out += ",";
        AppendJsonField(out, "value", finding.value);
        out += ",";
        AppendJsonField(out, "evidence", finding.evidence);
        if (!finding.ambiguity.empty()) {
            out += ",";
            AppendJsonField(out, "ambiguity", finding.ambiguity);
        }
        out += "}";
    }
    out += "]";
    if (guess.refusal) {
        out += text::Format(",\"refusal\":{\"line\":%ld,", guess.refusal->line);
        AppendJsonField(out, "reason", guess.refusal->reason);
        out += "}";
    }
    return out + "}\n";
}

} // namespace guess
