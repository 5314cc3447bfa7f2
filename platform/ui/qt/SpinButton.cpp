#include "platform/ui/qt/SpinButton.h"

#include <QKeyEvent>
#include <QLineEdit>
#include <QMouseEvent>
#include <QPainter>
#include <QRegularExpressionValidator>
#include <QStyle>
#include <QStyleOption>

#include <algorithm>

namespace ui {
namespace {

// Nine digits always fit an int.
constexpr int kMaxDigits = 9;

} // namespace

SpinButton::SpinButton(QLineEdit* buddy, QWidget* parent) : QWidget(parent), m_buddy(buddy)
{
    setFocusPolicy(Qt::NoFocus);
    setSizePolicy(QSizePolicy::Fixed, QSizePolicy::Fixed);
    m_buddy->installEventFilter(this);
}

void SpinButton::SetRange(int lower, int upper)
{
    m_lower = lower;
    m_upper = upper;
}

void SpinButton::Step(int by)
{
    bool ok = false;
    int value = m_buddy->text().toInt(&ok);
    if (!ok)
        value = m_lower;
    value = std::clamp(std::clamp(value, m_lower, m_upper) + by, m_lower, m_upper);
    m_buddy->setText(QString::number(value));
}

QSize SpinButton::sizeHint() const
{
    const int height = m_buddy->sizeHint().height();
    return QSize(std::max(16, height * 2 / 3), height);
}

QRect SpinButton::HalfRect(bool upper) const
{
    const int half = height() / 2;
    return upper ? QRect(0, 0, width(), half) : QRect(0, half, width(), height() - half);
}

void SpinButton::paintEvent(QPaintEvent*)
{
    QPainter painter(this);
    for (bool upper : {true, false}) {
        QStyleOption option;
        option.initFrom(this);
        option.rect = HalfRect(upper);
        option.state |= QStyle::State_Raised;
        style()->drawPrimitive(QStyle::PE_PanelButtonBevel, &option, &painter, this);
        option.rect = option.rect.adjusted(3, 2, -3, -2);
        style()->drawPrimitive(upper ? QStyle::PE_IndicatorArrowUp : QStyle::PE_IndicatorArrowDown, &option, &painter,
                               this);
    }
}

void SpinButton::mousePressEvent(QMouseEvent* event)
{
    if (event->button() != Qt::LeftButton || !isEnabled())
        return;
    Step(HalfRect(true).contains(event->position().toPoint()) ? 1 : -1);
}

bool SpinButton::eventFilter(QObject* watched, QEvent* event)
{
    if (watched == m_buddy && event->type() == QEvent::EnabledChange)
        setEnabled(m_buddy->isEnabled());
    if (watched == m_buddy && event->type() == QEvent::KeyPress && isEnabled()) {
        const int key = static_cast<QKeyEvent*>(event)->key();
        if (key == Qt::Key_Up || key == Qt::Key_Down) {
            Step(key == Qt::Key_Up ? 1 : -1);
            return true;
        }
    }
    return QWidget::eventFilter(watched, event);
}

QLineEdit* NumberEdit(QWidget* parent)
{
    auto* edit = new QLineEdit(parent); // owned by `parent`
    edit->setValidator(new QRegularExpressionValidator(QRegularExpression(QStringLiteral("[0-9]*")), edit));
    edit->setMaxLength(kMaxDigits);
    edit->setAlignment(Qt::AlignRight);
    edit->setMaximumWidth(edit->fontMetrics().horizontalAdvance(QStringLiteral("00000")) + 12);
    return edit;
}

} // namespace ui
