#include "templates/HeaderCells.h"

#include <gtest/gtest.h>

namespace {

struct CellCase {
    const char* cell;
    const char* expected;
};

TEST(HeaderCells, TextBeforeBracket)
{
    const CellCase cases[] = {
        {"Rain [mm]", "Rain "}, // the blank before the bracket stays
        {"Rain[mm]", "Rain"},
        {"[mm]", ""},
        {"Rain", "Rain"},
        {"", ""},
        {"a[b[c", "a"},
    };
    for (const CellCase& c : cases)
        EXPECT_EQ(TextBeforeBracket(c.cell), c.expected) << c.cell;
}

TEST(HeaderCells, TextInBrackets)
{
    const CellCase cases[] = {
        {"Rain [mm]", "mm"},
        {"Rain [mm", "mm"},
        {"Rain []", ""},
        {"Rain [[m3/s]]", "m3/s"},
        {"Rain [mm] [h]", "mm"},
        {"Rain", "Rain"},
        {"", ""},
        {"Rain [", ""},
    };
    for (const CellCase& c : cases)
        EXPECT_EQ(TextInBrackets(c.cell), c.expected) << c.cell;
}

TEST(HeaderCells, TextAfterColon)
{
    const CellCase cases[] = {
        {"Rain:Accumulated", "Accumulated"},
        {"x:y:z", "y"},
        {"Rain:", ""},
        {"Rain::Mean", "Mean"},
        {"Instantaneous", "Instantaneous"},
        {"", ""},
    };
    for (const CellCase& c : cases)
        EXPECT_EQ(TextAfterColon(c.cell), c.expected) << c.cell;
}

} // namespace
