// The Qt user interface answered by a user: message boxes from their style, file dialogs with the
// request's filters, extension and name, the folder browser, and the rbx0 file-and-item selector.
#include "tests/wizard_gui/GuiTestSupport.h"

#include "platform/ui/qt/OkaFileSelectorDlg.h"
#include "platform/ui/qt/QtUserInterface.h"

#include <QFileDialog>
#include <QLabel>
#include <QMessageBox>
#include <QPushButton>
#include <QTreeWidget>

namespace {

using namespace wizardtest;

// Runs `answer` on the modal dialog of type T that `show` opens.
template <typename T>
void Answer(const std::function<void(T&)>& answer)
{
    QTimer::singleShot(0, [answer] {
        auto* dialog = qobject_cast<T*>(QApplication::activeModalWidget());
        ASSERT_NE(dialog, nullptr) << "no " << T::staticMetaObject.className() << " in front";
        answer(*dialog);
        if (dialog->isVisible())
            dialog->reject();
    });
}

TEST(QtInterface, AMessageBoxShowsTheStylesButtonsAndIconAndAnswersWithTheButtonPressed)
{
    Answer<QMessageBox>([](QMessageBox& box) {
        EXPECT_EQ(box.icon(), QMessageBox::Question);
        EXPECT_EQ(box.text(), "Replace it?");
        EXPECT_EQ(box.windowTitle(), "Velmora") << "no caption of its own";
        EXPECT_EQ(box.standardButtons(), QMessageBox::Yes | QMessageBox::No);
        guitest::Press(box.button(QMessageBox::No));
    });
    EXPECT_EQ(ui::QtUserInterface().MessageBox("Replace it?", "", ui::MB_YESNO | ui::MB_ICONQUESTION), ui::IDNO);
    Answer<QMessageBox>([](QMessageBox& box) {
        EXPECT_EQ(box.icon(), QMessageBox::Warning);
        EXPECT_EQ(box.windowTitle(), "Run Engine");
        guitest::Press(box.button(QMessageBox::Ok));
    });
    EXPECT_EQ(ui::QtUserInterface().MessageBox("Status: OK", "Run Engine", ui::MB_OK | ui::MB_ICONEXCLAMATION), ui::IDOK);
    Answer<QMessageBox>([](QMessageBox& box) { box.reject(); });
    EXPECT_EQ(ui::QtUserInterface().MessageBox("Closed", "", ui::MB_OKCANCEL), ui::IDCANCEL);
}

TEST(QtInterface, AnOpenDialogFiltersByTheRequestAndReturnsTheChosenFile)
{
    ScratchFolder scratch;
    const std::string chosen = scratch.Write("gauge.txt", "x\n");
    Answer<QFileDialog>([&](QFileDialog& dialog) {
        EXPECT_EQ(dialog.acceptMode(), QFileDialog::AcceptOpen);
        EXPECT_EQ(dialog.fileMode(), QFileDialog::ExistingFiles);
        EXPECT_EQ(dialog.nameFilters(), (QStringList{"Text Files (*.txt)", "All Files (*)"}));
        EXPECT_EQ(dialog.defaultSuffix(), "txt");
        dialog.setDirectory(QString::fromStdString(scratch.Path()));
        dialog.selectFile(QString::fromStdString(chosen));
        static_cast<QDialog&>(dialog).accept(); // what the Open/Save button does
    });
    std::string path;
    ui::FileDialogRequest request{true, "*.txt", "*.txt", "Text Files (*.txt)|*.txt|All Files (*.*)|*.*||", 0x206};
    EXPECT_TRUE(ui::QtUserInterface().ChooseFile(request, path));
    EXPECT_EQ(path, chosen);

    Answer<QFileDialog>([](QFileDialog& dialog) { dialog.reject(); });
    EXPECT_FALSE(ui::QtUserInterface().ChooseFile(request, path));
}

TEST(QtInterface, ASaveDialogStartsAtTheGivenNameAndAddsTheDefaultExtension)
{
    ScratchFolder scratch;
    Answer<QFileDialog>([&](QFileDialog& dialog) {
        EXPECT_EQ(dialog.acceptMode(), QFileDialog::AcceptSave);
        EXPECT_EQ(dialog.directory().absolutePath().toStdString(), scratch.Path());
        ASSERT_FALSE(dialog.selectedFiles().isEmpty());
        EXPECT_TRUE(dialog.selectedFiles().constFirst().endsWith("old.xlsx"));
        EXPECT_FALSE(dialog.testOption(QFileDialog::DontConfirmOverwrite));
        dialog.selectFile(QString::fromStdString(scratch.File("result")));
        static_cast<QDialog&>(dialog).accept(); // what the Open/Save button does
    });
    std::string path;
    ui::FileDialogRequest request{false, ".xlsx", scratch.File("old.xlsx"), "Excel Files (*.xlsx) | *.xlsx||", 0x1006};
    EXPECT_TRUE(ui::QtUserInterface().ChooseFile(request, path));
    EXPECT_EQ(path, scratch.File("result.xlsx"));
}

TEST(QtInterface, TheFolderBrowserOpensAtTheStartFolderAndReturnsTheChosenOne)
{
    ScratchFolder scratch;
    const std::string inner = scratch.MakeFolder("inner");
    Answer<QFileDialog>([&](QFileDialog& dialog) {
        EXPECT_EQ(dialog.windowTitle(), "Please select the folder to convert");
        EXPECT_EQ(dialog.fileMode(), QFileDialog::Directory);
        EXPECT_EQ(dialog.directory().absolutePath().toStdString(), scratch.Path());
        dialog.setDirectory(QString::fromStdString(inner));
        static_cast<QDialog&>(dialog).accept(); // what the Open/Save button does
    });
    std::string path;
    EXPECT_TRUE(ui::QtUserInterface().BrowseForFolder({"Please select the folder to convert", scratch.Path(), 0}, path));
    EXPECT_EQ(path, inner);
}

TEST(QtInterface, TheRbx0SelectorListsTheFilesItemsAndReturnsTheTickedOnes)
{
    ScratchFolder scratch;
    const Inputs inputs(scratch);
    COkaFileSelectorDlg* opened = nullptr;
    ui::RbxSelectionRequest request;
    request.initialFile = inputs.rbxFile;
    request.initialItems = {1};
    request.opening = [&opened](COkaFileSelectorDlg* dialog) { opened = dialog; };
    Answer<COkaFileSelectorDlg>([&](COkaFileSelectorDlg& dialog) {
        EXPECT_EQ(&dialog, opened) << "the page may narrow the selector before it shows";
        auto* list = dialog.findChild<QTreeWidget*>("id1103");
        ASSERT_NE(list, nullptr);
        ASSERT_EQ(list->topLevelItemCount(), 3);
        EXPECT_EQ(list->topLevelItem(0)->text(0), "Level");
        EXPECT_EQ(list->topLevelItem(1)->checkState(0), Qt::Checked);
        EXPECT_EQ(list->topLevelItem(0)->checkState(0), Qt::Unchecked);
        list->topLevelItem(2)->setCheckState(0, Qt::Checked);
        guitest::SavePicture(dialog, "rbx0-selector");
        dialog.accept();
    });
    std::string file;
    CUIntArray items;
    EXPECT_TRUE(ui::QtUserInterface().ChooseRbxItems(request, file, items));
    EXPECT_EQ(file, inputs.rbxFile);
    EXPECT_EQ(items, (CUIntArray{1, 2}));
}

TEST(QtInterface, TheRbx0SelectorSaysWhyAFileCannotBeListed)
{
    ScratchFolder scratch;
    const std::string broken = scratch.Write("broken.rbx0", "not rbx0");
    ui::RbxSelectionRequest request;
    request.initialFile = broken;
    COkaFileSelectorDlg dialog(request);
    EXPECT_EQ(dialog.findChild<QTreeWidget*>("id1103")->topLevelItemCount(), 0);
    EXPECT_TRUE(dialog.findChild<QLabel*>("id1104")->text().contains("broken.rbx0"));
}

} // namespace
