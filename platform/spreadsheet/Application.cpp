// The object model over WorkbookModel: every object keeps the application (and its workbook)
// alive through shared state, and fails with AutomationError once the application has quit or the
// workbook has been closed, as a disconnected automation object does.
#include "formats/workbook/CellAddress.h"
#include "platform/spreadsheet/SpreadsheetApplication.h"

#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"

#include <algorithm>
#include <climits>
#include <cstdlib>

namespace sheet {

namespace {

// Automation reports what a workbook reader found wrong as its error.
void ThrowOnFailure(const sys::Status& status)
{
    if (!status)
        throw AutomationError(status.problem().message);
}

class AppState {
public:
    explicit AppState(ApplicationSettings settings) : settings(std::move(settings)) {}

    void CheckRunning() const
    {
        if (quit)
            throw AutomationError("The remote procedure call failed: the application has quit.");
    }

    ApplicationSettings settings;
    bool visible = false;
    bool quit = false;
};

class BookState {
public:
    BookState(std::shared_ptr<AppState> app, std::unique_ptr<WorkbookModel> model)
        : app(std::move(app)), model(std::move(model)) {}

    void CheckOpen() const
    {
        app->CheckRunning();
        if (closed)
            throw AutomationError("The object invoked has disconnected from its clients: the workbook is closed.");
    }

    const SheetModel& Sheet(int index) const { return model->sheets.at(static_cast<size_t>(index)); }

    // Makes sure the cells of rows 1..lastRow of `sheet` are held, reading the file again with a
    // larger window when the first reading kept fewer rows.
    void EnsureRows(int sheet, int lastRow)
    {
        if (Sheet(sheet).Holds(lastRow))
            return;
        LoadOptions options = app->settings.load;
        options.retainedRows = std::max(lastRow, Sheet(sheet).HeldRows() * 2);
        std::unique_ptr<WorkbookModel> wider;
        ThrowOnFailure(LoadWorkbook(model->path, options, wider));
        if (wider->sheets.size() != model->sheets.size() || !wider->sheets[static_cast<size_t>(sheet)].Holds(lastRow))
            throw AutomationError("Not enough storage is available to complete this operation: rows up to " +
                                  std::to_string(lastRow) + " of sheet " + Sheet(sheet).Name() + " do not fit.");
        model = std::move(wider);
    }

    std::shared_ptr<AppState> app;
    std::unique_ptr<WorkbookModel> model;
    bool closed = false;
};

class RangeImpl : public CellRange {
public:
    RangeImpl(std::shared_ptr<BookState> book, int sheet, CellRect rect)
        : m_book(std::move(book)), m_sheet(sheet), m_rect(rect) {}

    Variant Text() const override
    {
        m_book->CheckOpen();
        CheckArraySize();
        m_book->EnsureRows(m_sheet, m_rect.lastRow);
        const SheetModel& sheet = m_book->Sheet(m_sheet);
        std::string first = m_book->model->TextOf(sheet.Find(m_rect.firstRow, m_rect.firstColumn));
        // Several cells: their common text, or Null (Empty) when they differ.
        for (int r = m_rect.firstRow; r <= m_rect.lastRow; ++r)
            for (int c = m_rect.firstColumn; c <= m_rect.lastColumn; ++c)
                if (m_book->model->TextOf(sheet.Find(r, c)) != first)
                    return Variant();
        Variant text;
        text.type = Variant::Text;
        text.text = first;
        return text;
    }

    Variant Value2() const override
    {
        m_book->CheckOpen();
        CheckArraySize();
        m_book->EnsureRows(m_sheet, m_rect.lastRow);
        const SheetModel& sheet = m_book->Sheet(m_sheet);
        if (m_rect.Cells() == 1)
            return WorkbookModel::ValueOf(sheet.Find(m_rect.firstRow, m_rect.firstColumn));
        Variant array;
        array.type = Variant::Array;
        array.rows = static_cast<int>(m_rect.Rows());
        array.columns = static_cast<int>(m_rect.Columns());
        array.cells.resize(static_cast<size_t>(m_rect.Cells()));
        size_t i = 0;
        for (int r = m_rect.firstRow; r <= m_rect.lastRow; ++r)
            for (int c = m_rect.firstColumn; c <= m_rect.lastColumn; ++c)
                array.cells[i++] = WorkbookModel::ValueOf(sheet.Find(r, c));
        return array;
    }

    int Count() const override
    {
        m_book->CheckOpen();
        if (m_rect.Cells() > INT_MAX)
            throw AutomationError("Overflow: the range holds more cells than a 32-bit count.");
        return static_cast<int>(m_rect.Cells());
    }

    int Column() const override
    {
        m_book->CheckOpen();
        return m_rect.firstColumn;
    }

    int Row() const override
    {
        m_book->CheckOpen();
        return m_rect.firstRow;
    }

    int RowCount() const override
    {
        m_book->CheckOpen();
        return static_cast<int>(m_rect.Rows());
    }

    int ColumnCount() const override
    {
        m_book->CheckOpen();
        return static_cast<int>(m_rect.Columns());
    }

    // Cells with a value, from what the workbook holds, or by reading the file once more.
    long long CountValues() const
    {
        m_book->CheckOpen();
        if (std::optional<long long> held = m_book->Sheet(m_sheet).CountValues(m_rect))
            return *held;
        long long count = 0;
        ThrowOnFailure(CountValuesInFile(m_book->model->path, m_sheet, m_rect, m_book->app->settings.load.limits, count));
        return count;
    }

private:
    void CheckArraySize() const
    {
        if (m_rect.Cells() > m_book->app->settings.maxArrayCells)
            throw AutomationError("Not enough storage is available to complete this operation: the range " +
                                  ColumnLetters(m_rect.firstColumn) + std::to_string(m_rect.firstRow) + ":" +
                                  ColumnLetters(m_rect.lastColumn) + std::to_string(m_rect.lastRow) + " holds " +
                                  std::to_string(m_rect.Cells()) + " cells.");
    }

    std::shared_ptr<BookState> m_book;
    int m_sheet;
    CellRect m_rect;
};

class WorksheetFunctionImpl : public WorksheetFunction {
public:
    explicit WorksheetFunctionImpl(std::shared_ptr<AppState> app) : m_app(std::move(app)) {}

    double CountA(const std::shared_ptr<CellRange>& range) override
    {
        m_app->CheckRunning();
        const auto* ours = dynamic_cast<const RangeImpl*>(range.get());
        if (ours == nullptr)
            throw AutomationError("Unable to get the CountA property of the WorksheetFunction class: not a range of this application.");
        return static_cast<double>(ours->CountValues());
    }

private:
    std::shared_ptr<AppState> m_app;
};

class WorksheetImpl : public Worksheet {
public:
    WorksheetImpl(std::shared_ptr<BookState> book, int sheet) : m_book(std::move(book)), m_sheet(sheet) {}

    std::shared_ptr<CellRange> Range(const std::string& cell, const std::string& otherCell) override
    {
        m_book->CheckOpen();
        std::string first = cell, second = otherCell;
        size_t colon = cell.find(':');
        if (second.empty() && colon != std::string::npos) {
            first = cell.substr(0, colon);
            second = cell.substr(colon + 1);
        }
        CellRect rect;
        rect.Include(Position(first).row, Position(first).column);
        if (!second.empty())
            rect.Include(Position(second).row, Position(second).column);
        return std::make_shared<RangeImpl>(m_book, m_sheet, rect);
    }

    std::shared_ptr<CellRange> UsedRange() override
    {
        m_book->CheckOpen();
        CellRect rect = m_book->Sheet(m_sheet).UsedRect();
        if (rect.IsEmpty())
            rect.Include(1, 1); // an empty sheet's used range is its first cell
        return std::make_shared<RangeImpl>(m_book, m_sheet, rect);
    }

private:
    CellPosition Position(const std::string& address) const
    {
        const ImportLimits& limits = m_book->app->settings.load.limits;
        std::optional<CellPosition> position = ParseCellAddress(address, limits.maxRows, limits.maxColumns);
        if (!position)
            throw AutomationError("Method 'Range' of object '_Worksheet' failed: '" + address + "' is not a cell address.");
        return *position;
    }

    std::shared_ptr<BookState> m_book;
    int m_sheet;
};

class WorksheetsImpl : public Worksheets {
public:
    explicit WorksheetsImpl(std::shared_ptr<BookState> book) : m_book(std::move(book)) {}

    int Count() override
    {
        m_book->CheckOpen();
        return static_cast<int>(m_book->model->sheets.size());
    }

    std::shared_ptr<Worksheet> Item(int number) override
    {
        m_book->CheckOpen();
        if (number < 1 || number > static_cast<int>(m_book->model->sheets.size()))
            throw AutomationError("Invalid index: the workbook has no sheet " + std::to_string(number) + ".");
        return std::make_shared<WorksheetImpl>(m_book, number - 1);
    }

private:
    std::shared_ptr<BookState> m_book;
};

class WorkbookImpl : public Workbook {
public:
    explicit WorkbookImpl(std::shared_ptr<BookState> book) : m_book(std::move(book)) {}

    void Close(bool /*saveChanges: nothing is ever changed*/) override
    {
        m_book->CheckOpen();
        m_book->closed = true;
        m_book->model.reset(new WorkbookModel());
    }

    std::shared_ptr<sheet::Worksheets> Worksheets() override
    {
        m_book->CheckOpen();
        return std::make_shared<WorksheetsImpl>(m_book);
    }

private:
    std::shared_ptr<BookState> m_book;
};

class WorkbooksImpl : public Workbooks {
public:
    explicit WorkbooksImpl(std::shared_ptr<AppState> app) : m_app(std::move(app)) {}

    std::shared_ptr<Workbook> Open(const std::string& path) override
    {
        m_app->CheckRunning();
        if (!sys::FileExists(path))
            throw AutomationError("'" + path + "' could not be found. Check the spelling of the file name, and verify that the file location is correct.");
        std::unique_ptr<WorkbookModel> model;
        ThrowOnFailure(LoadWorkbook(path, m_app->settings.load, model));
        auto book = std::make_shared<BookState>(m_app, std::move(model));
        return std::make_shared<WorkbookImpl>(book);
    }

private:
    std::shared_ptr<AppState> m_app;
};

class ApplicationImpl : public Application {
public:
    explicit ApplicationImpl(ApplicationSettings settings) : m_app(std::make_shared<AppState>(std::move(settings))) {}

    void Visible(bool visible) override
    {
        m_app->CheckRunning();
        m_app->visible = visible;
    }
    std::shared_ptr<sheet::Workbooks> Workbooks() override
    {
        m_app->CheckRunning();
        return std::make_shared<WorkbooksImpl>(m_app);
    }
    std::shared_ptr<sheet::WorksheetFunction> WorksheetFunction() override
    {
        m_app->CheckRunning();
        return std::make_shared<WorksheetFunctionImpl>(m_app);
    }
    std::string Version() override
    {
        m_app->CheckRunning();
        return m_app->settings.version;
    }
    void Quit() override
    {
        m_app->CheckRunning();
        m_app->quit = true;
    }

private:
    std::shared_ptr<AppState> m_app;
};

} // namespace

std::optional<ApplicationSettings> SettingsFromEnvironment()
{
    const char* presence = std::getenv("VELMORA_SPREADSHEET");
    if (presence != nullptr && text::EqualsNoCase(text::Trim(presence), "absent"))
        return std::nullopt;
    ApplicationSettings settings;
    const char* version = std::getenv("VELMORA_SPREADSHEET_VERSION");
    if (version != nullptr && !text::Trim(version).empty())
        settings.version = text::Trim(version);
    return settings;
}

std::shared_ptr<Application> StartApplication(const ApplicationSettings& settings)
{
    return std::make_shared<ApplicationImpl>(settings);
}

std::shared_ptr<Application> CreateApplication()
{
    std::optional<ApplicationSettings> settings = SettingsFromEnvironment();
    if (!settings)
        return nullptr;
    return StartApplication(*settings);
}

} // namespace sheet
