#include "platform/rbx/Crc32.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <random>
#include <string>
#include <vector>

namespace {

std::vector<unsigned char> RandomBytes(std::size_t size, unsigned seed)
{
    std::mt19937 random(seed);
    std::vector<unsigned char> bytes(size);
    for (auto& b : bytes)
        b = static_cast<unsigned char>(random());
    return bytes;
}

TEST(Crc32, KnownCheckValues)
{
    const std::string nine = "123456789";
    EXPECT_EQ(rbx::Crc32(0, nine.data(), nine.size()), 0xCBF43926u);
    EXPECT_EQ(rbx::TableCrc32(0, nine.data(), nine.size()), 0xCBF43926u);
    EXPECT_EQ(rbx::Crc32(0, nine.data(), 0), 0u);
    // 64 zero bytes and 64 0xFF bytes: long enough for the folding path.
    const std::vector<unsigned char> zeros(64, 0), ones(64, 0xFF);
    EXPECT_EQ(rbx::Crc32(0, zeros.data(), zeros.size()), 0x758D6336u);
    EXPECT_EQ(rbx::Crc32(0, ones.data(), ones.size()), 0x0F6187BAu);
}

// Every length around the 16- and 64-byte steps of the folding path, from several starting values.
TEST(Crc32, AgreesWithTheTablesForEveryLengthAndStart)
{
    const std::vector<unsigned char> bytes = RandomBytes(1100, 7);
    for (std::uint32_t start : {0u, 1u, 0xFFFFFFFFu, 0x12345678u})
        for (std::size_t size = 0; size <= bytes.size(); size += (size < 300 ? 1 : 97))
            for (std::size_t offset : {std::size_t{0}, std::size_t{3}}) {
                if (offset + size > bytes.size())
                    continue;
                ASSERT_EQ(rbx::Crc32(start, bytes.data() + offset, size), rbx::TableCrc32(start, bytes.data() + offset, size))
                    << "size " << size << " offset " << offset << " start " << start;
            }
}

TEST(Crc32, PiecesContinueToTheWholeValue)
{
    const std::vector<unsigned char> bytes = RandomBytes(70000, 11);
    const std::uint32_t whole = rbx::Crc32(0, bytes.data(), bytes.size());
    EXPECT_EQ(whole, rbx::TableCrc32(0, bytes.data(), bytes.size()));
    for (std::size_t cut : {std::size_t{1}, std::size_t{63}, std::size_t{64}, std::size_t{65}, std::size_t{4097}}) {
        const std::uint32_t first = rbx::Crc32(0, bytes.data(), cut);
        EXPECT_EQ(rbx::Crc32(first, bytes.data() + cut, bytes.size() - cut), whole) << "cut at " << cut;
    }
}

} // namespace
