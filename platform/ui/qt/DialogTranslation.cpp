#include "platform/ui/qt/DialogTranslation.h"

#include "platform/system/FileSystem.h"

namespace ui {
namespace {

QString Trimmed(const std::string& text) { return QString::fromStdString(text).trimmed(); }

// The name without a closing "(...)" that lists patterns: "Text Files (*.txt)" -> "Text Files".
QString NameWithoutPatterns(QString name)
{
    if (name.endsWith(')')) {
        const qsizetype open = name.lastIndexOf('(');
        if (open > 0)
            name = name.left(open).trimmed();
    }
    return name;
}

bool IsPattern(const std::string& name) { return name.find_first_of("*?") != std::string::npos; }

} // namespace

MessageBoxLook LookOfMessageBox(unsigned type)
{
    MessageBoxLook look;
    switch (type & 0xF) {
    case MB_OKCANCEL:
        look.buttons = QMessageBox::Ok | QMessageBox::Cancel;
        break;
    case MB_ABORTRETRYIGNORE:
        look.buttons = QMessageBox::Abort | QMessageBox::Retry | QMessageBox::Ignore;
        look.defaultButton = QMessageBox::Abort;
        break;
    case MB_YESNOCANCEL:
        look.buttons = QMessageBox::Yes | QMessageBox::No | QMessageBox::Cancel;
        look.defaultButton = QMessageBox::Yes;
        break;
    case MB_YESNO:
        look.buttons = QMessageBox::Yes | QMessageBox::No;
        look.defaultButton = QMessageBox::Yes;
        break;
    case MB_RETRYCANCEL:
        look.buttons = QMessageBox::Retry | QMessageBox::Cancel;
        look.defaultButton = QMessageBox::Retry;
        break;
    default:
        look.buttons = QMessageBox::Ok;
        break;
    }
    switch (type & 0xF0) {
    case MB_ICONSTOP:
        look.icon = QMessageBox::Critical;
        break;
    case MB_ICONQUESTION:
        look.icon = QMessageBox::Question;
        break;
    case MB_ICONEXCLAMATION:
        look.icon = QMessageBox::Warning;
        break;
    case MB_ICONINFORMATION:
        look.icon = QMessageBox::Information;
        break;
    default:
        break;
    }
    return look;
}

int AnswerOfButton(QMessageBox::StandardButton button)
{
    switch (button) {
    case QMessageBox::Ok:
        return IDOK;
    case QMessageBox::Yes:
        return IDYES;
    case QMessageBox::No:
        return IDNO;
    case QMessageBox::Abort:
        return IDABORT;
    case QMessageBox::Retry:
        return IDRETRY;
    case QMessageBox::Ignore:
        return IDIGNORE;
    default:
        return IDCANCEL;
    }
}

QStringList NameFiltersOf(const std::string& filter)
{
    QStringList filters;
    const QStringList parts = QString::fromStdString(filter).split('|');
    for (qsizetype i = 0; i + 1 < parts.size(); i += 2) {
        const QString name = NameWithoutPatterns(parts[i].trimmed());
        QStringList patterns;
        for (const QString& pattern : parts[i + 1].split(';', Qt::SkipEmptyParts)) {
            const QString trimmed = pattern.trimmed();
            if (!trimmed.isEmpty())
                patterns << (trimmed == "*.*" ? QStringLiteral("*") : trimmed);
        }
        if (name.isEmpty() && patterns.isEmpty())
            break; // the "||" that closes the list
        filters << QStringLiteral("%1 (%2)").arg(name, patterns.join(' '));
    }
    return filters;
}

FileDialogSetup SetupOfFileDialog(const FileDialogRequest& request)
{
    FileDialogSetup setup;
    setup.nameFilters = NameFiltersOf(request.filter);
    QString suffix = Trimmed(request.defaultExtension);
    while (suffix.startsWith('*') || suffix.startsWith('.'))
        suffix.remove(0, 1);
    setup.defaultSuffix = suffix;
    if (request.open) {
        setup.acceptMode = QFileDialog::AcceptOpen;
        if (request.flags & OFN_ALLOWMULTISELECT)
            setup.fileMode = QFileDialog::ExistingFiles;
        else if (request.flags & OFN_FILEMUSTEXIST)
            setup.fileMode = QFileDialog::ExistingFile;
        else
            setup.fileMode = QFileDialog::AnyFile;
    } else {
        // A save dialog names a file to create; "must exist" only ever narrows open dialogs.
        setup.acceptMode = QFileDialog::AcceptSave;
        setup.fileMode = QFileDialog::AnyFile;
        setup.confirmOverwrite = (request.flags & OFN_OVERWRITEPROMPT) != 0;
    }
    if (!request.initialName.empty() && !IsPattern(request.initialName)) {
        setup.selectedName = QString::fromStdString(sys::FileTitle(request.initialName));
        setup.startFolder = QString::fromStdString(sys::FolderOf(request.initialName));
    }
    return setup;
}

} // namespace ui
