// Damaged and hostile files: every one gives an error naming the file, none crashes or reads on.
#include "tests/support/RbxFiles.h"

#include "checksums/Crc32.h"
#include "platform/rbx/Rbx.h"
#include "platform/rbx/RbxBytes.h"
#include "platform/rbx/RbxHeaderCodec.h"
#include "platform/rbx/RbxReader.h"

#include <cstring>

using namespace testsupport;

namespace {

// Opens and reads every step; false when any of it fails.
bool ReadsCleanly(const std::string& path, rbx::VerifyChecksum verify, std::string* error = nullptr)
{
    rbx::CRbxReader reader;
    bool ok = reader.Open(path, verify).ok();
    std::vector<double> times(16), values(16 * 4);
    std::size_t got = 1;
    while (ok && got > 0)
        ok = reader.ReadSteps(16, times.data(), values.data(), got);
    if (error)
        *error = reader.status().problem().Describe();
    return ok;
}

class DamagedFile : public ::testing::Test {
protected:
    void SetUp() override
    {
        path = folder.File("good.rbx0");
        WriteRbxFile(path, Definition({Item("Level", rbx::kFloat32), Item("Flow", rbx::kInt32)}), {0, 60, 120},
                  {{1.5, 10}, {2.5, 20}, {3.5, 30}});
        bytes = ReadBytes(path);
        headerSize = rbx::bytes::Get<std::uint32_t>(bytes.data() + rbx::layout::kHeaderSize);
    }

    // Changes a header field and makes the header checksum right again, as a hostile file would.
    template <typename T>
    void ForgeHeaderField(std::size_t offset, T value)
    {
        std::memcpy(bytes.data() + offset, &value, sizeof(T));
        std::memset(bytes.data() + rbx::layout::kHeaderChecksum, 0, 4);
        const std::uint32_t crc = checksum::Crc32(0, bytes.data(), headerSize);
        std::memcpy(bytes.data() + rbx::layout::kHeaderChecksum, &crc, 4);
    }

    std::string Damaged()
    {
        const std::string damaged = folder.File("damaged.rbx0");
        WriteBytes(damaged, bytes);
        return damaged;
    }

    ScratchFolder folder;
    std::string path;
    std::vector<unsigned char> bytes;
    std::uint32_t headerSize = 0;
};

TEST_F(DamagedFile, TheUndamagedFileReads) { EXPECT_TRUE(ReadsCleanly(path, rbx::VerifyChecksum::Auto)); }

TEST_F(DamagedFile, EveryTruncationIsAnError)
{
    const auto good = bytes;
    for (std::size_t length = 0; length < good.size(); ++length) {
        bytes.assign(good.begin(), good.begin() + static_cast<std::ptrdiff_t>(length));
        const std::string damaged = Damaged();
        std::string error;
        EXPECT_FALSE(ReadsCleanly(damaged, rbx::VerifyChecksum::AtEnd, &error)) << "length " << length;
        EXPECT_EQ(error.rfind(damaged + ": ", 0), 0u) << error;
    }
}

TEST_F(DamagedFile, EveryChangedByteIsAnErrorWithEitherWayOfChecking)
{
    const auto good = bytes;
    for (std::size_t offset = 0; offset < good.size(); ++offset) {
        bytes = good;
        bytes[offset] ^= 0x5A;
        const std::string damaged = Damaged();
        EXPECT_FALSE(ReadsCleanly(damaged, rbx::VerifyChecksum::AtOpen)) << "offset " << offset;
        EXPECT_FALSE(ReadsCleanly(damaged, rbx::VerifyChecksum::AtEnd)) << "offset " << offset;
    }
}

TEST_F(DamagedFile, DamagedDataFailAtOpenOrAtTheLastStep)
{
    bytes[headerSize + 9] ^= 1; // inside the first step's first value
    const std::string damaged = Damaged();
    rbx::CRbxReader atOpen;
    EXPECT_FALSE(atOpen.Open(damaged, rbx::VerifyChecksum::AtOpen));
    EXPECT_NE(atOpen.status().problem().Describe().find("data checksum"), std::string::npos) << atOpen.status().problem().Describe();

    rbx::CRbxReader atEnd;
    ASSERT_TRUE(atEnd.Open(damaged, rbx::VerifyChecksum::AtEnd)) << atEnd.status().problem().Describe();
    double times[3], values[6];
    std::size_t got = 0;
    EXPECT_TRUE(atEnd.ReadSteps(2, times, values, got));
    EXPECT_FALSE(atEnd.ReadSteps(2, times, values, got));
    EXPECT_NE(atEnd.status().problem().Describe().find("data checksum"), std::string::npos) << atEnd.status().problem().Describe();
}

TEST_F(DamagedFile, ForgedHeadersWithAbsurdCountsAreRejected)
{
    struct Case {
        const char* what;
        std::size_t offset;
        std::uint64_t value;
        int width;
        const char* message;
    };
    const std::vector<Case> cases = {
        {"huge item count", rbx::layout::kItemCount, 0xFFFFFFFFu, 4, "impossible item count"},
        {"one item more", rbx::layout::kItemCount, 3, 4, "item 3"},
        {"huge step count", rbx::layout::kSteps, 0xFFFFFFFFFFFFFFFFull, 8, "truncated"},
        {"one step more", rbx::layout::kSteps, 4, 8, "truncated"},
        {"one step less", rbx::layout::kSteps, 2, 8, "unexpected bytes after the data"},
        {"record size", rbx::layout::kRecordSize, 0x7FFFFFFF, 4, "record size"},
        {"file type", rbx::layout::kFileType, 2, 2, "unknown file type 2"},
        {"axis type", rbx::layout::kAxisType, 9, 2, "unknown time axis type 9"},
        {"data type", rbx::layout::kDataType, 2, 2, "data type"},
        {"item data type", 96 + 2 + 6 + 2 + 9 + 2, 77, 2, "item 1"},
    };
    const auto good = bytes;
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        bytes = good;
        if (c.width == 2)
            ForgeHeaderField<std::uint16_t>(c.offset, static_cast<std::uint16_t>(c.value));
        else if (c.width == 4)
            ForgeHeaderField<std::uint32_t>(c.offset, static_cast<std::uint32_t>(c.value));
        else
            ForgeHeaderField<std::uint64_t>(c.offset, c.value);
        std::string error;
        EXPECT_FALSE(ReadsCleanly(Damaged(), rbx::VerifyChecksum::AtEnd, &error));
        EXPECT_NE(error.find(c.message), std::string::npos) << error;
    }
}

TEST_F(DamagedFile, HeaderSizeBeyondTheFileOrTheLimit)
{
    const auto good = bytes;
    for (std::uint32_t size : {std::uint32_t{0}, std::uint32_t{95}, headerSize + 1000, 0xFFFFFFFFu}) {
        bytes = good;
        ForgeHeaderField<std::uint32_t>(rbx::layout::kHeaderSize, size);
        std::string error;
        EXPECT_FALSE(ReadsCleanly(Damaged(), rbx::VerifyChecksum::AtEnd, &error)) << size;
        EXPECT_FALSE(error.empty());
    }
}

TEST_F(DamagedFile, BadMagicAndVersionAreNamed)
{
    bytes[0] = 'X';
    std::string error;
    EXPECT_FALSE(ReadsCleanly(Damaged(), rbx::VerifyChecksum::AtEnd, &error));
    EXPECT_NE(error.find("not an rbx0 file"), std::string::npos) << error;
    bytes[0] = 'R';
    bytes[rbx::layout::kVersion] = 2;
    EXPECT_FALSE(ReadsCleanly(Damaged(), rbx::VerifyChecksum::AtEnd, &error));
    EXPECT_NE(error.find("version 2"), std::string::npos) << error;
}

TEST_F(DamagedFile, TimesThatGoBackAreCaughtEvenWithAMatchingChecksum)
{
    const std::uint32_t record = rbx::bytes::Get<std::uint32_t>(bytes.data() + rbx::layout::kRecordSize);
    const double back = -5.0;
    std::memcpy(bytes.data() + headerSize + 2 * record, &back, sizeof back);
    const std::uint32_t dataCrc = checksum::Crc32(0, bytes.data() + headerSize, bytes.size() - headerSize);
    ForgeHeaderField<std::uint32_t>(rbx::layout::kDataChecksum, dataCrc);
    std::string error;
    EXPECT_FALSE(ReadsCleanly(Damaged(), rbx::VerifyChecksum::Auto, &error));
    EXPECT_NE(error.find("step 3"), std::string::npos) << error;
    EXPECT_NE(error.find(std::to_string(headerSize + 2 * record)), std::string::npos) << "names the offset: " << error;
}

TEST_F(DamagedFile, TheCallsFailCleanlyAndSayWhy)
{
    bytes[headerSize] ^= 0xFF;
    const std::string damaged = Damaged();
    rbxHeader* header = reinterpret_cast<rbxHeader*>(1);
    rbxFile* file = reinterpret_cast<rbxFile*>(1);
    EXPECT_NE(rbxFileRead(damaged.c_str(), &header, &file), 0);
    EXPECT_EQ(header, nullptr);
    EXPECT_EQ(file, nullptr);
    EXPECT_NE(std::string(rbxLastError()).find(damaged), std::string::npos);

    EXPECT_NE(rbxFileRead(folder.File("missing.rbx0").c_str(), &header, &file), 0);
    EXPECT_NE(rbxFileRead(folder.File("").c_str(), &header, &file), 0) << "a folder is not a file";
    EXPECT_EQ(rbxGetNoOfItems(nullptr), 0);
    EXPECT_EQ(rbxItemD(nullptr, 1), nullptr);
    EXPECT_NE(rbxGetItemInfo(nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr), 0);
    double t = 0;
    EXPECT_NE(rbxReadItemTimeStep(nullptr, nullptr, &t, nullptr), 0);
}

} // namespace
