#include "platform/rbx/RbxValueCodec.h"

#include "platform/rbx/RbxFormat.h"

#include <cfloat>
#include <cmath>
#include <cstdint>
#include <cstring>

namespace rbx {
namespace {

template <typename T>
void Store(unsigned char* out, T value)
{
    std::memcpy(out, &value, sizeof(T));
}

template <typename T>
T Load(const unsigned char* bytes)
{
    T value;
    std::memcpy(&value, bytes, sizeof(T));
    return value;
}

// Rounds and range-checks `value` into [low, high]; the bounds are exact in double.
bool RoundInto(double value, double low, double high, double& rounded)
{
    if (!std::isfinite(value))
        return false;
    rounded = std::nearbyint(value);
    return rounded >= low && rounded <= high;
}

} // namespace

bool EncodeValue(int dataType, double value, unsigned char* out)
{
    double r = 0.0;
    switch (dataType) {
    case kFloat32:
        if (std::isfinite(value) && std::fabs(value) > FLT_MAX)
            return false;
        Store(out, static_cast<float>(value));
        return true;
    case kFloat64:
        Store(out, value);
        return true;
    case kChar:
        if (!RoundInto(value, 0.0, 255.0, r))
            return false;
        Store(out, static_cast<unsigned char>(r));
        return true;
    case kInt32:
        if (!RoundInto(value, -2147483648.0, 2147483647.0, r))
            return false;
        Store(out, static_cast<std::int32_t>(r));
        return true;
    case kUInt32:
        if (!RoundInto(value, 0.0, 4294967295.0, r))
            return false;
        Store(out, static_cast<std::uint32_t>(r));
        return true;
    case kInt16:
        if (!RoundInto(value, -32768.0, 32767.0, r))
            return false;
        Store(out, static_cast<std::int16_t>(r));
        return true;
    case kInteger:
        // 2^63 itself is not representable, so the upper bound is the largest double below it.
        if (!RoundInto(value, -9223372036854775808.0, 9223372036854774784.0, r))
            return false;
        Store(out, static_cast<std::int64_t>(r));
        return true;
    default:
        return false;
    }
}

double DecodeValue(int dataType, const unsigned char* bytes)
{
    switch (dataType) {
    case kFloat32: return Load<float>(bytes);
    case kFloat64: return Load<double>(bytes);
    case kChar: return bytes[0];
    case kInt32: return Load<std::int32_t>(bytes);
    case kUInt32: return Load<std::uint32_t>(bytes);
    case kInt16: return Load<std::int16_t>(bytes);
    case kInteger: return static_cast<double>(Load<std::int64_t>(bytes));
    default: return 0.0;
    }
}

} // namespace rbx
