// The unit catalogue: what the ruq calls, the parsers' lookups and the engineering-unit component
// give, and whether conversions are right.
#include "platform/units/EngineeringUnits.h"
#include "platform/units/Units.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <set>

namespace {

TEST(UnitConversion, KnownValues)
{
    struct Case {
        int from;
        double value;
        int to;
        double expected;
    };
    const std::vector<Case> cases = {
        {1402, 1.0, 1403, 1.0 / 24.0},      // hour -> day
        {1400, 3600.0, 1403, 1.0 / 24.0},   // second -> day
        {1401, 1.0, 1403, 1.0 / 1440.0},    // minute -> day
        {1404, 1.0, 1403, 7.0},             // week -> day
        {1403, 1.0, 1403, 1.0},
        {1500, 100.0, 1501, 212.0},         // Celsius -> Fahrenheit
        {1501, 32.0, 1502, 273.15},         // Fahrenheit -> kelvin
        {1502, 0.0, 1500, -273.15},
        {1004, 1.0, 1001, 30.48},           // foot -> centimeter
        {1304, 1.0, 1301, 28.316846592},    // cfs -> l/s
        {1301, 1000.0, 1302, 3600.0},       // l/s -> m3/h
        {1603, 1.0, 1602, 1.852},           // knot -> km/h
        {1807, 1.0, 1801, 1013.25},         // atm -> hPa
        {1900, 50.0, 1901, 0.5},            // percent -> fraction
        {2101, 24.0, 2100, 1.0},            // mm/day -> mm/h
        {2201, 1000.0, 2200, 1.0},          // ug/l -> mg/l
        {1204, 1.0, 1200, 1233.48183754752},
    };
    for (const Case& c : cases) {
        double result = -1.0;
        ASSERT_NE(ruqConvertUnit(c.from, c.value, c.to, &result), 0) << c.from << " -> " << c.to;
        EXPECT_NEAR(result, c.expected, 1e-9 * std::max(1.0, std::fabs(c.expected))) << c.from << " -> " << c.to;
    }
}

TEST(UnitConversion, RefusesUnknownUnitsAndOtherQuantitiesLeavingTheResult)
{
    for (auto [from, to] : std::vector<std::pair<int, int>>{{1000, 1403}, {1403, 1500}, {1, 1403}, {1403, 0}, {9000, 1000}}) {
        double result = 1.0;
        EXPECT_EQ(ruqConvertUnit(from, 5.0, to, &result), 0) << from << " -> " << to;
        EXPECT_EQ(result, 1.0);
    }
}

TEST(UnitConversion, EveryPairOfAQuantityGoesThereAndBack)
{
    for (const units::Unit& a : units::AllUnits()) {
        for (const units::Unit& b : units::AllUnits()) {
            if (a.quantity != b.quantity)
                continue;
            double there = 0, back = 0;
            ASSERT_TRUE(units::Convert(a.key, 12.5, b.key, there));
            ASSERT_TRUE(units::Convert(b.key, there, a.key, back));
            EXPECT_NEAR(back, 12.5, 1e-9) << a.name << " / " << b.name;
        }
    }
}

TEST(Catalogue, ItemTypesAndUnitsAreCompleteAndUnique)
{
    const int count = ruqGetItemTypeCount();
    ASSERT_GT(count, 25);
    std::set<int> typeKeys;
    std::set<std::string> typeNames;
    for (int seq = 1; seq <= count; ++seq) {
        int key = 0;
        CString name;
        ASSERT_NE(ruqGetItemTypeSeq(seq, &key, &name), 0);
        EXPECT_TRUE(typeKeys.insert(key).second) << key;
        EXPECT_TRUE(typeNames.insert(name).second) << name;
        const int unitCount = ruqGetItemUnitCount(key);
        ASSERT_GT(unitCount, 0) << name;
        std::set<std::string> unitNames;
        for (int u = 1; u <= unitCount; ++u) {
            int unitKey = 0;
            CString unitName, abbreviation;
            ASSERT_NE(ruqGetItemUnitSeq(key, u, &unitKey, &unitName), 0);
            EXPECT_TRUE(unitNames.insert(unitName).second) << name << ": " << unitName;
            EXPECT_NE(ruqGetUnitAbbreviation(unitKey, &abbreviation), 0);
            EXPECT_FALSE(abbreviation.empty());
        }
        EXPECT_EQ(ruqGetItemUnitSeq(key, unitCount + 1, nullptr, nullptr), 0);
        EXPECT_EQ(ruqGetItemUnitSeq(key, 0, nullptr, nullptr), 0);
    }
    EXPECT_EQ(ruqGetItemTypeSeq(0, nullptr, nullptr), 0);
    EXPECT_EQ(ruqGetItemTypeSeq(count + 1, nullptr, nullptr), 0);
    std::set<int> unitKeys;
    for (const units::Unit& unit : units::AllUnits())
        EXPECT_TRUE(unitKeys.insert(unit.key).second) << unit.key;
    for (const char* name : {"Water Level", "Discharge", "Rainfall", "Precipitation", "Rainfall Intensity", "Evaporation",
                             "Temperature", "Air Temperature", "Water Temperature", "Wind Speed", "Wind Direction",
                             "Air Pressure", "Relative Humidity", "Solar Radiation", "Velocity", "Volume", "Area",
                             "Concentration", "Undefined"})
        EXPECT_TRUE(typeNames.count(name)) << name;
}

TEST(Catalogue, TheDayAndOtherTimeUnitsExist)
{
    CString abbreviation;
    ASSERT_NE(ruqGetUnitAbbreviation(1403, &abbreviation), 0);
    EXPECT_EQ(abbreviation, "d");
    EXPECT_STREQ(units::FindUnit(1403)->name, "day");
    for (int key : {1400, 1401, 1402, 1404, 1405})
        EXPECT_EQ(units::FindUnit(key)->quantity, units::Quantity::Time) << key;
    EXPECT_EQ(ruqGetUnitAbbreviation(4242, &abbreviation), 0);
}

TEST(Catalogue, UndefinedHasTheUnitUndefined)
{
    const units::ItemType* undefined = units::FindItemTypeByName("Undefined");
    ASSERT_NE(undefined, nullptr);
    ASSERT_EQ(units::UnitsOf(*undefined).size(), 1u);
    EXPECT_STREQ(units::UnitsOf(*undefined)[0]->name, "Undefined");
}

TEST(Catalogue, ItemTypeLookupByKeyOrNameWithoutCase)
{
    struct Case {
        const char* text;
        const char* expected; // null: no match
    };
    const std::vector<Case> cases = {
        {"102", "Discharge"},
        {" 102", "Discharge"},
        {"102 cumecs", "Discharge"}, // reads as 102, as "%d" does
        {"discharge", "Discharge"},
        {"WATER LEVEL", "Water Level"},
        {"", nullptr},               // reads as 0, and no type has key 0
        {"0", nullptr},
        {"Discharges", nullptr},
        {"999", "Undefined"},
    };
    for (const Case& c : cases) {
        const units::ItemType* type = units::LookupItemType(c.text);
        if (!c.expected)
            EXPECT_EQ(type, nullptr) << c.text;
        else
            EXPECT_STREQ(type ? type->name : "(none)", c.expected) << c.text;
    }
}

TEST(Catalogue, UnitLookupByKeyNameOrAbbreviation)
{
    const units::ItemType& discharge = *units::FindItemTypeByName("Discharge");
    const units::ItemType& level = *units::FindItemTypeByName("Water Level");
    struct Case {
        const units::ItemType& type;
        const char* text;
        int expectedKey; // 0: no match
    };
    const std::vector<Case> cases = {
        {discharge, "1301", 1301},
        {discharge, "liter per second", 1301},
        {discharge, "L/S", 1301},         // abbreviation, case ignored
        {discharge, "Liter Per Second", 0}, // a name must match exactly
        {discharge, "1000", 0},           // meter is no discharge unit
        {level, "M", 1000},
        {level, "meter", 1000},
        {level, "Meter", 0},
        {level, "m^3/s", 0},
    };
    for (const Case& c : cases) {
        const units::Unit* unit = units::LookupUnit(c.type, c.text);
        EXPECT_EQ(unit ? unit->key : 0, c.expectedKey) << c.text;
    }
}

TEST(EngineeringUnits, StartsAtUndefinedAndFollowsTheCurrentType)
{
    CEngineeringUnits component;
    CStringList names, unitNames;
    ASSERT_NE(component.GetItemTypeNames(names), 0);
    EXPECT_EQ(static_cast<int>(names.size()), ruqGetItemTypeCount());
    ASSERT_NE(component.GetUnitNames(unitNames), 0);
    EXPECT_EQ(unitNames, CStringList{"Undefined"});

    const auto discharge = std::find(names.begin(), names.end(), "Discharge");
    ASSERT_NE(discharge, names.end());
    ASSERT_NE(component.SetCurrentItemType(static_cast<int>(discharge - names.begin()) + 1), 0);
    ASSERT_NE(component.GetUnitNames(unitNames), 0);
    EXPECT_EQ(unitNames.front(), "cubic meter per second");
    EXPECT_EQ(unitNames.size(), 6u);

    EXPECT_EQ(component.SetCurrentItemType(0), 0);
    EXPECT_EQ(component.SetCurrentItemType(static_cast<int>(names.size()) + 1), 0);
    ASSERT_NE(component.GetUnitNames(unitNames), 0);
    EXPECT_EQ(unitNames.front(), "cubic meter per second") << "a refused position changes nothing";
}

} // namespace
