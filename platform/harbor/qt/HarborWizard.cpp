#include "platform/harbor/qt/HarborWizard.h"

#include "platform/harbor/qt/HarborPage.h"

#include <QPushButton>

#include <algorithm>

CHarborWizard::CHarborWizard(const CString& caption, QWidget* parentWnd, int selectPage) : QWizard(parentWnd)
{
    setWindowTitle(QString::fromStdString(caption));
    setWizardStyle(QWizard::ClassicStyle);
    setOptions(QWizard::IndependentPages | QWizard::HaveCustomButton1 | QWizard::HelpButtonOnRight);
    // Qt's Back button walks Qt's history; this one asks the page.
    m_btnBack = new QPushButton(tr("< &Back"), this);
    setButton(QWizard::CustomButton1, m_btnBack);
    ShowHelpButton(false);
    connect(m_btnBack, &QPushButton::clicked, this, &CHarborWizard::GoBack);
    connect(this, &QWizard::currentIdChanged, this, &CHarborWizard::OnCurrentIdChanged);
    connect(this, &QWizard::helpRequested, this, [this] {
        if (CHarborPage* page = GetActivePage())
            page->OnHelp();
    });
    if (selectPage > 0)
        setStartId(selectPage);
}

void CHarborWizard::AddPage(CHarborPage* page)
{
    setPage(page->DialogId(), page);
    m_vecSheet.push_back(page->DialogId());
    if (m_vecSheet.size() == 1 && startId() != page->DialogId())
        setStartId(page->DialogId());
}

void CHarborWizard::AddPagePlace(int dialogId) { m_vecSheet.push_back(dialogId); }

int CHarborWizard::DoModal() { return exec() == QDialog::Accepted ? ID_WIZFINISH : IDCANCEL; }

CHarborPage* CHarborWizard::GetActivePage() const { return GetPage(currentId()); }

CHarborPage* CHarborWizard::GetPage(int dialogId) const { return qobject_cast<CHarborPage*>(page(dialogId)); }

bool CHarborWizard::OnInitDialog() { return true; }

void CHarborWizard::setVisible(bool visible)
{
    if (visible && !m_bInitialized) {
        m_bInitialized = true;
        SizePagesAlike();
        OnInitDialog();
    }
    QWizard::setVisible(visible);
}

void CHarborWizard::SizePagesAlike()
{
    QSize largest;
    for (int id : pageIds())
        largest = largest.expandedTo(page(id)->minimumSize());
    for (int id : pageIds())
        page(id)->setMinimumSize(largest);
}

int CHarborWizard::SheetIndex(int id) const
{
    const auto it = std::find(m_vecSheet.begin(), m_vecSheet.end(), id);
    return it == m_vecSheet.end() ? -1 : static_cast<int>(it - m_vecSheet.begin());
}

int CHarborWizard::Resolve(int result, int from, int step) const
{
    int index = result == 0 ? SheetIndex(from) : SheetIndex(result);
    if (index < 0)
        return -1;
    if (result == 0 || !GetPage(result))
        index += step;
    for (; index >= 0 && index < static_cast<int>(m_vecSheet.size()); index += step)
        if (GetPage(m_vecSheet[static_cast<size_t>(index)]))
            return m_vecSheet[static_cast<size_t>(index)];
    return -1;
}

int CHarborWizard::nextId() const
{
    if (m_nPendingNext != -1 && m_nPendingNext != currentId())
        return m_nPendingNext;
    return Resolve(0, currentId(), +1);
}

bool CHarborWizard::validateCurrentPage()
{
    if (m_bMoving)
        return true;
    CHarborPage* page = GetActivePage();
    if (!page)
        return true;
    if (Resolve(0, currentId(), +1) == -1)
        return page->OnWizardFinish();
    const int target = Resolve(page->OnWizardNext(), currentId(), +1);
    if (target == -1)
        return false;
    if (visitedIds().contains(target)) {
        // Qt only moves forward to pages not passed yet.
        ReturnTo(target);
        return false;
    }
    m_nPendingNext = target;
    return true;
}

void CHarborWizard::GoBack()
{
    CHarborPage* page = GetActivePage();
    if (!page)
        return;
    const int result = page->OnWizardBack();
    if (result == -1)
        return;
    const int target = Resolve(result, currentId(), -1);
    if (target != -1)
        ReturnTo(target);
}

void CHarborWizard::ReturnTo(int id)
{
    m_bMoving = true;
    if (visitedIds().contains(id)) {
        while (currentId() != id && visitedIds().size() > 1)
            back();
    } else {
        while (visitedIds().size() > 1 && SheetIndex(currentId()) > SheetIndex(id))
            back();
        if (currentId() != id) {
            m_nPendingNext = id;
            next();
        }
    }
    m_bMoving = false;
    Activate(currentId());
}

void CHarborWizard::ShowHelpButton(bool show)
{
    // Buttons left out of the layout are hidden.
    QList<QWizard::WizardButton> layout = {QWizard::Stretch, QWizard::CustomButton1, QWizard::NextButton,
                                           QWizard::FinishButton, QWizard::CancelButton};
    if (show)
        layout << QWizard::HelpButton;
    setOption(QWizard::HaveHelpButton, show);
    setButtonLayout(layout);
}

void CHarborWizard::OnCurrentIdChanged(int id)
{
    m_nPendingNext = -1;
    if (!m_bMoving)
        Activate(id);
}

void CHarborWizard::Activate(int id)
{
    CHarborPage* page = GetPage(id);
    if (!page)
        return;
    page->InitializeOnce();
    page->OnSetActive();
    ShowHelpButton(page->HasHelp());
    m_btnBack->setEnabled(Resolve(0, id, -1) != -1);
}
