#pragma once
// What the guess tests share: a guessed template's values by their keys, and the series the
// engine's reader makes of a file with it.
#include "converter/Converter.h"
#include "converter/StampText.h"
#include "guess/TemplateGuess.h"
#include "templates/TemplateFileLayout.h"
#include "templates/TemplateReport.h"

#include <gtest/gtest.h>

#include <cmath>
#include <map>
#include <sstream>
#include <string>
#include <vector>

namespace guesstest {

inline const std::string kData = std::string(VELMORA_TEST_DATA) + "/guess/";

// The values of a template as `velmora template show` prints them ("Key: value", texts without
// their quotes, control characters as C escapes); "Item1" ... "ItemN" hold the item definitions as
// "title|type|unit|value type".
inline std::map<std::string, std::string> ValuesOf(CSpecification& spec, bool excel)
{
    std::ostringstream text;
    tmplfile::WriteTemplateText(spec, excel ? tmplfile::ExcelFileLayout() : tmplfile::AsciiFileLayout(), text);
    std::map<std::string, std::string> values;
    std::istringstream lines(text.str());
    for (std::string line; std::getline(lines, line);) {
        const size_t colon = line.find(": ");
        if (colon == std::string::npos || line[0] == ' ')
            continue;
        std::string value = line.substr(colon + 2);
        if (value.size() >= 2 && value.front() == '"' && value.back() == '"')
            value = value.substr(1, value.size() - 2);
        values[line.substr(0, colon)] = value;
    }
    for (size_t i = 0; i < spec.m_DataDesc.m_vecItemDefs.size(); ++i) {
        const CItemDefinition& item = spec.m_DataDesc.m_vecItemDefs[i];
        values["Item" + std::to_string(i + 1)] =
            item.m_strTitle + "|" + item.m_strType + "|" + item.m_strUnit + "|" + item.m_strValueType;
    }
    return values;
}

// A file read through a template by the engine's own reader, with the template's selection.
struct ReadSeries {
    std::string problem; // empty when every row read
    std::vector<std::string> names;
    std::vector<std::string> meta; // "type|unit|value type" per item
    std::vector<std::string> stamps;
    std::vector<std::vector<double>> values;
    size_t missing = 0;
};

inline ReadSeries ReadWith(const std::string& path, const CSpecification& spec, bool excel)
{
    ReadSeries series;
    const auto format = excel ? sys::FileFormat::Excel : sys::FileFormat::Ascii;
    std::unique_ptr<converter::SeriesReader> reader = converter::MakeReader(format, &spec);
    if (sys::Status opened = reader->Open(path); !opened) {
        series.problem = opened.problem().Describe();
        return series;
    }
    std::vector<size_t> selection(spec.m_arrSelItems.begin(), spec.m_arrSelItems.end());
    if (selection.empty())
        for (size_t i = 0; i < reader->Header().items.size(); ++i)
            selection.push_back(i);
    reader->Select(selection);
    for (size_t i : selection) {
        const converter::ItemInfo& item = reader->Header().items[i];
        series.names.push_back(item.name);
        series.meta.push_back(item.type + "|" + item.unit + "|" + item.valueType);
    }
    converter::Row row;
    while (reader->Next(row)) {
        series.stamps.push_back(converter::FormatStamp(row.stamp));
        series.values.push_back(row.values);
        for (double value : row.values)
            series.missing += converter::IsMissing(value) ? 1 : 0;
    }
    if (!reader->status())
        series.problem = reader->status().problem().Describe();
    return series;
}

// Each expected key holds the expected value in `values`; the message names the key.
inline void ExpectValues(const std::map<std::string, std::string>& expected,
                         const std::map<std::string, std::string>& values)
{
    for (const auto& [key, value] : expected) {
        const auto found = values.find(key);
        ASSERT_TRUE(found != values.end()) << "no value " << key;
        EXPECT_EQ(found->second, value) << key;
    }
}

inline void ExpectRow(const std::vector<double>& actual, const std::vector<double>& expected)
{
    ASSERT_EQ(actual.size(), expected.size());
    for (size_t i = 0; i < expected.size(); ++i) {
        if (std::isnan(expected[i]))
            EXPECT_TRUE(std::isnan(actual[i])) << "value " << i;
        else
            EXPECT_DOUBLE_EQ(actual[i], expected[i]) << "value " << i;
    }
}

// The series read is the one a layout table's row expects: its item names, first item, number of
// rows, first and last stamps, first row's values and missing values.
template <class Layout>
void ExpectSeries(const ReadSeries& series, const Layout& layout)
{
    ASSERT_EQ(series.problem, "");
    EXPECT_EQ(series.names, layout.names);
    ASSERT_FALSE(series.meta.empty());
    EXPECT_EQ(series.meta.front(), layout.firstItem);
    ASSERT_EQ(series.stamps.size(), layout.rows);
    EXPECT_EQ(series.stamps.front(), layout.first);
    ExpectRow(series.values.front(), layout.firstValues);
    EXPECT_EQ(series.stamps.back(), layout.last);
    EXPECT_EQ(series.missing, layout.missing);
}

} // namespace guesstest
