#include "platform/rbx/RbxHeaderCodec.h"

#include "checksums/Crc32.h"
#include "platform/rbx/RbxBytes.h"
#include "platform/system/OleDateTime.h"
#include "platform/system/Text.h"

#include <cmath>

namespace rbx {
namespace {

// Axis type, data type, value type, reserved, element count, item type key, unit key, three text
// lengths: the least an item takes.
constexpr std::size_t kMinItemSize = 2 + 2 + 2 + 2 + 4 + 4 + 4 + 3 * 2;

void PutFixedText(std::vector<unsigned char>& bytes, std::size_t offset, const CString& value, std::size_t width)
{
    for (std::size_t i = 0; i < width; ++i)
        bytes[offset + i] = i < value.size() ? static_cast<unsigned char>(value[i]) : 0;
}

CString GetFixedText(const unsigned char* data, std::size_t offset, std::size_t width)
{
    CString value;
    for (std::size_t i = 0; i < width && data[offset + i] != 0; ++i)
        value += static_cast<char>(data[offset + i]);
    return value;
}

// Over the whole header, its own field counted as zero bytes.
std::uint32_t HeaderChecksum(const unsigned char* data, std::size_t size)
{
    std::uint32_t crc = checksum::Crc32(0, data, layout::kHeaderChecksum);
    const unsigned char zero[4] = {0, 0, 0, 0};
    crc = checksum::Crc32(crc, zero, 4);
    return checksum::Crc32(crc, data + layout::kHeaderChecksum + 4, size - layout::kHeaderChecksum - 4);
}

bool DigitsAt(const CString& s, std::size_t pos, std::size_t count, int& value)
{
    value = 0;
    for (std::size_t i = pos; i < pos + count; ++i) {
        if (s[i] < '0' || s[i] > '9')
            return false;
        value = value * 10 + (s[i] - '0');
    }
    return true;
}

bool DecodeItem(bytes::Cursor& cursor, int fileType, ItemInfo& item, CString& error)
{
    item.axisType = cursor.Read<std::uint16_t>();
    item.dataType = cursor.Read<std::uint16_t>();
    item.valueType = cursor.Read<std::uint16_t>();
    cursor.Read<std::uint16_t>();
    item.elementCount = cursor.Read<std::uint32_t>();
    item.itemTypeKey = cursor.Read<std::int32_t>();
    item.unitKey = cursor.Read<std::int32_t>();
    if (fileType == kPerItemDeleteValue)
        item.deleteValue = cursor.Read<double>();
    item.name = cursor.ReadText();
    item.itemTypeText = cursor.ReadText();
    item.unitText = cursor.ReadText();
    if (cursor.Failed()) {
        error = "the header ends inside the item";
        return false;
    }
    if (item.axisType != kScalarItem && item.axisType != kProfileItem) {
        error = text::Format("unknown item axis type %d", item.axisType);
        return false;
    }
    if (!IsValidDataType(item.dataType)) {
        error = text::Format("unknown data type %d", item.dataType);
        return false;
    }
    const bool countOk = item.axisType == kScalarItem ? item.elementCount == 1
                                                       : item.elementCount >= 1 && item.elementCount <= kMaxElementsPerItem;
    if (!countOk) {
        error = text::Format("impossible number of values per step %u", item.elementCount);
        return false;
    }
    return true;
}

bool CheckAxis(const TimeAxis& axis, CString& error)
{
    if (axis.type < kEquidistantRelative || axis.type > kNonEquidistantCalendar) {
        error = text::Format("unknown time axis type %d", axis.type);
        return false;
    }
    if (!std::isfinite(axis.startOffset) || !std::isfinite(axis.step)) {
        error = "the time axis start or step is not a number";
        return false;
    }
    if (IsEquidistantAxis(axis.type) && axis.steps > 1 && !(axis.step > 0.0)) {
        error = "an equidistant time axis with a step that is not positive";
        return false;
    }
    if (IsCalendarAxis(axis.type) && !(IsValidStartDate(axis.startDate) && IsValidStartTime(axis.startTime))) {
        error = "the calendar start \"" + axis.startDate + " " + axis.startTime + "\" is not a date and time";
        return false;
    }
    return true;
}

bool CheckDataSize(const FileHeader& header, std::uint64_t headerSize, std::uint64_t fileSize, CString& error)
{
    const std::uint64_t dataBytes = fileSize - headerSize;
    const std::uint64_t record = header.recordSize;
    const std::uint64_t steps = header.axis.steps;
    if (steps > dataBytes / record || steps * record != dataBytes) {
        const bool truncated = steps > dataBytes / record || steps * record > dataBytes;
        error = text::Format("%s: the header promises %llu steps of %llu bytes, but %llu bytes of data follow it",
                             truncated ? "the file is truncated" : "unexpected bytes after the data",
                             static_cast<unsigned long long>(steps), static_cast<unsigned long long>(record),
                             static_cast<unsigned long long>(dataBytes));
        return false;
    }
    return true;
}

} // namespace

std::uint32_t ComputeRecordSize(const std::vector<ItemInfo>& items)
{
    std::uint64_t size = 8;
    for (const ItemInfo& item : items) {
        size += static_cast<std::uint64_t>(DataTypeSize(item.dataType)) * item.elementCount;
        if (size > kMaxRecordSize)
            return 0;
    }
    return static_cast<std::uint32_t>(size);
}

int CommonDataType(const std::vector<ItemInfo>& items)
{
    if (items.empty())
        return 0;
    for (const ItemInfo& item : items)
        if (item.dataType != items.front().dataType)
            return 0;
    return items.front().dataType;
}

bool IsValidStartDate(const CString& date)
{
    int year = 0, month = 0, day = 0;
    if (date.size() != 10 || date[4] != '-' || date[7] != '-' || !DigitsAt(date, 0, 4, year)
        || !DigitsAt(date, 5, 2, month) || !DigitsAt(date, 8, 2, day))
        return false;
    return year >= 100 && IsValidCalendarDate(year, month, day);
}

bool IsValidStartTime(const CString& time)
{
    int hour = 0, minute = 0, second = 0;
    if (time.size() != 8 || time[2] != ':' || time[5] != ':' || !DigitsAt(time, 0, 2, hour)
        || !DigitsAt(time, 3, 2, minute) || !DigitsAt(time, 6, 2, second))
        return false;
    return hour < 24 && minute < 60 && second < 60;
}

std::vector<unsigned char> EncodeHeader(const FileHeader& header)
{
    std::vector<unsigned char> bytes(kFixedHeaderSize, 0);
    for (std::size_t i = 0; i < 4; ++i)
        bytes[i] = static_cast<unsigned char>(kMagic[i]);
    bytes::PutAt<std::uint16_t>(bytes, layout::kVersion, kFormatVersion);
    bytes::PutAt<std::uint16_t>(bytes, layout::kFileType, static_cast<std::uint16_t>(header.fileType));
    bytes::PutAt<std::uint16_t>(bytes, layout::kDataType, static_cast<std::uint16_t>(header.dataType));
    bytes::PutAt<std::uint32_t>(bytes, layout::kItemCount, static_cast<std::uint32_t>(header.items.size()));
    bytes::PutAt<std::uint32_t>(bytes, layout::kRecordSize, header.recordSize);
    bytes::PutAt<std::int32_t>(bytes, layout::kStartIndex, header.axis.startIndex);
    bytes::PutAt<std::int32_t>(bytes, layout::kTimeUnitKey, header.axis.unitKey);
    bytes::PutAt<double>(bytes, layout::kDeleteValue, header.fileType == kSharedDeleteValue ? header.deleteValue : 0.0);

    bytes::PutText(bytes, header.axis.unitText);
    bytes::PutText(bytes, header.title);
    for (const ItemInfo& item : header.items) {
        bytes::Put<std::uint16_t>(bytes, static_cast<std::uint16_t>(item.axisType));
        bytes::Put<std::uint16_t>(bytes, static_cast<std::uint16_t>(item.dataType));
        bytes::Put<std::uint16_t>(bytes, static_cast<std::uint16_t>(item.valueType));
        bytes::Put<std::uint16_t>(bytes, 0);
        bytes::Put<std::uint32_t>(bytes, item.elementCount);
        bytes::Put<std::int32_t>(bytes, item.itemTypeKey);
        bytes::Put<std::int32_t>(bytes, item.unitKey);
        if (header.fileType == kPerItemDeleteValue)
            bytes::Put<double>(bytes, item.deleteValue);
        bytes::PutText(bytes, item.name);
        bytes::PutText(bytes, item.itemTypeText);
        bytes::PutText(bytes, item.unitText);
    }
    bytes::PutAt<std::uint32_t>(bytes, layout::kHeaderSize, static_cast<std::uint32_t>(bytes.size()));
    PatchHeader(bytes, header);
    return bytes;
}

void PatchHeader(std::vector<unsigned char>& bytes, const FileHeader& header)
{
    bytes::PutAt<std::uint16_t>(bytes, layout::kAxisType, static_cast<std::uint16_t>(header.axis.type));
    bytes::PutAt<std::uint64_t>(bytes, layout::kSteps, header.axis.steps);
    bytes::PutAt<double>(bytes, layout::kStartOffset, header.axis.startOffset);
    bytes::PutAt<double>(bytes, layout::kStep, header.axis.step);
    PutFixedText(bytes, layout::kStartDate, header.axis.startDate, 10);
    PutFixedText(bytes, layout::kStartTime, header.axis.startTime, 8);
    bytes::PutAt<std::uint32_t>(bytes, layout::kDataChecksum, header.dataChecksum);
    bytes::PutAt<std::uint32_t>(bytes, layout::kHeaderChecksum, HeaderChecksum(bytes.data(), bytes.size()));
}

bool DecodeFixedPart(const unsigned char* data, std::size_t size, std::uint32_t& headerSize, CString& error)
{
    if (size < kFixedHeaderSize) {
        error = text::Format("too short for an rbx0 header (%zu bytes)", size);
        return false;
    }
    for (std::size_t i = 0; i < 4; ++i) {
        if (data[i] != static_cast<unsigned char>(kMagic[i])) {
            error = "not an rbx0 file (bad magic at offset 0)";
            return false;
        }
    }
    const auto version = bytes::Get<std::uint16_t>(data + layout::kVersion);
    if (version != kFormatVersion) {
        error = text::Format("rbx0 format version %u is not supported (offset 4)", version);
        return false;
    }
    headerSize = bytes::Get<std::uint32_t>(data + layout::kHeaderSize);
    if (headerSize < kFixedHeaderSize || headerSize > kMaxHeaderSize) {
        error = text::Format("impossible header size %u (offset 12)", headerSize);
        return false;
    }
    return true;
}

bool DecodeHeader(const unsigned char* data, std::size_t size, std::uint64_t fileSize, FileHeader& header,
                  CString& error)
{
    std::uint32_t headerSize = 0;
    if (!DecodeFixedPart(data, size, headerSize, error))
        return false;
    if (headerSize != size || headerSize > fileSize) {
        error = text::Format("the file is truncated inside its header (%u header bytes)", headerSize);
        return false;
    }
    if (HeaderChecksum(data, size) != bytes::Get<std::uint32_t>(data + layout::kHeaderChecksum)) {
        error = "the header checksum does not match (the header is damaged)";
        return false;
    }

    header = FileHeader{};
    header.version = kFormatVersion;
    header.fileType = bytes::Get<std::uint16_t>(data + layout::kFileType);
    header.dataType = bytes::Get<std::uint16_t>(data + layout::kDataType);
    header.axis.type = bytes::Get<std::uint16_t>(data + layout::kAxisType);
    header.recordSize = bytes::Get<std::uint32_t>(data + layout::kRecordSize);
    header.axis.steps = bytes::Get<std::uint64_t>(data + layout::kSteps);
    header.axis.startOffset = bytes::Get<double>(data + layout::kStartOffset);
    header.axis.step = bytes::Get<double>(data + layout::kStep);
    header.axis.startIndex = bytes::Get<std::int32_t>(data + layout::kStartIndex);
    header.axis.unitKey = bytes::Get<std::int32_t>(data + layout::kTimeUnitKey);
    header.deleteValue = bytes::Get<double>(data + layout::kDeleteValue);
    header.dataChecksum = bytes::Get<std::uint32_t>(data + layout::kDataChecksum);
    if (IsCalendarAxis(header.axis.type)) {
        header.axis.startDate = GetFixedText(data, layout::kStartDate, 10);
        header.axis.startTime = GetFixedText(data, layout::kStartTime, 8);
    }
    if (header.fileType != kSharedDeleteValue && header.fileType != kPerItemDeleteValue) {
        error = text::Format("unknown file type %d (offset 6)", header.fileType);
        return false;
    }
    if (!CheckAxis(header.axis, error))
        return false;

    bytes::Cursor cursor(data, size, kFixedHeaderSize);
    header.axis.unitText = cursor.ReadText();
    header.title = cursor.ReadText();
    const auto itemCount = bytes::Get<std::uint32_t>(data + layout::kItemCount);
    if (cursor.Failed() || itemCount > cursor.Remaining() / kMinItemSize) {
        error = text::Format("impossible item count %u for a header of %u bytes (offset 16)", itemCount, headerSize);
        return false;
    }
    for (std::uint32_t i = 0; i < itemCount; ++i) {
        const std::size_t offset = cursor.Offset();
        ItemInfo item;
        if (!DecodeItem(cursor, header.fileType, item, error)) {
            error = text::Format("item %u (offset %zu): ", i + 1, offset) + error;
            return false;
        }
        if (header.fileType == kSharedDeleteValue)
            item.deleteValue = header.deleteValue;
        header.items.push_back(std::move(item));
    }
    if (cursor.Remaining() != 0) {
        error = text::Format("%zu unexpected bytes at the end of the header (offset %zu)", cursor.Remaining(), cursor.Offset());
        return false;
    }
    if (ComputeRecordSize(header.items) != header.recordSize || header.recordSize == 0) {
        error = text::Format("the record size %u does not match the items (offset 20)", header.recordSize);
        return false;
    }
    if (header.dataType != CommonDataType(header.items)) {
        error = text::Format("the file data type %d does not match the items (offset 8)", header.dataType);
        return false;
    }
    return CheckDataSize(header, headerSize, fileSize, error);
}

} // namespace rbx
