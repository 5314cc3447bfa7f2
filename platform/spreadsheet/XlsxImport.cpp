// .xlsx through liborcus with an import factory of our own: it keeps the shared strings and the
// number formats of the cell styles and hands every cell straight to the sink, so the sink alone
// decides what stays in memory. liborcus reads the styles part after the sheets, so a cell's
// style is its cell-format (xf) index and the style table is complete only at the end.
#include "platform/spreadsheet/WorkbookImport.h"

#include "platform/spreadsheet/CellAddress.h"
#include "platform/system/OleDateTime.h"

#include <orcus/config.hpp>
#include <orcus/orcus_xlsx.hpp>
#include <orcus/spreadsheet/import_interface.hpp>

#include <algorithm>
#include <climits>
#include <cstdlib>
#include <map>
#include <memory>
#include <optional>
#include <unordered_map>

namespace sheet {

namespace {

namespace iface = orcus::spreadsheet::iface;
using orcus::spreadsheet::col_t;
using orcus::spreadsheet::row_t;

class SharedStrings : public iface::import_shared_strings {
public:
    size_t append(std::string_view s) override
    {
        m_strings.emplace_back(s);
        return m_strings.size() - 1;
    }
    size_t add(std::string_view s) override
    {
        auto found = m_index.find(std::string(s));
        if (found != m_index.end())
            return found->second;
        size_t index = append(s);
        m_index.emplace(m_strings.back(), index);
        return index;
    }
    void set_segment_font(size_t) override {}
    void set_segment_bold(bool) override {}
    void set_segment_italic(bool) override {}
    void set_segment_font_name(std::string_view) override {}
    void set_segment_font_size(double) override {}
    void set_segment_font_color(orcus::spreadsheet::color_elem_t, orcus::spreadsheet::color_elem_t,
                                orcus::spreadsheet::color_elem_t, orcus::spreadsheet::color_elem_t) override {}
    void append_segment(std::string_view s) override { m_segments.append(s); }
    size_t commit_segments() override
    {
        size_t index = append(m_segments);
        m_segments.clear();
        return index;
    }

    const std::string* Find(size_t index) const { return index < m_strings.size() ? &m_strings[index] : nullptr; }

private:
    std::vector<std::string> m_strings;
    std::unordered_map<std::string, size_t> m_index;
    std::string m_segments;
};

// Only number formats matter: <numFmt> codes by id, and the id of every cell format (xf).
class Styles : public iface::import_styles {
public:
    explicit Styles(StyleTable& table) : m_table(table) {}

    void set_font_count(size_t) override {}
    void set_font_bold(bool) override {}
    void set_font_italic(bool) override {}
    void set_font_name(std::string_view) override {}
    void set_font_size(double) override {}
    void set_font_underline(orcus::spreadsheet::underline_t) override {}
    void set_font_underline_width(orcus::spreadsheet::underline_width_t) override {}
    void set_font_underline_mode(orcus::spreadsheet::underline_mode_t) override {}
    void set_font_underline_type(orcus::spreadsheet::underline_type_t) override {}
    void set_font_underline_color(orcus::spreadsheet::color_elem_t, orcus::spreadsheet::color_elem_t,
                                  orcus::spreadsheet::color_elem_t, orcus::spreadsheet::color_elem_t) override {}
    void set_font_color(orcus::spreadsheet::color_elem_t, orcus::spreadsheet::color_elem_t,
                        orcus::spreadsheet::color_elem_t, orcus::spreadsheet::color_elem_t) override {}
    void set_strikethrough_style(orcus::spreadsheet::strikethrough_style_t) override {}
    void set_strikethrough_type(orcus::spreadsheet::strikethrough_type_t) override {}
    void set_strikethrough_width(orcus::spreadsheet::strikethrough_width_t) override {}
    void set_strikethrough_text(orcus::spreadsheet::strikethrough_text_t) override {}
    size_t commit_font() override { return m_fonts++; }
    void set_fill_count(size_t) override {}
    void set_fill_pattern_type(orcus::spreadsheet::fill_pattern_t) override {}
    void set_fill_fg_color(orcus::spreadsheet::color_elem_t, orcus::spreadsheet::color_elem_t,
                           orcus::spreadsheet::color_elem_t, orcus::spreadsheet::color_elem_t) override {}
    void set_fill_bg_color(orcus::spreadsheet::color_elem_t, orcus::spreadsheet::color_elem_t,
                           orcus::spreadsheet::color_elem_t, orcus::spreadsheet::color_elem_t) override {}
    size_t commit_fill() override { return m_fills++; }
    void set_border_count(size_t) override {}
    void set_border_style(orcus::spreadsheet::border_direction_t, orcus::spreadsheet::border_style_t) override {}
    void set_border_color(orcus::spreadsheet::border_direction_t, orcus::spreadsheet::color_elem_t,
                          orcus::spreadsheet::color_elem_t, orcus::spreadsheet::color_elem_t,
                          orcus::spreadsheet::color_elem_t) override {}
    void set_border_width(orcus::spreadsheet::border_direction_t, double, orcus::length_unit_t) override {}
    size_t commit_border() override { return m_borders++; }
    void set_cell_hidden(bool) override {}
    void set_cell_locked(bool) override {}
    void set_cell_print_content(bool) override {}
    void set_cell_formula_hidden(bool) override {}
    size_t commit_cell_protection() override { return m_protections++; }

    void set_number_format_count(size_t) override {}
    void set_number_format_identifier(size_t id) override { m_formatId = id; }
    void set_number_format_code(std::string_view s) override { m_formatCode = s; }
    size_t commit_number_format() override
    {
        m_customCodes[m_formatId] = m_formatCode;
        m_formatCode.clear();
        return m_customCodes.size() - 1;
    }

    void set_cell_xf_count(size_t) override {}
    void set_cell_style_xf_count(size_t) override {}
    void set_dxf_count(size_t) override {}
    void set_xf_font(size_t) override {}
    void set_xf_fill(size_t) override {}
    void set_xf_border(size_t) override {}
    void set_xf_protection(size_t) override {}
    void set_xf_number_format(size_t index) override { m_xfFormat = index; }
    void set_xf_style_xf(size_t) override {}
    void set_xf_apply_alignment(bool) override {}
    void set_xf_horizontal_alignment(orcus::spreadsheet::hor_alignment_t) override {}
    void set_xf_vertical_alignment(orcus::spreadsheet::ver_alignment_t) override {}
    // Cell format k becomes style k of the table, so cells keep their xf index as their style.
    size_t commit_cell_xf() override
    {
        size_t index = m_cellXfs++;
        auto custom = m_customCodes.find(m_xfFormat);
        std::string code = custom != m_customCodes.end() ? custom->second : NumberFormat::BuiltinCode(static_cast<int>(m_xfFormat));
        m_table.Set(static_cast<unsigned>(index), NumberFormat(code));
        m_xfFormat = 0;
        return index;
    }
    size_t commit_cell_style_xf() override { m_xfFormat = 0; return m_styleXfs++; }
    size_t commit_dxf() override { m_xfFormat = 0; return m_dxfs++; }
    void set_cell_style_count(size_t) override {}
    void set_cell_style_name(std::string_view) override {}
    void set_cell_style_xf(size_t) override {}
    void set_cell_style_builtin(size_t) override {}
    void set_cell_style_parent_name(std::string_view) override {}
    size_t commit_cell_style() override { return m_cellStyles++; }

private:
    StyleTable& m_table;
    std::map<size_t, std::string> m_customCodes;
    size_t m_cellXfs = 0;
    size_t m_formatId = 0;
    std::string m_formatCode;
    size_t m_xfFormat = 0;
    size_t m_fonts = 0, m_fills = 0, m_borders = 0, m_protections = 0, m_styleXfs = 0, m_dxfs = 0, m_cellStyles = 0;
};

class Factory;

// Collects one cell at a time: a value and a style may arrive in separate calls for the same
// position; the cell goes to the sink when the next position starts.
class Sheet;

class FormulaResult : public iface::import_formula {
public:
    explicit FormulaResult(Sheet& sheet) : m_sheet(sheet) {}
    void set_position(row_t row, col_t col) override { m_row = row, m_col = col; m_type = Variant::Empty; }
    void set_formula(orcus::spreadsheet::formula_grammar_t, std::string_view) override {}
    void set_shared_formula_index(size_t) override {}
    void set_result_string(std::string_view value) override { m_type = Variant::Text, m_text = value; }
    void set_result_value(double value) override { m_type = Variant::Number, m_number = value; }
    void set_result_bool(bool value) override { m_type = Variant::Boolean, m_number = value ? 1 : 0; }
    void set_result_empty() override { m_type = Variant::Text, m_text.clear(); }
    void commit() override;

private:
    Sheet& m_sheet;
    row_t m_row = 0;
    col_t m_col = 0;
    Variant::Type m_type = Variant::Empty;
    double m_number = 0.0;
    std::string m_text;
};

class ArrayFormulaResult : public iface::import_array_formula {
public:
    explicit ArrayFormulaResult(Sheet& sheet) : m_sheet(sheet) {}
    void set_range(const orcus::spreadsheet::range_t&) override {}
    void set_formula(orcus::spreadsheet::formula_grammar_t, std::string_view) override {}
    void set_result_string(row_t row, col_t col, std::string_view value) override;
    void set_result_value(row_t row, col_t col, double value) override;
    void set_result_bool(row_t row, col_t col, bool value) override;
    void set_result_empty(row_t, col_t) override {}
    void commit() override {}

private:
    Sheet& m_sheet;
};

class Sheet : public iface::import_sheet {
public:
    Sheet(Factory& factory, int index) : m_factory(factory), m_index(index), m_formula(*this), m_arrayFormula(*this) {}

    iface::import_formula* get_formula() override { return &m_formula; }
    iface::import_array_formula* get_array_formula() override { return &m_arrayFormula; }

    void set_auto(row_t row, col_t col, std::string_view s) override;
    void set_string(row_t row, col_t col, orcus::spreadsheet::string_id_t sindex) override;
    void set_value(row_t row, col_t col, double value) override { SetNumber(row, col, value); }
    void set_bool(row_t row, col_t col, bool value) override { SetValue(row, col, Variant::Boolean, value ? 1 : 0, {}); }
    void set_date_time(row_t row, col_t col, int year, int month, int day, int hour, int minute, double second) override;
    void set_format(row_t row, col_t col, size_t xf_index) override;
    void set_format(row_t, col_t, row_t, col_t, size_t) override {} // row and column styles do not make cells used
    void fill_down_cells(row_t, col_t, row_t) override {}
    orcus::spreadsheet::range_size_t get_sheet_size() const override;

    void SetNumber(row_t row, col_t col, double value) { SetValue(row, col, Variant::Number, value, {}); }
    void SetText(row_t row, col_t col, std::string_view text) { SetValue(row, col, Variant::Text, 0, text); }
    void SetValue(row_t row, col_t col, Variant::Type type, double number, std::string_view text);
    // Hands the pending cell to the sink.
    void Flush();
    void End();

private:
    void MoveTo(row_t row, col_t col);

    Factory& m_factory;
    int m_index;
    FormulaResult m_formula;
    ArrayFormulaResult m_arrayFormula;
    ImportedCell m_pending;
    bool m_hasPending = false;
    bool m_ended = false;
};

// Cell references in the sheet parts ("B3", "A1:C9") in the A1 notation.
class ReferenceResolver : public iface::import_reference_resolver {
public:
    orcus::spreadsheet::src_address_t resolve_address(std::string_view address) override
    {
        std::optional<CellPosition> position = ParseCellAddress(address);
        if (!position)
            throw AutomationError("the cell reference '" + std::string(address) +
                                  "' is malformed or lies outside the sheet's grid (1048576 rows, 16384 columns).");
        return {0, position->row - 1, position->column - 1};
    }
    orcus::spreadsheet::src_range_t resolve_range(std::string_view range) override
    {
        size_t colon = range.find(':');
        orcus::spreadsheet::src_address_t first = resolve_address(range.substr(0, colon));
        if (colon == std::string_view::npos)
            return {first, first};
        return {first, resolve_address(range.substr(colon + 1))};
    }
};

class GlobalSettings : public iface::import_global_settings {
public:
    void set_origin_date(int, int, int) override {}
    void set_default_formula_grammar(orcus::spreadsheet::formula_grammar_t grammar) override { m_grammar = grammar; }
    orcus::spreadsheet::formula_grammar_t get_default_formula_grammar() const override { return m_grammar; }
    void set_character_set(orcus::character_set_t) override {}

private:
    orcus::spreadsheet::formula_grammar_t m_grammar = orcus::spreadsheet::formula_grammar_t::xlsx;
};

class Factory : public iface::import_factory {
public:
    Factory(ImportSink& sink, StyleTable& styles, const ImportLimits& limits)
        : m_sink(sink), m_styles(styles), m_limits(limits) {}

    iface::import_global_settings* get_global_settings() override { return &m_settings; }
    iface::import_shared_strings* get_shared_strings() override { return &m_strings; }
    iface::import_styles* get_styles() override { return &m_styles; }
    iface::import_reference_resolver* get_reference_resolver(orcus::spreadsheet::formula_ref_context_t) override { return &m_resolver; }

    iface::import_sheet* append_sheet(orcus::spreadsheet::sheet_t, std::string_view name) override
    {
        m_sheets.push_back(std::make_unique<Sheet>(*this, static_cast<int>(m_sheets.size())));
        m_names.emplace_back(name);
        m_sink.AddSheet(std::string(name));
        return m_sheets.back().get();
    }
    iface::import_sheet* get_sheet(std::string_view name) override
    {
        for (size_t i = 0; i < m_names.size(); ++i)
            if (m_names[i] == name)
                return m_sheets[i].get();
        return nullptr;
    }
    iface::import_sheet* get_sheet(orcus::spreadsheet::sheet_t index) override
    {
        return index >= 0 && static_cast<size_t>(index) < m_sheets.size() ? m_sheets[static_cast<size_t>(index)].get() : nullptr;
    }
    void finalize() override
    {
        for (auto& sheet : m_sheets)
            sheet->End();
    }

    // Cells of one sheet come together; a cell of another sheet ends the previous one.
    void Activate(Sheet* sheet)
    {
        if (m_active != nullptr && m_active != sheet)
            m_active->End();
        m_active = sheet;
    }

    ImportSink& SinkRef() { return m_sink; }
    const SharedStrings& Strings() const { return m_strings; }
    const ImportLimits& Limits() const { return m_limits; }

private:
    ImportSink& m_sink;
    GlobalSettings m_settings;
    ReferenceResolver m_resolver;
    SharedStrings m_strings;
    Styles m_styles;
    const ImportLimits& m_limits;
    std::vector<std::unique_ptr<Sheet>> m_sheets;
    std::vector<std::string> m_names;
    Sheet* m_active = nullptr;
};

void FormulaResult::commit()
{
    if (m_type != Variant::Empty)
        m_sheet.SetValue(m_row, m_col, m_type, m_number, m_text);
    m_type = Variant::Empty;
}

void ArrayFormulaResult::set_result_string(row_t row, col_t col, std::string_view value) { m_sheet.SetText(row, col, value); }
void ArrayFormulaResult::set_result_value(row_t row, col_t col, double value) { m_sheet.SetNumber(row, col, value); }
void ArrayFormulaResult::set_result_bool(row_t row, col_t col, bool value) { m_sheet.SetValue(row, col, Variant::Boolean, value ? 1 : 0, {}); }

bool IsErrorText(std::string_view s)
{
    static const char* const errors[] = {"#NULL!", "#DIV/0!", "#VALUE!", "#REF!", "#NAME?", "#NUM!", "#N/A", "#GETTING_DATA"};
    for (const char* e : errors)
        if (s == e)
            return true;
    return false;
}

void Sheet::set_auto(row_t row, col_t col, std::string_view s)
{
    // Error cells and inline strings arrive as text; an error keeps its own type.
    if (IsErrorText(s))
        SetValue(row, col, Variant::Error, 0, s);
    else
        SetText(row, col, s);
}

void Sheet::set_string(row_t row, col_t col, orcus::spreadsheet::string_id_t sindex)
{
    const std::string* s = m_factory.Strings().Find(sindex);
    SetText(row, col, s ? std::string_view(*s) : std::string_view());
}

void Sheet::set_date_time(row_t row, col_t col, int year, int month, int day, int hour, int minute, double second)
{
    double days = static_cast<double>(DaysFromCivil(year, month, day));
    SetNumber(row, col, days + (hour * 3600.0 + minute * 60.0 + second) / 86400.0);
}

void Sheet::set_format(row_t row, col_t col, size_t xf_index)
{
    MoveTo(row, col);
    // The styles part is read after the sheets: keep the xf index, which is the style index.
    m_pending.style = static_cast<unsigned>(std::min<size_t>(xf_index, UINT_MAX));
}

orcus::spreadsheet::range_size_t Sheet::get_sheet_size() const
{
    return {m_factory.Limits().maxRows, m_factory.Limits().maxColumns};
}

void Sheet::SetValue(row_t row, col_t col, Variant::Type type, double number, std::string_view text)
{
    MoveTo(row, col);
    m_pending.type = type;
    m_pending.number = number;
    m_pending.text.assign(text);
}

void Sheet::MoveTo(row_t row, col_t col)
{
    if (row < 0 || col < 0 || row >= m_factory.Limits().maxRows || col >= m_factory.Limits().maxColumns)
        throw AutomationError("cell row " + std::to_string(row + 1) + ", column " + std::to_string(col + 1) +
                              " lies outside the sheet's grid of " + std::to_string(m_factory.Limits().maxRows) +
                              " rows and " + std::to_string(m_factory.Limits().maxColumns) + " columns.");
    if (m_hasPending && m_pending.row == row + 1 && m_pending.column == col + 1)
        return;
    Flush();
    m_factory.Activate(this);
    m_pending = ImportedCell();
    m_pending.row = row + 1;
    m_pending.column = col + 1;
    m_hasPending = true;
    m_ended = false;
}

void Sheet::Flush()
{
    if (!m_hasPending)
        return;
    m_hasPending = false;
    // A blank cell counts only when it carries a style other than General's default.
    if (m_pending.type != Variant::Empty || m_pending.style != 0)
        m_factory.SinkRef().AddCell(m_index, m_pending);
}

void Sheet::End()
{
    Flush();
    if (!m_ended)
        m_factory.SinkRef().EndSheet(m_index);
    m_ended = true;
}

} // namespace

void ImportXlsx(const std::string& path, ImportSink& sink, StyleTable& styles, const ImportLimits& limits)
{
    CheckZipDirectory(path, limits);
    Factory factory(sink, styles, limits);
    try {
        orcus::orcus_xlsx filter(&factory);
        orcus::config config(orcus::format_t::xlsx);
        config.debug = false;
        config.structure_check = false;
        filter.set_config(config);
        filter.read_file(path);
    } catch (const StopImport&) {
        throw;
    } catch (const AutomationError& e) {
        throw OpenError(path, e.what());
    } catch (const std::bad_alloc&) {
        throw OpenError(path, "not enough memory to read the workbook.");
    } catch (const std::exception& e) {
        throw OpenError(path, std::string("the workbook is damaged (") + e.what() + ").");
    }
}

} // namespace sheet
