#pragma once
// Test workbooks written with libxlsxwriter into a scratch folder.
#include "tests/support/ScratchFolder.h"
#include "tests/support/XlsxWorkbook.h"

#include <gtest/gtest.h>

#include <string>

// Writes one .xlsx file into a scratch folder of its own, removed with it: texts, numbers with two
// decimals, dates and times.
class XlsxFile {
    testsupport::ScratchFolder m_folder{"velmora-xl"}; // made before the path into it

public:
    explicit XlsxFile(const std::string& name) : path(m_folder.File(name + ".xlsx")), m_book(path) {}
    ~XlsxFile() { Close(); }

    // Rows and columns from 1, as the parser counts them.
    void Text(int row, int column, const char* value, int sheet = 1) { m_book.Text(row, column, value, sheet); }
    void Number(int row, int column, double value) { m_book.Number(row, column, value, "0.00"); }
    void Date(int row, int column, int year, int month, int day)
    {
        m_book.DateTime(row, column, lxw_datetime{year, month, day, 0, 0, 0}, "yyyy/mm/dd");
    }
    void Time(int row, int column, int hour, int minute, double second)
    {
        m_book.DateTime(row, column, lxw_datetime{0, 0, 0, hour, minute, second}, "hh:mm:ss");
    }
    void Close()
    {
        if (!m_closed) {
            EXPECT_TRUE(m_book.Close()) << path;
            m_closed = true;
        }
    }

    const std::string path;

private:
    testsupport::XlsxWorkbook m_book;
    bool m_closed = false;
};
