#include "guess/TextAccess.h"

#include "delimited/FieldSplitter.h"
#include "platform/system/TextLineReader.h"
#include "templates/AsciiSpecification.h"

namespace guess {

bool ReadTextHead(const std::string& path, size_t maxLines, size_t maxBytes, TextHead& head, std::string& error)
{
    head = TextHead();
    sys::TextLineReader source;
    if (sys::Status opened = source.Open(path); !opened) {
        error = opened.problem().Describe();
        return false;
    }
    std::string_view line;
    while (head.lines.size() < maxLines && source.BytesConsumed() < maxBytes) {
        if (!source.Next(line)) {
            if (!source.status()) {
                error = source.status().problem().Describe();
                return false;
            }
            head.wholeFile = true;
            break;
        }
        head.lines.push_back({source.LineNumber(), std::string(line)});
    }
    head.bytesRead = source.BytesConsumed();
    return true;
}

std::string Dialect::Text() const { return Rules().delimiter; }

delimited::Dialect Dialect::Rules() const
{
    CAsciiSpecification spec;
    spec.m_strDelimiter = delimiterName;
    spec.m_strDefDelimiter = userDelimiter;
    spec.m_bIgnoreConsecutiveDelimiters = consecutive ? 1 : 0;
    spec.m_bIgnoreBegginingOfLineDelimiters = leading ? 1 : 0;
    return spec.GetDialect();
}

LineSplitter::LineSplitter(const Dialect& dialect) : m_splitter(std::make_unique<delimited::FieldSplitter>(dialect.Rules()))
{
}

LineSplitter::~LineSplitter() = default;

std::vector<std::string> LineSplitter::Split(std::string_view line, bool* quoteError)
{
    m_splitter->Split(line);
    std::vector<std::string> fields;
    // Every call but the one that reports the end of the line gives a field.
    for (const delimited::FieldSplitter::Call& call : m_splitter->Calls())
        if (call.end != -1)
            fields.emplace_back(call.text);
    if (quoteError)
        *quoteError = m_splitter->QuoteError();
    return fields;
}

bool ReadStampText(std::string_view text, std::string_view format, StampPart part, StampFields& fields,
                   std::string_view extraSeparators)
{
    using Reads = sys::DateFormat::Reads;
    const Reads reads = part == StampPart::Date ? Reads::Date : part == StampPart::Time ? Reads::Time : Reads::DateTime;
    const sys::DateFormat compiled(format, reads, extraSeparators);
    return compiled.Read(text, fields);
}

bool StampOf(const StampFields& fields, Stamp& stamp)
{
    const std::optional<Stamp> value = converter::StampFromFields(fields);
    if (!value)
        return false;
    stamp = *value;
    return true;
}

StampFields FieldsOf(Stamp stamp) { return converter::FieldsFromStamp(stamp); }

bool StampOfSheetSerial(double serial, Stamp& stamp)
{
    const std::optional<Stamp> value = converter::StampFromSheetSerial(serial);
    if (!value)
        return false;
    stamp = *value;
    return true;
}

std::string StampText(Stamp stamp) { return converter::FormatStamp(stamp); }

ValueText ReadNumber(std::string_view field, std::string_view decimalSeparator, double& value)
{
    const converter::NumberReader reader(decimalSeparator);
    return reader.Read(field, value);
}

} // namespace guess
