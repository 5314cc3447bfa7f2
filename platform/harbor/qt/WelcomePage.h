#pragma once
// The framework's first page: the tool's name and what it does.
#include "platform/harbor/qt/HarborPage.h"

class QLabel;

class CWelcomePage : public CHarborPage {
    Q_OBJECT
public:
    enum : int { IDD = 100 };

    explicit CWelcomePage(QWidget* parent = nullptr);
    void SetToolText(const CString& title, const CString& text);

private:
    QLabel* m_labelTitle = nullptr; // owned by the page
    QLabel* m_labelText = nullptr;
};
