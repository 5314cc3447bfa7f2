#pragma once
// An up-down control bound to the edit box before it, as the toolbox's dialogs pair a number box
// with its spin: the arrows, and the Up and Down keys in the edit, step the number within a range
// and write it into the edit; a number typed outside the range stays as it was typed.
#include <QWidget>

class QLineEdit;

namespace ui {

class SpinButton : public QWidget {
    Q_OBJECT
public:
    // `buddy` is the edit the spin writes to; the spin follows its enabled state.
    SpinButton(QLineEdit* buddy, QWidget* parent);

    void SetRange(int lower, int upper);
    int Lower() const { return m_lower; }
    int Upper() const { return m_upper; }
    // Steps the edit's number by `by`, from the edit's number held within the range.
    void Step(int by);

    QSize sizeHint() const override;

protected:
    void paintEvent(QPaintEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    QRect HalfRect(bool upper) const;

    QLineEdit* m_buddy; // not owned: a sibling on the same dialog
    int m_lower = 0;
    int m_upper = 100;
};

// An edit box for a row or column number: digits only.
QLineEdit* NumberEdit(QWidget* parent);

} // namespace ui
