#include "wizard/ManualDefGridWnd.h"

#include <QComboBox>
#include <QHeaderView>
#include <QMouseEvent>
#include <QStyledItemDelegate>

namespace {

constexpr int kRowHeaderWidth = 40;
constexpr int kWidthNotShared = 43; // the row headers and the grid's lines
// The cell an editor edits, kept on the editor: when another cell is clicked, the current cell has
// already moved on by the time the editor's text is taken.
const char* const kEditedCell = "editedCell";

// Edits the cells that have a choice list with a drop-down list of it; a choice ends the edit.
class ChoiceDelegate : public QStyledItemDelegate {
public:
    ChoiceDelegate(const CManualDefGridWnd* grid, QObject* parent) : QStyledItemDelegate(parent), m_grid(grid) {}

    QWidget* createEditor(QWidget* parent, const QStyleOptionViewItem& option, const QModelIndex& index) const override
    {
        QWidget* editor = MakeEditor(parent, option, index);
        editor->setProperty(kEditedCell, QPoint(index.column(), index.row()));
        return editor;
    }
    QWidget* MakeEditor(QWidget* parent, const QStyleOptionViewItem& option, const QModelIndex& index) const
    {
        const GridCell& cell = m_grid->Grid().Cell(index.row() + 1, index.column() + 1);
        if (cell.choices.empty())
            return QStyledItemDelegate::createEditor(parent, option, index);
        auto* list = new QComboBox(parent); // owned by the view while the edit lasts
        for (const CString& entry : ChoiceEntries(cell.choices))
            list->addItem(QString::fromStdString(entry));
        connect(list, &QComboBox::activated, this, [this, list] {
            emit const_cast<ChoiceDelegate*>(this)->commitData(list);
            emit const_cast<ChoiceDelegate*>(this)->closeEditor(list);
        });
        return list;
    }
    void setEditorData(QWidget* editor, const QModelIndex& index) const override
    {
        auto* list = qobject_cast<QComboBox*>(editor);
        if (!list)
            return QStyledItemDelegate::setEditorData(editor, index);
        // A value the list lacks (a unit kept from another item type) shows no entry.
        list->setCurrentIndex(list->findText(index.data().toString(), Qt::MatchExactly));
    }
    void setModelData(QWidget* editor, QAbstractItemModel* model, const QModelIndex& index) const override
    {
        auto* list = qobject_cast<QComboBox*>(editor);
        if (!list)
            return QStyledItemDelegate::setModelData(editor, model, index);
        if (list->currentIndex() >= 0)
            model->setData(index, list->currentText());
    }

private:
    const CManualDefGridWnd* m_grid; // the view this delegate belongs to
};

} // namespace

CManualDefGridWnd::CManualDefGridWnd(QWidget* parent) : QTableWidget(parent)
{
    setColumnCount(kGridColumns);
    setHorizontalHeaderLabels({tr("Name "), tr("Type "), tr("Unit "), tr("Value Type")});
    verticalHeader()->setFixedWidth(kRowHeaderWidth);
    horizontalHeader()->setSectionResizeMode(QHeaderView::Interactive);
    setEditTriggers(QAbstractItemView::AllEditTriggers);
    setSelectionMode(QAbstractItemView::SingleSelection);
    setWordWrap(false);
    setItemDelegate(new ChoiceDelegate(this, this));
}

void CManualDefGridWnd::Initialize(const ManualDefGrid& grid)
{
    m_grid = grid;
    setRowCount(static_cast<int>(m_grid.rows.size()));
    for (int row = 1; row <= rowCount(); ++row)
        ShowRow(row);
    SetColumnWidths();
}

void CManualDefGridWnd::ShowRow(int row)
{
    const QSignalBlocker quiet(this);
    for (int column = 1; column <= kGridColumns; ++column) {
        const GridCell& cell = m_grid.Cell(row, column);
        QTableWidgetItem* shown = item(row - 1, column - 1);
        if (!shown) {
            shown = new QTableWidgetItem(); // owned by the table
            setItem(row - 1, column - 1, shown);
        }
        shown->setText(QString::fromStdString(cell.value));
        shown->setFlags(cell.enabled ? Qt::ItemIsSelectable | Qt::ItemIsEnabled | Qt::ItemIsEditable : Qt::NoItemFlags);
        shown->setBackground(cell.shaded ? palette().button() : palette().base());
    }
}

void CManualDefGridWnd::SetColumnWidths()
{
    const int width = (this->width() - kWidthNotShared) / kGridColumns;
    for (int column = 0; column < kGridColumns; ++column)
        setColumnWidth(column, width);
}

void CManualDefGridWnd::resizeEvent(QResizeEvent* event)
{
    QTableWidget::resizeEvent(event);
    SetColumnWidths();
}

void CManualDefGridWnd::FinishEditing()
{
    if (state() != QAbstractItemView::EditingState)
        return;
    if (QWidget* editor = indexWidget(currentIndex())) {
        commitData(editor);
        closeEditor(editor, QAbstractItemDelegate::NoHint);
    }
}

void CManualDefGridWnd::commitData(QWidget* editor)
{
    QTableWidget::commitData(editor);
    const QVariant edited = editor->property(kEditedCell);
    if (!edited.isValid())
        return;
    const int row = edited.toPoint().y() + 1;
    const int column = edited.toPoint().x() + 1;
    m_grid.Cell(row, column).value = item(row - 1, column - 1)->text().toStdString();
    OnEndEditing(row, column);
    ShowRow(row);
}

int CManualDefGridWnd::OnEndEditing(int row, int column) { return EndEditing(m_grid, row, column); }

int CManualDefGridWnd::OnLButtonClickedRowCol(int row, int column)
{
    const int handled = ClickCell(m_grid, row, column);
    ShowRow(row);
    return handled;
}

void CManualDefGridWnd::mousePressEvent(QMouseEvent* event)
{
    // The rule runs before the cell opens, so the list that opens is the new one.
    const QModelIndex index = indexAt(event->position().toPoint());
    if (event->button() == Qt::LeftButton && index.isValid())
        OnLButtonClickedRowCol(index.row() + 1, index.column() + 1);
    QTableWidget::mousePressEvent(event);
    // A click on a cell opens it, also when it was already the current cell.
    if (event->button() == Qt::LeftButton && index.isValid() && state() != QAbstractItemView::EditingState &&
        (index.flags() & Qt::ItemIsEditable))
        edit(index);
}
