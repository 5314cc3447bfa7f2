#include "wizard/SelectInputPage.h"

#include "engine/Engine.h"
#include "platform/ui/qt/Controls.h"
#include "platform/ui/qt/OkaFileSelectorDlg.h"
#include "wizard/PageFlow.h"
#include "wizard/VelmoraBrowseCtrl.h"
#include "wizard/VelmoraBrowseDirEdit.h"

#include <QButtonGroup>
#include <QGridLayout>
#include <QLabel>
#include <QLineEdit>
#include <QRadioButton>

CSelectInputPage::CSelectInputPage(QWidget* parent) : CTSHarborPage(IDD, parent)
{
    setWindowTitle(tr("Input Data"));
    setTitle(tr("Select Input"));
    setSubTitle(tr("On this page,  you select the file or folder you want to use and the format of the input."));
    // Every control is owned by the page.
    m_radioSingleFile = ui::Identify(new QRadioButton(tr("Single file"), this), IDC_SINGLE_FILE);
    m_radioFolder = ui::Identify(new QRadioButton(tr("Folder"), this), IDC_FOLDER);
    m_radioRbx0 = ui::Identify(new QRadioButton(tr("rbx0"), this), IDC_RBX0);
    m_radioAscii = ui::Identify(new QRadioButton(tr("ASCII"), this), IDC_ASCII);
    m_radioExcel = ui::Identify(new QRadioButton(tr("Excel"), this), IDC_EXCEL);
    auto* types = new QButtonGroup(this);
    types->addButton(m_radioSingleFile);
    types->addButton(m_radioFolder);
    auto* formats = new QButtonGroup(this);
    formats->addButton(m_radioRbx0);
    formats->addButton(m_radioAscii);
    formats->addButton(m_radioExcel);
    m_ctrlFile = new CVelmoraBrowseCtrl(IDC_FILE, tr("File:"), this);
    m_ctrlFolder = new CVelmoraBrowseDirEdit(IDC_FOLDER_PATH, tr("Folder:"), this);

    auto* layout = new QGridLayout(this);
    layout->setColumnStretch(1, 1);
    layout->addWidget(new QLabel(tr("Type of conversion:"), this), 0, 0);
    layout->addLayout(ui::ButtonRow({m_radioSingleFile, m_radioFolder}), 0, 1);
    layout->addWidget(new QLabel(tr("Input format:"), this), 1, 0);
    layout->addLayout(ui::ButtonRow({m_radioRbx0, m_radioAscii, m_radioExcel}), 1, 1);
    layout->setRowMinimumHeight(2, 12);
    layout->addWidget(new QLabel(tr("Select time series file:"), this), 3, 0, 1, 2);
    layout->addWidget(ui::LabelFor(tr("File:"), m_ctrlFile->Edit(), this), 4, 0);
    layout->addWidget(m_ctrlFile, 4, 1);
    layout->setRowMinimumHeight(5, 12);
    layout->addWidget(new QLabel(tr("Select time series folder:"), this), 6, 0, 1, 2);
    layout->addWidget(ui::LabelFor(tr("Folder:"), m_ctrlFolder->Edit(), this), 7, 0);
    layout->addWidget(m_ctrlFolder, 7, 1);
    layout->setRowStretch(8, 1);
    FinishPage(kPageWidthUnits, kPageHeightUnits);

    ApplyRuleOnClick(this, m_radioFolder, [this](SelectInputState& s) { ClickFolder(s, Engine()); });
    ApplyRuleOnClick(this, m_radioSingleFile, [this](SelectInputState& s) { ClickSingleFile(s, Engine()); });
    ApplyRuleOnClick(this, m_radioRbx0, [](SelectInputState& s) { ClickFormat(s, 1); });
    ApplyRuleOnClick(this, m_radioAscii, [](SelectInputState& s) { ClickFormat(s, 2); });
    ApplyRuleOnClick(this, m_radioExcel, [](SelectInputState& s) { ClickFormat(s, 3); });
    connect(m_ctrlFile, &CVelmoraBrowseCtrl::SelectorOpening, this,
            [this](COkaFileSelectorDlg* dialog) { SelectorOpening(ReadControls(), Engine(), dialog); });
}

SelectInputState CSelectInputPage::ReadControls() const
{
    SelectInputState state;
    state.singleFile = m_radioSingleFile->isChecked();
    state.format = m_radioRbx0->isChecked() ? 1 : m_radioAscii->isChecked() ? 2 : 3;
    state.browse = {m_ctrlFile->m_strFilter, m_ctrlFile->m_strExtension, m_ctrlFile->m_nBrowseMode};
    state.file = m_ctrlFile->GetSelectedFile();
    state.folder = m_ctrlFolder->GetText();
    state.fileEnabled = m_ctrlFile->isEnabled();
    state.folderEnabled = m_ctrlFolder->isEnabled();
    return state;
}

void CSelectInputPage::ShowState(const SelectInputState& state)
{
    (state.singleFile ? m_radioSingleFile : m_radioFolder)->setChecked(true);
    QRadioButton* formats[] = {m_radioRbx0, m_radioAscii, m_radioExcel};
    if (state.format >= 1 && state.format <= 3)
        formats[state.format - 1]->setChecked(true);
    m_ctrlFile->SetFilter(state.browse.filter);
    m_ctrlFile->SetExtension(state.browse.extension);
    m_ctrlFile->m_nBrowseMode = state.browse.mode;
    m_ctrlFile->SetInitialFile(state.file);
    m_ctrlFile->SetInitialItems({});
    m_ctrlFolder->SetText(state.folder);
    m_ctrlFile->setEnabled(state.fileEnabled);
    m_ctrlFolder->setEnabled(state.folderEnabled);
}

bool CSelectInputPage::OnInitDialog()
{
    CTSHarborPage::OnInitDialog();
    ShowState(InitialSelectInput());
    SetPreviewButton(false, false);
    return true;
}

bool CSelectInputPage::OnSetActive()
{
    SelectInputState state = ReadControls();
    if (CEngine* engine = Engine())
        LoadSelectInput(state, *engine);
    ShowState(state);
    SetPreviewButton(false, false);
    return CTSHarborPage::OnSetActive();
}

int CSelectInputPage::OnWizardNext()
{
    if (!AcceptSelectInput(ReadControls(), Engine()))
        return -1;
    return LeaveForward();
}

int CSelectInputPage::GetNextPageID() { return NextPageOf(IDD, Engine()); }

CString CSelectInputPage::HelpText() const
{
    return "Choose \"Single file\" to convert one file or \"Folder\" to convert every file of a folder, then "
           "the format of the input and the file or folder. Next checks that the file exists and has the "
           "format's extension, or that the folder holds at least one such file.";
}
