#pragma once
// Header bytes of an rbx0 file: the fixed 96-byte part at known offsets (so a writer can patch it)
// and the variable part with the texts and items.
#include "platform/rbx/RbxFormat.h"

#include <cstddef>
#include <cstdint>
#include <vector>

namespace rbx::layout {

inline constexpr std::size_t kVersion = 4;
inline constexpr std::size_t kFileType = 6;
inline constexpr std::size_t kDataType = 8;
inline constexpr std::size_t kAxisType = 10;
inline constexpr std::size_t kHeaderSize = 12;
inline constexpr std::size_t kItemCount = 16;
inline constexpr std::size_t kRecordSize = 20;
inline constexpr std::size_t kSteps = 24;
inline constexpr std::size_t kStartOffset = 32;
inline constexpr std::size_t kStep = 40;
inline constexpr std::size_t kStartIndex = 48;
inline constexpr std::size_t kTimeUnitKey = 52;
inline constexpr std::size_t kStartDate = 56; // 10 characters
inline constexpr std::size_t kStartTime = 66; // 8 characters
inline constexpr std::size_t kDeleteValue = 76;
inline constexpr std::size_t kDataChecksum = 84;
inline constexpr std::size_t kHeaderChecksum = 88;

} // namespace rbx::layout

namespace rbx {

// The header's bytes with both checksums filled in from `header` (dataChecksum included).
std::vector<unsigned char> EncodeHeader(const FileHeader& header);
// Writes the fields a writer learns late and recomputes the header checksum.
void PatchHeader(std::vector<unsigned char>& bytes, const FileHeader& header);

// Reads the header size from the fixed part; false with `error` when the fixed part is not an rbx0
// header of a version this reader knows.
bool DecodeFixedPart(const unsigned char* data, std::size_t size, std::uint32_t& headerSize, CString& error);
// Decodes and checks a whole header of `size` bytes in a file of `fileSize` bytes.
bool DecodeHeader(const unsigned char* data, std::size_t size, std::uint64_t fileSize, FileHeader& header,
                  CString& error);

// Record size of the items, 0 when it would exceed kMaxRecordSize.
std::uint32_t ComputeRecordSize(const std::vector<ItemInfo>& items);
// The data type every item shares, 0 when they differ (or there are no items).
int CommonDataType(const std::vector<ItemInfo>& items);
// True for "YYYY-MM-DD" / "HH:MM:SS" texts naming a real date and time of day.
bool IsValidStartDate(const CString& date);
bool IsValidStartTime(const CString& time);

} // namespace rbx
