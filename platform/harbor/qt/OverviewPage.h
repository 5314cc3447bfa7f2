#pragma once
// The framework's last page: the engine's summary of the setup, read-only, before Finish.
#include "platform/harbor/qt/HarborPage.h"

class QPlainTextEdit;

class COverviewPage : public CHarborPage {
    Q_OBJECT
public:
    enum : int { IDD = 101 };

    explicit COverviewPage(QWidget* parent = nullptr);
    // Shows the summary anew from the engine.
    bool OnSetActive() override;

    QString SummaryText() const;

private:
    QPlainTextEdit* m_editSummary = nullptr; // owned by the page
};
