#include "wizard/OutputDataPage.h"

#include "engine/Engine.h"
#include "platform/ui/qt/Controls.h"
#include "wizard/PageFlow.h"

#include <QButtonGroup>
#include <QFontDatabase>
#include <QGridLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QRadioButton>

namespace {

QLabel* Wrapped(const QString& text, QWidget* parent)
{
    auto* label = new QLabel(text, parent);
    label->setWordWrap(true);
    return label;
}

} // namespace

COutputDataPage::COutputDataPage(QWidget* parent) : CTSHarborPage(IDD, parent)
{
    setWindowTitle(tr("Output Specification."));
    setTitle(tr("Specify Output Data."));
    setSubTitle(tr("On this page,  you specify the name and title of the output file or folder, as well as the output format."));
    // Every control is owned by the page.
    m_radioRbx0 = ui::Identify(new QRadioButton(tr("rbx0"), this), IDC_RBX0);
    m_radioAscii = ui::Identify(new QRadioButton(tr("ASCII"), this), IDC_ASCII);
    m_radioExcel = ui::Identify(new QRadioButton(tr("Excel"), this), IDC_EXCEL);
    auto* formats = new QButtonGroup(this);
    for (QRadioButton* radio : {m_radioRbx0, m_radioAscii, m_radioExcel})
        formats->addButton(radio);
    m_editFile = ui::Identify(new QLineEdit(this), IDC_FILE);
    m_btnFile = ui::Identify(ui::BrowseButton(tr("Browse for the output file"), this), IDC_BROWSE_FILE);
    m_editFolder = ui::Identify(new QLineEdit(this), IDC_FOLDER);
    m_btnFolder = ui::Identify(ui::BrowseButton(tr("Browse for the output folder"), this), IDC_BROWSE_FOLDER);
    m_editTitle = ui::Identify(new QLineEdit(this), IDC_TITLE);

    auto* layout = new QGridLayout(this);
    layout->setColumnStretch(1, 1);
    layout->addWidget(Wrapped(tr("Furthermore you specify the format of  the output."), this), 0, 0, 1, 3);
    layout->addWidget(new QLabel(tr("Format of output"), this), 1, 0, 1, 3);
    layout->addLayout(ui::ButtonRow({m_radioRbx0, m_radioAscii, m_radioExcel}), 2, 0, 1, 3);
    layout->setRowMinimumHeight(3, 12);
    layout->addWidget(Wrapped(tr("Specify name and title for the output data file or folder."), this), 4, 0, 1, 3);
    layout->addWidget(ui::LabelFor(tr("File Name:"), m_editFile, this), 5, 0);
    layout->addWidget(m_editFile, 5, 1);
    layout->addWidget(m_btnFile, 5, 2);
    layout->addWidget(ui::LabelFor(tr("Folder Name:"), m_editFolder, this), 6, 0);
    layout->addWidget(m_editFolder, 6, 1);
    layout->addWidget(m_btnFolder, 6, 2);
    layout->addWidget(ui::LabelFor(tr("Title:"), m_editTitle, this), 7, 0);
    layout->addWidget(m_editTitle, 7, 1);
    layout->setRowStretch(8, 1);
    FinishPage(kPageWidthUnits, kPageHeightUnits);

    connect(m_btnFile, &QPushButton::clicked, this, &COutputDataPage::OnBrowseOutputFile);
    connect(m_btnFolder, &QPushButton::clicked, this, &COutputDataPage::OnBrowseOutputFolder);
    for (QRadioButton* radio : {m_radioRbx0, m_radioAscii, m_radioExcel})
        connect(radio, &QRadioButton::clicked, this, &COutputDataPage::OnClickedOutputFormat);
}

int COutputDataPage::InputType() const
{
    const CEngine* engine = Engine();
    return engine ? engine->m_nInputType : 1;
}

OutputState COutputDataPage::ReadControls() const
{
    OutputState state;
    state.format = m_radioRbx0->isChecked() ? 1 : m_radioAscii->isChecked() ? 2 : 3;
    state.file = m_editFile->text().toStdString();
    state.folder = m_editFolder->text().toStdString();
    state.title = m_editTitle->text().toStdString();
    state.fileEnabled = m_editFile->isEnabled();
    state.folderEnabled = m_editFolder->isEnabled();
    state.titleEnabled = m_editTitle->isEnabled();
    return state;
}

void COutputDataPage::ShowState(const OutputState& state)
{
    QRadioButton* radios[] = {m_radioRbx0, m_radioAscii, m_radioExcel};
    if (state.format >= 1 && state.format <= 3)
        radios[state.format - 1]->setChecked(true);
    m_editFile->setText(QString::fromStdString(state.file));
    m_editFolder->setText(QString::fromStdString(state.folder));
    m_editTitle->setText(QString::fromStdString(state.title));
    m_editFile->setEnabled(state.fileEnabled);
    m_btnFile->setEnabled(state.fileEnabled);
    m_editFolder->setEnabled(state.folderEnabled);
    m_btnFolder->setEnabled(state.folderEnabled);
    m_editTitle->setEnabled(state.titleEnabled);
}

void COutputDataPage::EnableOutputControls()
{
    ApplyRule(*this, [this](OutputState& state) { ::EnableOutputControls(state, InputType()); });
}

bool COutputDataPage::OnInitDialog()
{
    CTSHarborPage::OnInitDialog();
    m_radioRbx0->setChecked(true);
    const QFont systemFont = QFontDatabase::systemFont(QFontDatabase::GeneralFont);
    m_btnFile->setFont(systemFont);
    m_btnFolder->setFont(systemFont);
    EnableOutputControls();
    SetPreviewButton(false, false);
    return true;
}

bool COutputDataPage::OnSetActive()
{
    OutputState state = ReadControls();
    if (CEngine* engine = Engine())
        LoadOutput(state, *engine);
    else
        ::EnableOutputControls(state, InputType());
    ShowState(state);
    SetPreviewButton(false, false);
    return CTSHarborPage::OnSetActive();
}

void COutputDataPage::OnClickedOutputFormat()
{
    ApplyRule(*this, [](OutputState& state) { ClickOutputFormat(state, state.format); });
}

void COutputDataPage::OnBrowseOutputFile()
{
    ApplyRule(*this, [](OutputState& state) { BrowseOutputFile(state, ExcelVersionFor(state.format)); });
}

void COutputDataPage::OnBrowseOutputFolder() { ApplyRule(*this, BrowseOutputFolder); }

int COutputDataPage::ValidateOutput()
{
    OutputState state = ReadControls();
    return ::ValidateOutput(state, Engine(), ExcelVersionFor(state.format));
}

int COutputDataPage::OnWizardNext()
{
    if (!ValidateOutput())
        return -1;
    return LeaveForward();
}

int COutputDataPage::GetBackPageID() { return BackPageOf(IDD, Engine()); }

CString COutputDataPage::HelpText() const
{
    return "Choose the format of the output and name the output file (single-file conversion) or the output "
           "folder (folder conversion). A file name without an extension gets the format's own. Only rbx0 "
           "output carries a title.";
}
