#include "guess/TextAccess.h"

#include "converter/FieldSplitter.h"
#include "converter/LineSource.h"
#include "templates/AsciiSpecification.h"

namespace guess {

bool ReadTextHead(const std::string& path, size_t maxLines, size_t maxBytes, TextHead& head, std::string& error)
{
    head = TextHead();
    converter::LineSource source;
    if (converter::Status opened = source.Open(path); !opened) {
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

std::string Dialect::Text() const
{
    CAsciiSpecification spec;
    spec.m_strDelimiter = delimiterName;
    spec.m_strDefDelimiter = userDelimiter;
    return spec.GetDelimiterString();
}

LineSplitter::LineSplitter(const Dialect& dialect) : m_spec(std::make_unique<CAsciiSpecification>())
{
    m_spec->m_strDelimiter = dialect.delimiterName;
    m_spec->m_strDefDelimiter = dialect.userDelimiter;
    m_spec->m_bIgnoreConsecutiveDelimiters = dialect.consecutive ? 1 : 0;
    m_spec->m_bIgnoreBegginingOfLineDelimiters = dialect.leading ? 1 : 0;
    m_splitter = std::make_unique<converter::FieldSplitter>(*m_spec);
}

LineSplitter::~LineSplitter() = default;

std::vector<std::string> LineSplitter::Split(std::string_view line, bool* quoteError)
{
    m_splitter->Split(line);
    std::vector<std::string> fields;
    // Every call but the one that reports the end of the line gives a field.
    for (const converter::FieldSplitter::Call& call : m_splitter->Calls())
        if (call.end != -1)
            fields.emplace_back(call.text);
    if (quoteError)
        *quoteError = m_splitter->QuoteError();
    return fields;
}

bool ReadStampText(std::string_view text, std::string_view format, StampPart part, StampFields& fields,
                   std::string_view extraSeparators)
{
    using Reads = converter::DateFormat::Reads;
    const Reads reads = part == StampPart::Date ? Reads::Date : part == StampPart::Time ? Reads::Time : Reads::DateTime;
    const converter::DateFormat compiled(format, reads, extraSeparators);
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
