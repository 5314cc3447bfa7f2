#pragma once
// The rbx0 file format: codes, limits and the description of a file's header, shared by the reader,
// the writer and the C-style calls. The byte layout is documented in docs/rbx0-format.md.
#include "platform/system/Types.h"

#include <cstddef>
#include <cstdint>
#include <vector>

namespace rbx {

// Value storage of an item.
enum DataType : int {
    kFloat32 = 1,
    kFloat64 = 2,
    kChar = 3,
    kInt32 = 4,
    kUInt32 = 5,
    kInt16 = 6,
    kInteger = 7, // stored as a signed 64-bit integer
};

enum TimeAxisType : int {
    kEquidistantRelative = 1,
    kNonEquidistantRelative = 2,
    kEquidistantCalendar = 3,
    kNonEquidistantCalendar = 4,
};

// What a file's header holds besides the time axis and items. Both are plain time series with one
// record per step; they differ only in where the delete value lives.
enum FileType : int {
    kSharedDeleteValue = 1,  // one delete value in the file header serves every item
    kPerItemDeleteValue = 4, // each item carries its own delete value
};

// How an item's values stand against the time axis.
enum ItemAxisType : int {
    kScalarItem = 1,  // one value per time step
    kProfileItem = 2, // a fixed number of values per time step (a profile or spectrum)
};

// How a value relates to the time step, by position in the wizard's value-type names.
enum ValueType : int {
    kInstantaneous = 0,
    kAccumulated = 1,
    kStepAccumulated = 2,
    kMeanStepAccumulated = 3,
    kReverseMeanStepAccumulated = 4,
};

inline constexpr char kMagic[4] = {'R', 'B', 'X', '0'};
inline constexpr std::uint16_t kFormatVersion = 1;
inline constexpr std::size_t kFixedHeaderSize = 96;
// Bounds a reader enforces before it allocates anything.
inline constexpr std::uint32_t kMaxHeaderSize = 16u << 20;
inline constexpr std::uint32_t kMaxElementsPerItem = 1u << 20;
inline constexpr std::uint32_t kMaxRecordSize = 1u << 28;
inline constexpr std::size_t kMaxTextLength = 65535;

// Bytes one value of the type takes; 0 for a code that is not a data type.
std::size_t DataTypeSize(int dataType);
bool IsValidDataType(int dataType);
bool IsCalendarAxis(int axisType);
bool IsEquidistantAxis(int axisType);
// "Instantaneous", ...; empty for an unknown code. ValueTypeFromName returns -1 for an unknown name.
CString ValueTypeName(int valueType);
int ValueTypeFromName(const CString& name);

struct TimeAxis {
    int type = kEquidistantCalendar;
    int unitKey = 0;
    CString unitText;
    CString startDate; // "YYYY-MM-DD" for calendar axes, empty for relative ones
    CString startTime; // "HH:MM:SS" for calendar axes, empty for relative ones
    double startOffset = 0.0;
    double step = 0.0; // the step of an equidistant axis; last time minus first time otherwise
    std::uint64_t steps = 0;
    int startIndex = 0;
};

struct ItemInfo {
    CString name;
    int itemTypeKey = 0;
    CString itemTypeText;
    int unitKey = 0;
    CString unitText;
    int dataType = kFloat32;
    int valueType = kInstantaneous;
    int axisType = kScalarItem;
    std::uint32_t elementCount = 1; // values per step; 1 for scalar items
    double deleteValue = -1e-35;

    std::size_t ValueBytes() const { return DataTypeSize(dataType) * elementCount; }
};

struct FileHeader {
    int version = kFormatVersion;
    int fileType = kSharedDeleteValue;
    int dataType = kFloat32; // the data type all items share, 0 when they differ
    CString title;
    TimeAxis axis;
    double deleteValue = -1e-35; // the shared delete value of a type 1 file
    std::vector<ItemInfo> items;
    std::uint32_t recordSize = 0; // 8 bytes of time, then every item's values in item order
    std::uint32_t dataChecksum = 0;

    // Values per step over all items (equals the item count when every item is scalar).
    std::size_t ValueCount() const;
};

} // namespace rbx
