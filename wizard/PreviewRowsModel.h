#pragma once
// A table model over rows someone else owns: the preview shows a parser's result table, which may
// hold millions of rows, without copying it or making an item per cell. The rows must outlive the
// model's use.
#include "platform/ui/UserInterface.h"

#include <QAbstractTableModel>

#include <span>

class CPreviewRowsModel : public QAbstractTableModel {
    Q_OBJECT
public:
    using QAbstractTableModel::QAbstractTableModel;

    // Shows `columns` columns of `rows`, titled by `titles` or, without titles, "Item1" onwards.
    // Cells beyond the last column are not shown; missing cells are blank.
    void SetRows(std::span<const ui::Row> rows, std::span<const std::string> titles, int columns);
    // Shows nothing.
    void Clear();

    int rowCount(const QModelIndex& parent = QModelIndex()) const override;
    int columnCount(const QModelIndex& parent = QModelIndex()) const override;
    QVariant data(const QModelIndex& index, int role = Qt::DisplayRole) const override;
    QVariant headerData(int section, Qt::Orientation orientation, int role = Qt::DisplayRole) const override;

private:
    std::span<const ui::Row> m_rows;
    std::span<const std::string> m_titles;
    int m_nColumns = 0;
};
