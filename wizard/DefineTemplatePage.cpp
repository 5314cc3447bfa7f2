#include "wizard/DefineTemplatePage.h"

#include "engine/Engine.h"
#include "platform/ui/qt/Controls.h"
#include "wizard/PageFlow.h"

#include <QButtonGroup>
#include <QFontDatabase>
#include <QFrame>
#include <QGridLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QRadioButton>

namespace {

QLabel* WrappedLabel(int id, QWidget* parent)
{
    auto* label = ui::Identify(new QLabel(parent), id);
    label->setWordWrap(true);
    return label;
}

QRadioButton* Radio(int id, const QString& text, QWidget* parent)
{
    return ui::Identify(new QRadioButton(text, parent), id);
}

} // namespace

CDefineTemplatePage::CDefineTemplatePage(QWidget* parent) : CTSHarborPage(IDD, parent)
{
    setWindowTitle(tr("Define template"));
    setTitle(tr("Define template"));
    setSubTitle(tr("Choose how the layout of the file is described."));
    // Every control is owned by the page.
    m_lines = {WrappedLabel(IDC_LINE1, this), WrappedLabel(IDC_LINE2, this), WrappedLabel(IDC_LINE3, this)};
    auto* separator = ui::Identify(new QFrame(this), IDC_SEPARATOR);
    separator->setFrameShape(QFrame::HLine);
    separator->setFrameShadow(QFrame::Sunken);
    m_radioUnchanged = Radio(
        IDC_USE_UNCHANGED, tr("The format is defined in an existing template, which I would like to use unchanged."), this);
    m_radioModify = Radio(
        IDC_MODIFY, tr("The format is defined in an existing template, but I need to modify it before use."), this);
    m_radioManual =
        Radio(IDC_MANUAL, tr("I do not have a template and would like to specify the format manually."), this);
    auto* options = new QButtonGroup(this);
    options->addButton(m_radioUnchanged);
    options->addButton(m_radioModify);
    options->addButton(m_radioManual);
    m_editTemplate = ui::Identify(new QLineEdit(this), IDC_TEMPLATE);
    m_btnBrowse = ui::Identify(ui::BrowseButton(tr("Browse for a template file"), this), IDC_BROWSE);

    auto* layout = new QGridLayout(this);
    layout->setColumnStretch(1, 1);
    for (int i = 0; i < 3; ++i)
        layout->addWidget(m_lines[static_cast<size_t>(i)], i, 0, 1, 3);
    layout->addWidget(separator, 3, 0, 1, 3);
    layout->addWidget(m_radioUnchanged, 4, 0, 1, 3);
    layout->addWidget(m_radioModify, 5, 0, 1, 3);
    layout->addWidget(m_radioManual, 6, 0, 1, 3);
    layout->setRowMinimumHeight(7, 12);
    layout->addWidget(new QLabel(tr("Select a template file:"), this), 8, 0, 1, 3);
    layout->addWidget(ui::LabelFor(tr("File:"), m_editTemplate, this), 9, 0);
    layout->addWidget(m_editTemplate, 9, 1);
    layout->addWidget(m_btnBrowse, 9, 2);
    layout->setRowStretch(10, 1);
    FinishPage(kPageWidthUnits, kPageHeightUnits);

    ApplyRuleOnClick(this, m_radioUnchanged, [](DefineTemplateState& s) { ClickExistingTemplate(s, 1); });
    ApplyRuleOnClick(this, m_radioModify, [](DefineTemplateState& s) { ClickExistingTemplate(s, 2); });
    ApplyRuleOnClick(this, m_radioManual, [](DefineTemplateState& s) { ClickManual(s); });
    connect(m_btnBrowse, &QPushButton::clicked, this, &CDefineTemplatePage::OnBrowse);
}

DefineTemplateState CDefineTemplatePage::ReadControls() const
{
    DefineTemplateState state;
    state.storedOption = m_nOption;
    state.checkedOption = m_radioUnchanged->isChecked() ? 1 : m_radioModify->isChecked() ? 2 : 3;
    state.path = m_editTemplate->text().toStdString();
    state.radiosVisible = !m_radioUnchanged->isHidden();
    for (size_t i = 0; i < 3; ++i)
        state.lines[i] = m_lines[i]->text().toStdString();
    state.pathEnabled = m_editTemplate->isEnabled();
    state.previewEnabled = state.previewVisible = m_nOption != 3;
    return state;
}

void CDefineTemplatePage::ShowState(const DefineTemplateState& state, bool withPreview)
{
    m_nOption = state.storedOption;
    QRadioButton* radios[] = {m_radioUnchanged, m_radioModify, m_radioManual};
    for (int option = 1; option <= 3; ++option)
        radios[option - 1]->setChecked(option == state.checkedOption);
    m_editTemplate->setText(QString::fromStdString(state.path));
    for (QRadioButton* radio : radios)
        radio->setVisible(state.radiosVisible);
    for (size_t i = 0; i < 3; ++i)
        m_lines[i]->setText(QString::fromStdString(state.lines[i]));
    m_editTemplate->setEnabled(state.pathEnabled);
    m_btnBrowse->setEnabled(state.pathEnabled);
    if (withPreview)
        SetPreviewButton(state.previewEnabled, state.previewVisible);
}

bool CDefineTemplatePage::OnInitDialog()
{
    CTSHarborPage::OnInitDialog();
    m_btnBrowse->setFont(QFontDatabase::systemFont(QFontDatabase::GeneralFont));
    ShowState(DefineTemplateState{}, false);
    return true;
}

bool CDefineTemplatePage::OnSetActive()
{
    DefineTemplateState state = ReadControls();
    if (CEngine* engine = Engine())
        LoadDefineTemplate(state, *engine);
    ShowState(state);
    return CTSHarborPage::OnSetActive();
}

void CDefineTemplatePage::OnBrowse()
{
    std::string path;
    if (ui::Current().ChooseFile(TemplateFileRequest(ReadControls()), path))
        m_editTemplate->setText(QString::fromStdString(path));
}

int CDefineTemplatePage::OnWizardNext()
{
    if (!AcceptDefineTemplate(ReadControls(), Engine()))
        return -1;
    return LeaveForward();
}

int CDefineTemplatePage::OnPreview() { return PreviewDefineTemplate(ReadControls(), Engine()); }

int CDefineTemplatePage::GetNextPageID() { return NextPageOf(IDD, Engine()); }

CString CDefineTemplatePage::HelpText() const
{
    return "A template says where the dates, times, item names and values stand in the file. Choose an existing "
           "template file to use it as it is, or to change it on the following pages, or describe the file by "
           "hand. For a folder, choose the template every file of the folder is read with; Next checks that it "
           "fits at least one of them. Preview shows how the file reads with the template.";
}
