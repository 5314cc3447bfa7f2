#pragma once
// The unit catalogue: item types (water level, discharge, rainfall, ...) each with its units, and
// every unit with its abbreviation and its conversion to the base unit of its quantity. Keys are
// stable integers listed in docs/units.md; unit key 1403 is the day.
#include "platform/system/Types.h"

#include <span>
#include <vector>

// --- The C-style calls (outputs by address; a null address skips that output) ---------------------

int ruqGetItemTypeCount();
// Key and name of the item type with 1-based sequence number `seq`; nonzero on success.
int ruqGetItemTypeSeq(int seq, int* key, CString* name);
// Number of units of the item type (0 for an unknown key).
int ruqGetItemUnitCount(int typeKey);
// Key and name of the item type's `seq`-th unit (1-based); nonzero on success.
int ruqGetItemUnitSeq(int typeKey, int seq, int* unitKey, CString* name);
// Nonzero on success.
int ruqGetUnitAbbreviation(int unitKey, CString* abbreviation);
// Converts `value` from one unit to another of the same quantity and writes `result`; nonzero on
// success, 0 (and `result` untouched) for unknown units or units of different quantities.
int ruqConvertUnit(int fromUnit, double value, int toUnit, double* result);

// --- The catalogue for C++ callers ----------------------------------------------------------------

namespace units {

// Units convert through the base unit of their quantity: base = value * factor + offset.
enum class Quantity {
    Length, Area, Volume, Discharge, Time, Temperature, Velocity, Angle, Pressure, Fraction,
    Irradiance, Intensity, Concentration, Salinity, Conductivity, None,
};

struct Unit {
    int key;
    const char* name;
    const char* abbreviation;
    Quantity quantity;
    double factor;
    double offset;
};

struct ItemType {
    int key;
    const char* name;
    std::vector<int> unitKeys; // the first is the item type's default unit
};

inline constexpr int kUnitSecond = 1400;
inline constexpr int kUnitMinute = 1401;
inline constexpr int kUnitHour = 1402;
inline constexpr int kUnitDay = 1403;
inline constexpr int kUnitWeek = 1404;
inline constexpr int kItemTypeUndefined = 999;
inline constexpr int kUnitUndefined = 9000;

std::span<const ItemType> ItemTypes();
std::span<const Unit> AllUnits();

const ItemType* FindItemType(int key);
// By name, without regard to case.
const ItemType* FindItemTypeByName(const CString& name);
// The lookup the parsers use: a text that reads as a decimal integer ("%d"; an empty text reads as 0)
// matches by key, any other text by name without regard to case.
const ItemType* LookupItemType(const CString& text);

const Unit* FindUnit(int key);
// A unit of `type` named by `text`: a text that reads as an integer equal to a unit's key, else the
// unit's name exactly, else its abbreviation without regard to case. Null when none matches.
const Unit* LookupUnit(const ItemType& type, const CString& text);
// The units of a type, in catalogue order.
std::vector<const Unit*> UnitsOf(const ItemType& type);

// False for unknown units or units of different quantities.
bool Convert(int fromUnit, double value, int toUnit, double& result);

} // namespace units
