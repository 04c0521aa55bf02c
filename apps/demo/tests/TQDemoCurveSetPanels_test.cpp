// The demo's curve set panels as a user meets them: a new set made from the pop-up's entry,
// undone and redone, then renamed and joined by another in the manager's dialog. The document
// test saves and opens sets.
#include <gtest/gtest.h>

#include <QPushButton>
#include <QTimer>
#include <QToolButton>

#include <functional>
#include <utility>

#include "apps/demo/tests/DemoWindowFixture.h"
#include "qt/TQQtModal.h"
#include "qt/TQQtTableView.h"
#include "qt/TQQtTextField.h"

namespace demo_test {
namespace {

class DemoCurveSetPanelsTest : public DemoWindowTest {
protected:
    void SetUp() override {
        DemoWindowTest::SetUp();
        modal.install();
    }
    // Chooses the entry and works its dialog once it is up; a dialog left open is aborted.
    void inDialogOf(const QString& entry, std::function<void(QDialog&)> user) {
        bool shown = false;
        QTimer::singleShot(0, [&] {
            if (QDialog* dialog = modal.activeDialog()) {
                shown = true;
                user(*dialog);
            }
            if (modal.activeDialog()) modal.abortModal();
        });
        choose(entry);
        EXPECT_TRUE(shown) << entry.toStdString() << " showed no dialog";
    }
    static void click(QDialog& dialog, const char* title) {
        for (QPushButton* button : dialog.findChildren<QPushButton*>())
            if (button->text() == QLatin1String(title)) return button->click();
        ADD_FAILURE() << "no button " << title;
    }
    TQQtModalService modal;
};

TEST_F(DemoCurveSetPanelsTest, new_and_managed_sets__are_saved_and_opened_with_the_project) {
    choose("Position");
    const std::vector<TQChannel*> position = shownChannels();
    ASSERT_FALSE(position.empty());
    inDialogOf("New Curve Set…", [](QDialog& dialog) {
        TQQtTextField* name = nullptr;
        for (TQQtTextField* field : dialog.findChildren<TQQtTextField*>())
            if (!field->isReadOnly()) name = field;
        ASSERT_NE(name, nullptr);
        EXPECT_EQ(name->text(), "Untitled Set");
        QTest::keyClicks(name, "Slides");
        click(dialog, "OK");
    });
    EXPECT_EQ(shownChannels(), position) << "the new set holds what showed";
    window.host().setSelectedObjects({window.host().scene().objects().back()});
    EXPECT_EQ(shownChannels(), position) << "and does not follow the selection";
    EXPECT_EQ(window.curveSetPopUp()->text(), "Slides");
    emit window.editMenu()->menu()->aboutToShow();
    EXPECT_EQ(window.editMenu()->undoAction()->text(), "Undo New Curve Set");
    window.editMenu()->undoAction()->trigger();
    EXPECT_TRUE(window.controller().curveSets().empty());
    EXPECT_EQ(window.curveSetPopUp()->text(), "Position");
    emit window.editMenu()->menu()->aboutToShow();
    window.editMenu()->redoAction()->trigger();
    EXPECT_EQ(window.curveSetPopUp()->text(), "Slides");
    EXPECT_EQ(shownChannels(), position);

    inDialogOf("Manage Curve Sets…", [](QDialog& dialog) {
        auto* table = dialog.findChild<TQQtTableView*>();
        ASSERT_NE(table, nullptr);
        ASSERT_EQ(table->tableModel()->rowCount(), 1);
        table->edit(table->tableModel()->index(0, 0));
        auto* editor = qobject_cast<QLineEdit*>(table->editor());
        ASSERT_NE(editor, nullptr);
        editor->setText("Glides");
        // The add and remove pair's buttons are the panel's only tool buttons.
        const QList<QToolButton*> pair = dialog.findChildren<QToolButton*>();
        ASSERT_EQ(pair.size(), 2);
        pair[0]->click();
        click(dialog, "Done");
    });
    const std::vector<std::string> sets = customSets();
    ASSERT_EQ(sets.size(), 2u);
    EXPECT_EQ(sets[0].rfind("Glides ./", 0), 0u) << sets[0];
    EXPECT_EQ(sets[1], "Untitled Set");
    EXPECT_TRUE(window.isWindowModified()) << "the sets are the document's";
}

}  // namespace
}  // namespace demo_test
