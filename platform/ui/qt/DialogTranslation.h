#pragma once
// How the toolbox's dialog requests read in Qt: message-box styles and answers, "Name|*.x|...||"
// filters, file dialog flags. Plain functions, so the rules are tested without showing anything.
#include "platform/ui/UserInterface.h"

#include <QFileDialog>
#include <QMessageBox>
#include <QStringList>

namespace ui {

// The buttons and icon of a box of style `type` (MB_ flags).
struct MessageBoxLook {
    QMessageBox::StandardButtons buttons;
    QMessageBox::StandardButton defaultButton = QMessageBox::Ok;
    QMessageBox::Icon icon = QMessageBox::NoIcon;
};
MessageBoxLook LookOfMessageBox(unsigned type);
// The answer (IDOK, IDYES, ...) for the button pressed; IDCANCEL for a box closed otherwise.
int AnswerOfButton(QMessageBox::StandardButton button);

// "Text Files (*.txt)|*.txt|All Files (*.*)|*.*||" as Qt name filters: each name keeps its words
// and lists its own patterns, blank-separated: "Text Files (*.txt)", "All Files (*)". Qt matches
// "*.*" only on names with a point, so it becomes "*".
QStringList NameFiltersOf(const std::string& filter);

// What a file dialog is set to for a request.
struct FileDialogSetup {
    QFileDialog::AcceptMode acceptMode = QFileDialog::AcceptOpen;
    QFileDialog::FileMode fileMode = QFileDialog::ExistingFile;
    QStringList nameFilters;
    QString defaultSuffix;     // without the point
    QString selectedName;      // the name shown first; empty when the request gave a pattern
    QString startFolder;       // empty: the current folder
    bool confirmOverwrite = false;
};
FileDialogSetup SetupOfFileDialog(const FileDialogRequest& request);

} // namespace ui
