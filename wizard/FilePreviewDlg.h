#pragma once
// The file preview: the data file's first lines or cells as they stand ("Input file") over the
// table the parser made of them ("Import result"). It only shows; the lists borrow the caller's
// rows for as long as the dialog runs.
#include "platform/ui/UserInterface.h"

#include <QDialog>

#include <span>

class CPreviewRowsModel;
class QLabel;
class QTableView;

class CFilePreviewDlg : public QDialog {
    Q_OBJECT
public:
    enum : int { IDD = 2288 };
    enum : int { IDOK = 1, IDC_LIST_INPUT = 315, IDC_LIST_RESULT = 316, IDC_STATIC_INPUT = 317, IDC_STATIC_RESULT = 318 };

    explicit CFilePreviewDlg(QWidget* parent = nullptr);

    // Lays the dialog out at its size, fills it and runs it modally; returns IDOK when closed.
    int DoModal();
    // Fills the lists from the members; the dialog must have its size.
    bool OnInitDialog();

    std::string m_strTitle;                      // empty keeps "File Preview Dialog"
    std::span<const std::string> m_vecHeader;    // titles of "Import result"
    std::span<const ui::Row> m_vecInputLines;    // rows of "Input file"; none hides it
    std::span<const ui::Row> m_vecResultRows;    // rows of "Import result"
    QTableView* m_listInput = nullptr;           // owned by the dialog
    QTableView* m_listResult = nullptr;

    QLabel* InputLabel() const { return m_labelInput; }
    QLabel* ResultLabel() const { return m_labelResult; }

private:
    void FillList(QTableView& list, CPreviewRowsModel& model, std::span<const ui::Row> rows,
                  std::span<const std::string> titles);
    void HideInputPart();

    QLabel* m_labelInput = nullptr;
    QLabel* m_labelResult = nullptr;
    CPreviewRowsModel* m_modelInput = nullptr;
    CPreviewRowsModel* m_modelResult = nullptr;
};

// The number of columns FillList shows: the titles, else the cells of the first row; 0 leaves the
// list as it is.
int FillListColumnCount(std::span<const ui::Row> rows, std::span<const std::string> titles);
// The width of each column of a list `listWidth` pixels wide: the width shared out (less 5 pixels
// for the frame), and with titles never below 60 pixels.
int FillListColumnWidth(int listWidth, int columns, bool titled);
