#pragma once
// Small helpers every dialog and page of the Qt layer builds its controls with, so that each
// control carries its control id as object name ("id201") and a name for screen readers, and
// buttons and labels get keyboard mnemonics that do not clash.
#include <QFont>
#include <QSize>
#include <QString>

#include <initializer_list>
#include <string>
#include <vector>

class QAbstractButton;
class QComboBox;
class QHBoxLayout;
class QLabel;
class QPushButton;
class QWidget;

namespace ui {

// The object name of control `id`: "id201".
QString ControlName(int id);
// Gives `widget` the object name of control `id` and, when not empty, the accessible name.
// Returns the widget for chaining.
template <typename Widget>
Widget* Identify(Widget* widget, int id, const QString& accessibleName = QString());
void IdentifyWidget(QWidget* widget, int id, const QString& accessibleName);

// A "..." button that opens a chooser, as narrow as its text; `accessibleName` says what it opens.
QPushButton* BrowseButton(const QString& accessibleName, QWidget* parent);

// Buttons side by side, each as wide as its text, the rest of the line left empty.
QHBoxLayout* ButtonRow(std::initializer_list<QAbstractButton*> buttons);

// A label for `buddy`: the buddy takes the label's text (without "&") as its accessible name.
QLabel* LabelFor(const QString& text, QWidget* buddy, QWidget* parent);

// Puts `widgets` one after the other in the tab order, for pages whose controls are not made in
// the order they are laid out.
void ChainTabs(const std::vector<QWidget*>& widgets);

// A drop-down list as wide as its longest entry, whenever its entries change.
QComboBox* DropDownList(QWidget* parent);
// Makes `list` hold `entries` (refilled only when they differ) with entry `selected` current, -1
// for none.
void ShowEntries(QComboBox* list, const std::vector<std::string>& entries, int selected);
// The entries of `list`, in order.
std::vector<std::string> EntriesOf(const QComboBox* list);

// Puts a "&" before one letter of every button, buddy label and group box under `root` that has
// none, taking the first letter of a word (else any letter) not yet taken by another control or by
// `reserved`. A radio button may be left without one when its group box has one: the box's letter
// leads to the group's chosen radio button, and the arrow keys to the others.
void AssignMnemonics(QWidget* root, const QString& reserved);
// The mnemonic letters of the visible buttons, buddy labels and group boxes under `root`, lower case, in
// widget order (a letter twice means a clash).
QString MnemonicsUnder(QWidget* root);

// Dialog units of the toolbox's dialog templates in pixels of `font`: a horizontal unit is a
// quarter of the average character width, a vertical one an eighth of the character height.
QSize DialogUnitsToPixels(const QFont& font, int width, int height);

template <typename Widget>
Widget* Identify(Widget* widget, int id, const QString& accessibleName)
{
    IdentifyWidget(widget, id, accessibleName);
    return widget;
}

} // namespace ui
