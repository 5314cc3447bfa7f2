#include "platform/ui/qt/Controls.h"

#include <QAbstractButton>
#include <QComboBox>
#include <QFontMetrics>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QPushButton>
#include <QRadioButton>
#include <QWidget>

namespace ui {
namespace {

QString WithoutAmpersands(QString text)
{
    text.remove('&');
    return text;
}

// The letter after a single "&", lower case; a null character when there is none.
QChar MnemonicOf(const QString& text)
{
    for (qsizetype i = 0; i + 1 < text.size(); ++i) {
        if (text[i] != '&')
            continue;
        if (text[i + 1] == '&') {
            ++i;
            continue;
        }
        return text[i + 1].toLower();
    }
    return QChar();
}

QString TextOf(QWidget* widget)
{
    if (auto* button = qobject_cast<QAbstractButton*>(widget))
        return button->text();
    // A group box's letter takes the keyboard to the group's chosen radio button.
    if (auto* group = qobject_cast<QGroupBox*>(widget))
        return group->title();
    if (auto* label = qobject_cast<QLabel*>(widget); label && label->buddy())
        return label->text();
    return QString();
}

void SetTextOf(QWidget* widget, const QString& text)
{
    if (auto* button = qobject_cast<QAbstractButton*>(widget))
        button->setText(text);
    else if (auto* group = qobject_cast<QGroupBox*>(widget))
        group->setTitle(text);
    else if (auto* label = qobject_cast<QLabel*>(widget))
        label->setText(text);
}

// Where to put the "&": the first free letter that starts a word, else the first free letter.
qsizetype MnemonicPosition(const QString& text, const QString& taken)
{
    for (int wordStartsOnly = 1; wordStartsOnly >= 0; --wordStartsOnly) {
        for (qsizetype i = 0; i < text.size(); ++i) {
            const QChar c = text[i];
            if (!c.isLetterOrNumber() || taken.contains(c.toLower()))
                continue;
            if (wordStartsOnly && i > 0 && text[i - 1].isLetterOrNumber())
                continue;
            return i;
        }
    }
    return -1;
}

bool InGroupBox(QWidget* widget)
{
    return qobject_cast<QRadioButton*>(widget) && qobject_cast<QGroupBox*>(widget->parentWidget());
}

QList<QWidget*> MnemonicCandidates(QWidget* root)
{
    QList<QWidget*> candidates;
    for (QWidget* widget : root->findChildren<QWidget*>()) {
        const QString text = TextOf(widget);
        if (!text.isEmpty())
            candidates << widget;
    }
    return candidates;
}

} // namespace

QString ControlName(int id) { return QStringLiteral("id%1").arg(id); }

void IdentifyWidget(QWidget* widget, int id, const QString& accessibleName)
{
    widget->setObjectName(ControlName(id));
    if (!accessibleName.isEmpty())
        widget->setAccessibleName(WithoutAmpersands(accessibleName));
}

QPushButton* BrowseButton(const QString& accessibleName, QWidget* parent)
{
    auto* button = new QPushButton(QStringLiteral("..."), parent); // owned by `parent`
    button->setAccessibleName(accessibleName);
    button->setFixedWidth(button->fontMetrics().horizontalAdvance(QStringLiteral("....")) + 16);
    return button;
}

QHBoxLayout* ButtonRow(std::initializer_list<QAbstractButton*> buttons)
{
    auto* row = new QHBoxLayout(); // owned by the layout it is added to
    for (QAbstractButton* button : buttons)
        row->addWidget(button);
    row->addStretch(1);
    return row;
}

QLabel* LabelFor(const QString& text, QWidget* buddy, QWidget* parent)
{
    auto* label = new QLabel(text, parent); // owned by `parent`
    label->setBuddy(buddy);
    buddy->setAccessibleName(WithoutAmpersands(text));
    return label;
}

void ChainTabs(const std::vector<QWidget*>& widgets)
{
    for (size_t i = 1; i < widgets.size(); ++i)
        QWidget::setTabOrder(widgets[i - 1], widgets[i]);
}

QComboBox* DropDownList(QWidget* parent)
{
    auto* list = new QComboBox(parent); // owned by `parent`
    list->setSizeAdjustPolicy(QComboBox::AdjustToContents);
    return list;
}

void ShowEntries(QComboBox* list, const std::vector<std::string>& entries, int selected)
{
    if (EntriesOf(list) != entries) {
        list->clear();
        for (const std::string& entry : entries)
            list->addItem(QString::fromStdString(entry));
    }
    list->setCurrentIndex(selected);
}

std::vector<std::string> EntriesOf(const QComboBox* list)
{
    std::vector<std::string> entries;
    for (int i = 0; i < list->count(); ++i)
        entries.push_back(list->itemText(i).toStdString());
    return entries;
}

void AssignMnemonics(QWidget* root, const QString& reserved)
{
    QString taken = reserved.toLower();
    const QList<QWidget*> candidates = MnemonicCandidates(root);
    for (QWidget* widget : candidates) {
        const QChar letter = MnemonicOf(TextOf(widget));
        if (!letter.isNull())
            taken += letter;
    }
    // Radio buttons in a group box come last: their group's letter already reaches them.
    QList<QWidget*> ordered;
    for (QWidget* widget : candidates)
        if (!InGroupBox(widget))
            ordered << widget;
    for (QWidget* widget : candidates)
        if (InGroupBox(widget))
            ordered << widget;
    for (QWidget* widget : ordered) {
        const QString text = TextOf(widget);
        if (!MnemonicOf(text).isNull() || text.contains("&&"))
            continue;
        const qsizetype at = MnemonicPosition(text, taken);
        if (at < 0)
            continue;
        taken += text[at].toLower();
        SetTextOf(widget, text.left(at) + '&' + text.mid(at));
    }
}

QString MnemonicsUnder(QWidget* root)
{
    QString letters;
    for (QWidget* widget : MnemonicCandidates(root)) {
        if (!widget->isVisibleTo(root))
            continue;
        const QChar letter = MnemonicOf(TextOf(widget));
        if (!letter.isNull())
            letters += letter;
    }
    return letters;
}

QSize DialogUnitsToPixels(const QFont& font, int width, int height)
{
    const QFontMetrics metrics(font);
    static const QString alphabet = QStringLiteral("ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz");
    const int averageWidth = (metrics.horizontalAdvance(alphabet) / 26 + 1) / 2;
    return QSize(width * averageWidth / 4, height * metrics.height() / 8);
}

} // namespace ui
