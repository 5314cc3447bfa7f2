#include "platform/rbx/RbxFormat.h"

#include <array>

namespace rbx {
namespace {

constexpr std::array<const char*, 5> kValueTypeNames = {
    "Instantaneous", "Accumulated", "Step_Accumulated", "Mean_Step_Accumulated", "Reverse_Mean_Step_Accumulated"};

} // namespace

std::size_t DataTypeSize(int dataType)
{
    switch (dataType) {
    case kFloat32: return 4;
    case kFloat64: return 8;
    case kChar: return 1;
    case kInt32: return 4;
    case kUInt32: return 4;
    case kInt16: return 2;
    case kInteger: return 8;
    default: return 0;
    }
}

bool IsValidDataType(int dataType) { return DataTypeSize(dataType) != 0; }

bool IsCalendarAxis(int axisType) { return axisType == kEquidistantCalendar || axisType == kNonEquidistantCalendar; }

bool IsEquidistantAxis(int axisType) { return axisType == kEquidistantRelative || axisType == kEquidistantCalendar; }

CString ValueTypeName(int valueType)
{
    if (valueType < 0 || valueType >= static_cast<int>(kValueTypeNames.size()))
        return {};
    return kValueTypeNames[static_cast<std::size_t>(valueType)];
}

int ValueTypeFromName(const CString& name)
{
    for (std::size_t i = 0; i < kValueTypeNames.size(); ++i)
        if (name == kValueTypeNames[i])
            return static_cast<int>(i);
    return -1;
}

std::size_t FileHeader::ValueCount() const
{
    std::size_t count = 0;
    for (const ItemInfo& item : items)
        count += item.elementCount;
    return count;
}

} // namespace rbx
