#pragma once
// One value in an item's data type, to and from double.
#include <cstddef>

namespace rbx {

// Stores `value` at `out` in `dataType`: rounded to the nearest integer for integer types. False when
// the value does not fit the type (or is not a number for an integer type).
bool EncodeValue(int dataType, double value, unsigned char* out);
double DecodeValue(int dataType, const unsigned char* bytes);

} // namespace rbx
