#pragma once
// The toolkit's browse edit: an edit box with a "..." button beside it; what the button opens is
// the derived class's business.
#include "platform/system/Types.h"

#include <QWidget>

class QLineEdit;
class QPushButton;

class CBrowseEdit : public QWidget {
    Q_OBJECT
public:
    // The edit becomes control `id`, named `label` for screen readers; the button is "id<id>Browse".
    CBrowseEdit(int id, const QString& label, const QString& buttonName, QWidget* parent = nullptr);

    CString GetText() const;
    void SetText(const CString& text);
    QLineEdit* Edit() const { return m_edit; }
    QPushButton* BrowseButton() const { return m_button; }

    virtual void OnBrowse() = 0;

private:
    QLineEdit* m_edit = nullptr;     // owned by this widget
    QPushButton* m_button = nullptr; // owned by this widget
};
