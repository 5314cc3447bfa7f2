#pragma once
// Small rbx0 files for the tests: a writer call that fills a file from tables, and raw byte access
// for damaging files.
#include "platform/rbx/RbxWriter.h"
#include "tests/support/Files.h"
#include "tests/support/ScratchFolder.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>
#include <vector>

namespace testsupport {

inline rbx::ItemInfo Item(const std::string& name, int dataType, double deleteValue = -999.0)
{
    rbx::ItemInfo item;
    item.name = name;
    item.itemTypeKey = 100;
    item.itemTypeText = "Water Level";
    item.unitKey = 1000;
    item.unitText = "meter";
    item.dataType = dataType;
    item.deleteValue = deleteValue;
    return item;
}

// Writes `times` with `values` (one row of ValueCount() per step); fails the test on a writer error.
inline void WriteRbxFile(const std::string& path, const rbx::FileDefinition& definition, const std::vector<double>& times,
                      const std::vector<std::vector<double>>& values)
{
    rbx::CRbxWriter writer;
    ASSERT_TRUE(writer.Open(path, definition)) << writer.status().problem().Describe();
    for (std::size_t s = 0; s < times.size(); ++s)
        ASSERT_TRUE(writer.WriteStep(times[s], values[s].data())) << writer.status().problem().Describe();
    ASSERT_TRUE(writer.Close()) << writer.status().problem().Describe();
}

inline rbx::FileDefinition Definition(std::vector<rbx::ItemInfo> items, bool calendar = true)
{
    rbx::FileDefinition definition;
    definition.title = "Test file";
    definition.calendar = calendar;
    definition.timeUnitKey = 1400;
    definition.timeUnitText = "second";
    if (calendar)
        definition.calendarStart = COleDateTime(2020, 1, 1, 0, 0, 0);
    definition.items = std::move(items);
    return definition;
}

inline std::vector<unsigned char> ReadBytes(const std::string& path)
{
    const std::string bytes = ReadFile(path);
    return {bytes.begin(), bytes.end()};
}

inline void WriteBytes(const std::string& path, const std::vector<unsigned char>& bytes)
{
    WriteFile(path, std::string_view(reinterpret_cast<const char*>(bytes.data()), bytes.size()));
}

} // namespace testsupport
