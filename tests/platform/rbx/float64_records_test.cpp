// Files whose items are all 64-bit floating point have their records made straight from the step's
// values: they must be the files the general packing makes, gaps as each item's delete value.
#include "tests/support/RbxFiles.h"
#include "platform/rbx/RbxReader.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <cmath>
#include <cstring>
#include <random>

namespace {

using namespace testsupport;

rbx::ItemInfo Profile(const std::string& name, std::uint32_t elements, double deleteValue)
{
    rbx::ItemInfo item = Item(name, rbx::kFloat64, deleteValue);
    item.axisType = rbx::kProfileItem;
    item.elementCount = elements;
    return item;
}

TEST(RbxWriter, DoubleRecordsAreTheRecordsOfTheGeneralPacking)
{
    ScratchFolder folder;
    const auto definition =
        Definition({Item("A", rbx::kFloat64, -999.0), Profile("P", 3, -1e300), Item("B", rbx::kFloat64, 7.5)});
    const std::size_t values = 5;
    const std::size_t steps = 30000; // 48-byte records: past the first write of the buffer
    std::mt19937_64 random(8);
    std::vector<std::vector<double>> rows(steps, std::vector<double>(values));
    for (auto& row : rows)
        for (double& value : row)
            value = random() % 5 == 0 ? std::nan("") : std::ldexp(static_cast<double>(random() % 1000000) - 500000.0, -7);

    const std::string direct = folder.File("direct.rbx0");
    rbx::CRbxWriter writer;
    ASSERT_TRUE(writer.Open(direct, definition)) << writer.status().problem().Describe();
    for (std::size_t s = 0; s < steps; ++s)
        ASSERT_TRUE(writer.WriteStep(static_cast<double>(s), rows[s].data())) << writer.status().problem().Describe();
    ASSERT_TRUE(writer.Close()) << writer.status().problem().Describe();

    // The same records packed by hand, each gap its item's delete value.
    const double deletes[values] = {-999.0, -1e300, -1e300, -1e300, 7.5};
    const std::string packed = folder.File("packed.rbx0");
    rbx::CRbxWriter raw;
    ASSERT_TRUE(raw.Open(packed, definition)) << raw.status().problem().Describe();
    for (std::size_t s = 0; s < steps; ++s) {
        double record[values];
        for (std::size_t v = 0; v < values; ++v)
            record[v] = std::isnan(rows[s][v]) ? deletes[v] : rows[s][v];
        ASSERT_TRUE(raw.WriteRawStep(static_cast<double>(s), record)) << raw.status().problem().Describe();
    }
    ASSERT_TRUE(raw.Close()) << raw.status().problem().Describe();
    EXPECT_EQ(ReadBytes(direct), ReadBytes(packed));

    rbx::CRbxReader reader;
    ASSERT_TRUE(reader.Open(direct, rbx::VerifyChecksum::AtEnd)) << reader.status().problem().Describe();
    EXPECT_EQ(reader.Header().fileType, rbx::kPerItemDeleteValue);
    std::vector<double> times(steps), read(steps * values);
    std::size_t got = 0;
    ASSERT_TRUE(reader.ReadSteps(steps, times.data(), read.data(), got)) << reader.status().problem().Describe();
    ASSERT_EQ(got, steps);
    for (std::size_t s = 0; s < steps; ++s)
        for (std::size_t v = 0; v < values; ++v)
            ASSERT_EQ(read[s * values + v], std::isnan(rows[s][v]) ? deletes[v] : rows[s][v]) << s << " " << v;
}

TEST(RbxWriter, AFailedDoubleStepStopsTheFile)
{
    ScratchFolder folder;
    const std::string path = folder.File("failed.rbx0");
    rbx::CRbxWriter writer;
    ASSERT_TRUE(writer.Open(path, Definition({Item("A", rbx::kFloat64)}, false)));
    const double value = 1.0;
    ASSERT_TRUE(writer.WriteStep(1.0, &value));
    EXPECT_FALSE(writer.WriteStep(1.0, &value)); // not after the step before
    EXPECT_FALSE(writer.WriteStep(2.0, &value));
    EXPECT_EQ(writer.StepCount(), 1u);
    EXPECT_FALSE(writer.Close());
    EXPECT_FALSE(std::filesystem::exists(path));
}

} // namespace
