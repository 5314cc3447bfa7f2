#include "wizard/SaveTempFilePage.h"

#include "engine/Engine.h"
#include "platform/ui/qt/Controls.h"
#include "wizard/SaveTemplateForm.h"

#include <QFontDatabase>
#include <QGridLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>

CSaveTempFilePage::CSaveTempFilePage(QWidget* parent) : CTSHarborPage(IDD, parent)
{
    setWindowTitle(tr("Save template file"));
    setTitle(tr("Save template file"));
    setSubTitle(tr("In this dialog you save a template file, which will be used in the conversion process. The file "
                   "may be reused in future conversions."));
    // Every control is owned by the page.
    m_editFile = ui::Identify(new QLineEdit(this), IDC_FILE);
    m_btnBrowse = ui::Identify(ui::BrowseButton(tr("Browse for the template file to save"), this), IDC_BROWSE);

    auto* layout = new QGridLayout(this);
    layout->setColumnStretch(1, 1);
    layout->addWidget(new QLabel(tr("Select template file."), this), 0, 0, 1, 3);
    layout->addWidget(ui::LabelFor(tr("File:"), m_editFile, this), 1, 0);
    layout->addWidget(m_editFile, 1, 1);
    layout->addWidget(m_btnBrowse, 1, 2);
    layout->setRowStretch(2, 1);
    FinishPage(kPageWidthUnits, kPageHeightUnits);

    connect(m_btnBrowse, &QPushButton::clicked, this, &CSaveTempFilePage::OnBrowseTemplateFile);
}

bool CSaveTempFilePage::OnInitDialog()
{
    CTSHarborPage::OnInitDialog();
    m_btnBrowse->setFont(QFontDatabase::systemFont(QFontDatabase::GeneralFont));
    SetPreviewButton(true, true);
    return true;
}

bool CSaveTempFilePage::OnSetActive()
{
    if (const CEngine* engine = Engine())
        m_editFile->setText(QString::fromStdString(LoadTemplateName(*engine, m_editFile->text().toStdString())));
    SetPreviewButton(true, true);
    return CTSHarborPage::OnSetActive();
}

void CSaveTempFilePage::OnBrowseTemplateFile()
{
    std::string path;
    if (ui::Current().ChooseFile(TemplateSaveRequest(), path))
        m_editFile->setText(QString::fromStdString(path));
}

int CSaveTempFilePage::ValidateTemplateName() { return ::ValidateTemplateName(m_editFile->text().toStdString(), Engine()); }

int CSaveTempFilePage::OnWizardNext()
{
    if (!AcceptTemplateName(m_editFile->text().toStdString(), Engine()))
        return -1;
    return LeaveForward();
}

CString CSaveTempFilePage::HelpText() const
{
    return "Name the XML file the template is saved to; the setup reads the input with it, and it can be used "
           "again for other files. Saving over the template you started from, or over an existing file, is "
           "asked first. Preview shows how the file reads with the template.";
}
