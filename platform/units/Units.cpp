#include "platform/units/Units.h"

#include "platform/system/Text.h"

#include <array>
#include <numbers>

namespace units {
namespace {

constexpr double kFoot = 0.3048;
constexpr double kInch = 0.0254;

const std::array kUnits = std::to_array<Unit>({
    {1000, "meter", "m", Quantity::Length, 1.0, 0.0},
    {1001, "centimeter", "cm", Quantity::Length, 0.01, 0.0},
    {1002, "millimeter", "mm", Quantity::Length, 0.001, 0.0},
    {1003, "kilometer", "km", Quantity::Length, 1000.0, 0.0},
    {1004, "foot", "ft", Quantity::Length, kFoot, 0.0},
    {1005, "inch", "in", Quantity::Length, kInch, 0.0},

    {1100, "square meter", "m^2", Quantity::Area, 1.0, 0.0},
    {1101, "square kilometer", "km^2", Quantity::Area, 1.0e6, 0.0},
    {1102, "hectare", "ha", Quantity::Area, 1.0e4, 0.0},
    {1103, "acre", "ac", Quantity::Area, 4046.8564224, 0.0},
    {1104, "square foot", "ft^2", Quantity::Area, kFoot * kFoot, 0.0},

    {1200, "cubic meter", "m^3", Quantity::Volume, 1.0, 0.0},
    {1201, "liter", "l", Quantity::Volume, 0.001, 0.0},
    {1202, "million cubic meter", "Mm^3", Quantity::Volume, 1.0e6, 0.0},
    {1203, "cubic foot", "ft^3", Quantity::Volume, kFoot * kFoot * kFoot, 0.0},
    {1204, "acre-foot", "ac-ft", Quantity::Volume, 4046.8564224 * kFoot, 0.0},
    {1205, "US gallon", "gal", Quantity::Volume, 0.003785411784, 0.0},

    {1300, "cubic meter per second", "m^3/s", Quantity::Discharge, 1.0, 0.0},
    {1301, "liter per second", "l/s", Quantity::Discharge, 0.001, 0.0},
    {1302, "cubic meter per hour", "m^3/h", Quantity::Discharge, 1.0 / 3600.0, 0.0},
    {1303, "cubic meter per day", "m^3/d", Quantity::Discharge, 1.0 / 86400.0, 0.0},
    {1304, "cubic foot per second", "ft^3/s", Quantity::Discharge, kFoot * kFoot * kFoot, 0.0},
    {1305, "million liter per day", "Ml/d", Quantity::Discharge, 1000.0 / 86400.0, 0.0},

    {1400, "second", "s", Quantity::Time, 1.0, 0.0},
    {1401, "minute", "min", Quantity::Time, 60.0, 0.0},
    {1402, "hour", "h", Quantity::Time, 3600.0, 0.0},
    {1403, "day", "d", Quantity::Time, 86400.0, 0.0},
    {1404, "week", "wk", Quantity::Time, 604800.0, 0.0},
    {1405, "millisecond", "ms", Quantity::Time, 0.001, 0.0},

    // Celsius is the base so that the common case converts without rounding.
    {1500, "degree Celsius", "degC", Quantity::Temperature, 1.0, 0.0},
    {1501, "degree Fahrenheit", "degF", Quantity::Temperature, 5.0 / 9.0, -32.0 * 5.0 / 9.0},
    {1502, "kelvin", "K", Quantity::Temperature, 1.0, -273.15},

    {1600, "meter per second", "m/s", Quantity::Velocity, 1.0, 0.0},
    {1601, "centimeter per second", "cm/s", Quantity::Velocity, 0.01, 0.0},
    {1602, "kilometer per hour", "km/h", Quantity::Velocity, 1.0 / 3.6, 0.0},
    {1603, "knot", "kn", Quantity::Velocity, 1852.0 / 3600.0, 0.0},
    {1604, "foot per second", "ft/s", Quantity::Velocity, kFoot, 0.0},
    {1605, "mile per hour", "mph", Quantity::Velocity, 0.44704, 0.0},

    {1700, "degree", "deg", Quantity::Angle, 1.0, 0.0},
    {1701, "radian", "rad", Quantity::Angle, 180.0 / std::numbers::pi, 0.0},

    {1800, "pascal", "Pa", Quantity::Pressure, 1.0, 0.0},
    {1801, "hectopascal", "hPa", Quantity::Pressure, 100.0, 0.0},
    {1802, "kilopascal", "kPa", Quantity::Pressure, 1000.0, 0.0},
    {1803, "millibar", "mbar", Quantity::Pressure, 100.0, 0.0},
    {1804, "bar", "bar", Quantity::Pressure, 1.0e5, 0.0},
    {1805, "millimeter of mercury", "mmHg", Quantity::Pressure, 133.322387415, 0.0},
    {1806, "inch of mercury", "inHg", Quantity::Pressure, 3386.389, 0.0},
    {1807, "standard atmosphere", "atm", Quantity::Pressure, 101325.0, 0.0},

    {1900, "percent", "%", Quantity::Fraction, 0.01, 0.0},
    {1901, "fraction", "-", Quantity::Fraction, 1.0, 0.0},

    {2000, "watt per square meter", "W/m^2", Quantity::Irradiance, 1.0, 0.0},
    {2001, "kilowatt per square meter", "kW/m^2", Quantity::Irradiance, 1000.0, 0.0},

    {2100, "millimeter per hour", "mm/h", Quantity::Intensity, 0.001 / 3600.0, 0.0},
    {2101, "millimeter per day", "mm/d", Quantity::Intensity, 0.001 / 86400.0, 0.0},
    {2102, "millimeter per minute", "mm/min", Quantity::Intensity, 0.001 / 60.0, 0.0},
    {2103, "inch per hour", "in/h", Quantity::Intensity, kInch / 3600.0, 0.0},

    {2200, "milligram per liter", "mg/l", Quantity::Concentration, 1.0, 0.0},
    {2201, "microgram per liter", "ug/l", Quantity::Concentration, 0.001, 0.0},
    {2202, "gram per cubic meter", "g/m^3", Quantity::Concentration, 1.0, 0.0},
    {2203, "kilogram per cubic meter", "kg/m^3", Quantity::Concentration, 1000.0, 0.0},

    {2300, "practical salinity unit", "PSU", Quantity::Salinity, 1.0, 0.0},

    {2400, "microsiemens per centimeter", "uS/cm", Quantity::Conductivity, 1.0e-4, 0.0},
    {2401, "millisiemens per centimeter", "mS/cm", Quantity::Conductivity, 0.1, 0.0},
    {2402, "siemens per meter", "S/m", Quantity::Conductivity, 1.0, 0.0},

    {kUnitUndefined, "Undefined", "undef", Quantity::None, 1.0, 0.0},
});

const std::vector<int> kLevelUnits = {1000, 1001, 1002, 1004};
const std::vector<int> kDepthUnits = {1002, 1001, 1005, 1000};
const std::vector<int> kDischargeUnits = {1300, 1301, 1302, 1303, 1304, 1305};
const std::vector<int> kIntensityUnits = {2100, 2101, 2102, 2103};
const std::vector<int> kTemperatureUnits = {1500, 1501, 1502};
const std::vector<int> kDirectionUnits = {1700, 1701};
const std::vector<int> kCurrentUnits = {1600, 1601, 1604, 1603};

const std::vector<ItemType> kItemTypes = {
    {100, "Water Level", kLevelUnits},
    {101, "Water Depth", kLevelUnits},
    {102, "Discharge", kDischargeUnits},
    {103, "Rainfall", kDepthUnits},
    {104, "Precipitation", kDepthUnits},
    {105, "Rainfall Intensity", kIntensityUnits},
    {106, "Evaporation", {1002, 1001, 1005}},
    {107, "Evaporation Rate", {2101, 2100, 2103}},
    {108, "Temperature", kTemperatureUnits},
    {109, "Air Temperature", kTemperatureUnits},
    {110, "Water Temperature", kTemperatureUnits},
    {111, "Wind Speed", {1600, 1602, 1603, 1605, 1604}},
    {112, "Wind Direction", kDirectionUnits},
    {113, "Air Pressure", {1801, 1803, 1802, 1800, 1804, 1805, 1806, 1807}},
    {114, "Relative Humidity", {1900, 1901}},
    {115, "Solar Radiation", {2000, 2001}},
    {116, "Current Speed", kCurrentUnits},
    {117, "Current Direction", kDirectionUnits},
    {118, "Velocity", {1600, 1601, 1602, 1604, 1603}},
    {119, "Volume", {1200, 1201, 1202, 1203, 1204, 1205}},
    {120, "Area", {1100, 1101, 1102, 1103, 1104}},
    {121, "Concentration", {2200, 2201, 2202, 2203}},
    {122, "Suspended Sediment Concentration", {2200, 2202, 2203}},
    {123, "Salinity", {2300}},
    {124, "Conductivity", {2400, 2401, 2402}},
    {125, "Groundwater Level", {1000, 1001, 1004}},
    {126, "Snow Depth", {1001, 1002, 1000, 1005}},
    {127, "Sunshine Duration", {1402, 1401, 1400}},
    {128, "Wave Height", {1000, 1001, 1004}},
    {129, "Wave Period", {1400, 1401}},
    {130, "Time", {1400, 1401, 1402, 1403, 1404, 1405}},
    {kItemTypeUndefined, "Undefined", {kUnitUndefined}},
};

const ItemType* ItemTypeAt(int seq)
{
    if (seq < 1 || seq > static_cast<int>(kItemTypes.size()))
        return nullptr;
    return &kItemTypes[static_cast<size_t>(seq - 1)];
}

const Unit* UnitOfTypeAt(int typeKey, int seq)
{
    const ItemType* type = FindItemType(typeKey);
    if (!type || seq < 1 || seq > static_cast<int>(type->unitKeys.size()))
        return nullptr;
    return FindUnit(type->unitKeys[static_cast<size_t>(seq - 1)]);
}

} // namespace

std::span<const ItemType> ItemTypes() { return kItemTypes; }
std::span<const Unit> AllUnits() { return kUnits; }

const ItemType* FindItemType(int key)
{
    for (const ItemType& type : kItemTypes)
        if (type.key == key)
            return &type;
    return nullptr;
}

const ItemType* FindItemTypeByName(const CString& name)
{
    for (const ItemType& type : kItemTypes)
        if (text::EqualsNoCase(type.name, name))
            return &type;
    return nullptr;
}

const ItemType* LookupItemType(const CString& typeText)
{
    int number = 0;
    const bool isNumber = typeText.empty() || text::ScanInt(typeText, number);
    return isNumber ? FindItemType(number) : FindItemTypeByName(typeText);
}

const Unit* FindUnit(int key)
{
    for (const Unit& unit : kUnits)
        if (unit.key == key)
            return &unit;
    return nullptr;
}

const Unit* LookupUnit(const ItemType& type, const CString& unitText)
{
    int number = 0;
    const bool isNumber = text::ScanInt(unitText, number);
    for (const Unit* unit : UnitsOf(type)) {
        if ((isNumber && unit->key == number) || unitText == unit->name
            || text::EqualsNoCase(unitText, unit->abbreviation))
            return unit;
    }
    return nullptr;
}

std::vector<const Unit*> UnitsOf(const ItemType& type)
{
    std::vector<const Unit*> result;
    for (int key : type.unitKeys)
        if (const Unit* unit = FindUnit(key))
            result.push_back(unit);
    return result;
}

bool Convert(int fromUnit, double value, int toUnit, double& result)
{
    const Unit* from = FindUnit(fromUnit);
    const Unit* to = FindUnit(toUnit);
    if (!from || !to || from->quantity != to->quantity)
        return false;
    if (from == to) {
        result = value;
        return true;
    }
    const double base = value * from->factor + from->offset;
    result = (base - to->offset) / to->factor;
    return true;
}

} // namespace units

int ruqGetItemTypeCount() { return static_cast<int>(units::ItemTypes().size()); }

int ruqGetItemTypeSeq(int seq, int* key, CString* name)
{
    const units::ItemType* type = units::ItemTypeAt(seq);
    if (!type)
        return 0;
    if (key)
        *key = type->key;
    if (name)
        *name = type->name;
    return 1;
}

int ruqGetItemUnitCount(int typeKey)
{
    const units::ItemType* type = units::FindItemType(typeKey);
    return type ? static_cast<int>(type->unitKeys.size()) : 0;
}

int ruqGetItemUnitSeq(int typeKey, int seq, int* unitKey, CString* name)
{
    const units::Unit* unit = units::UnitOfTypeAt(typeKey, seq);
    if (!unit)
        return 0;
    if (unitKey)
        *unitKey = unit->key;
    if (name)
        *name = unit->name;
    return 1;
}

int ruqGetUnitAbbreviation(int unitKey, CString* abbreviation)
{
    const units::Unit* unit = units::FindUnit(unitKey);
    if (!unit)
        return 0;
    if (abbreviation)
        *abbreviation = unit->abbreviation;
    return 1;
}

int ruqConvertUnit(int fromUnit, double value, int toUnit, double* result)
{
    double converted = 0.0;
    if (!units::Convert(fromUnit, value, toUnit, converted))
        return 0;
    if (result)
        *result = converted;
    return 1;
}
