#pragma once
// The framework's first page: the tool's name and what it does.
#include "platform/harbor/qt/HarborPage.h"

class CWelcomePage : public CHarborPage {
    Q_OBJECT
public:
    enum : int { IDD = 100 };

    explicit CWelcomePage(QWidget* parent = nullptr);
    // The tool's name becomes the page's heading, the text its explanation.
    void SetToolText(const CString& title, const CString& text);
};
