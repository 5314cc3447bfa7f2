#pragma once
// The grid of the manual definition dialog: one row per item and the columns Name, Type, Unit and
// Value Type, the last three edited with a drop-down list per cell. It shows a ManualDefGrid and
// applies the grid's rules when an edit ends and when a unit cell is clicked.
#include "wizard/ManualDefForm.h"

#include <QTableWidget>

class CManualDefGridWnd : public QTableWidget {
    Q_OBJECT
public:
    explicit CManualDefGridWnd(QWidget* parent = nullptr);

    // Shows `grid`: its rows, their choice lists, enabled states and backgrounds.
    void Initialize(const ManualDefGrid& grid);
    const ManualDefGrid& Grid() const { return m_grid; }
    // Ends an edit under way, keeping what was chosen.
    void FinishEditing();

    // The end of an edit in grid row `row` and column `column` (both from 1); 1 accepts it.
    virtual int OnEndEditing(int row, int column);
    // A click on a cell, before the cell is edited; 1 when handled.
    virtual int OnLButtonClickedRowCol(int row, int column);

protected:
    void mousePressEvent(QMouseEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void commitData(QWidget* editor) override;

private:
    void ShowRow(int row);
    void SetColumnWidths();

    ManualDefGrid m_grid;
};
