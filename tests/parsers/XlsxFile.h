#pragma once
// Test workbooks written with libxlsxwriter into a scratch folder.
#include "tests/support/ScratchFolder.h"

#include <gtest/gtest.h>
#include <xlsxwriter.h>

#include <string>
#include <vector>

// Writes one .xlsx file into a scratch folder of its own, removed with it.
class XlsxFile {
public:
    explicit XlsxFile(const std::string& name)
    {
        path = m_folder.File(name + ".xlsx");
        m_book = workbook_new(path.c_str());
        m_twoDecimals = workbook_add_format(m_book);
        format_set_num_format(m_twoDecimals, "0.00");
        m_date = workbook_add_format(m_book);
        format_set_num_format(m_date, "yyyy/mm/dd");
        m_time = workbook_add_format(m_book);
        format_set_num_format(m_time, "hh:mm:ss");
    }
    ~XlsxFile() { Close(); }

    lxw_worksheet* Sheet(int number)
    {
        while (static_cast<int>(m_sheets.size()) < number)
            m_sheets.push_back(workbook_add_worksheet(m_book, nullptr));
        return m_sheets[static_cast<size_t>(number - 1)];
    }
    // Rows and columns from 1, as the parser counts them.
    void Text(int row, int column, const char* value, int sheet = 1)
    {
        worksheet_write_string(Sheet(sheet), Row(row), Col(column), value, nullptr);
    }
    void Number(int row, int column, double value) { worksheet_write_number(Sheet(1), Row(row), Col(column), value, m_twoDecimals); }
    void Date(int row, int column, int year, int month, int day)
    {
        lxw_datetime when {year, month, day, 0, 0, 0};
        worksheet_write_datetime(Sheet(1), Row(row), Col(column), &when, m_date);
    }
    void Time(int row, int column, int hour, int minute, double second)
    {
        lxw_datetime when {0, 0, 0, hour, minute, second};
        worksheet_write_datetime(Sheet(1), Row(row), Col(column), &when, m_time);
    }
    void Close()
    {
        if (m_book) {
            Sheet(1);
            EXPECT_EQ(workbook_close(m_book), LXW_NO_ERROR);
            m_book = nullptr;
        }
    }

    std::string path;

private:
    static lxw_row_t Row(int row) { return static_cast<lxw_row_t>(row - 1); }
    static lxw_col_t Col(int column) { return static_cast<lxw_col_t>(column - 1); }

    testsupport::ScratchFolder m_folder{"velmora-xl"};
    lxw_workbook* m_book = nullptr;
    std::vector<lxw_worksheet*> m_sheets;
    lxw_format* m_twoDecimals = nullptr;
    lxw_format* m_date = nullptr;
    lxw_format* m_time = nullptr;
};
