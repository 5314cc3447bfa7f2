#include "wizard/PreviewRowsModel.h"

void CPreviewRowsModel::SetRows(std::span<const ui::Row> rows, std::span<const std::string> titles, int columns)
{
    beginResetModel();
    m_rows = rows;
    m_titles = titles;
    m_nColumns = columns;
    endResetModel();
}

void CPreviewRowsModel::Clear() { SetRows({}, {}, 0); }

int CPreviewRowsModel::rowCount(const QModelIndex& parent) const
{
    return parent.isValid() ? 0 : static_cast<int>(m_rows.size());
}

int CPreviewRowsModel::columnCount(const QModelIndex& parent) const { return parent.isValid() ? 0 : m_nColumns; }

QVariant CPreviewRowsModel::data(const QModelIndex& index, int role) const
{
    if (role != Qt::DisplayRole || !index.isValid())
        return QVariant();
    const ui::Row& row = m_rows[static_cast<size_t>(index.row())];
    const auto column = static_cast<size_t>(index.column());
    return column < row.size() ? QString::fromStdString(row[column]) : QString();
}

QVariant CPreviewRowsModel::headerData(int section, Qt::Orientation orientation, int role) const
{
    if (orientation != Qt::Horizontal)
        return QVariant();
    if (role == Qt::TextAlignmentRole)
        return QVariant::fromValue(Qt::AlignLeft | Qt::AlignVCenter);
    if (role != Qt::DisplayRole || section < 0 || section >= m_nColumns)
        return QVariant();
    const auto column = static_cast<size_t>(section);
    if (m_titles.empty())
        return QStringLiteral("Item%1").arg(section + 1);
    return column < m_titles.size() ? QString::fromStdString(m_titles[column]) : QString();
}
