// The inspector's rows as widgets on the reference host: a number typed in a row's field sets
// the channel as one undo step; an over-range parameter opens from its disclosure onto the
// mini editor, and its strip's reset button resets the channel; the button binding.
#include <gtest/gtest.h>

#include <QApplication>
#include <QLineEdit>
#include <QTest>
#include <QToolButton>

#include "host/TQHostAppDelegate.h"
#include "platform/channels/TQChannelObjectRootBase.h"
#include "platform/channels/TQChannelTypes.h"
#include "platform/inspector/TQChanNumberControllers.h"
#include "qt/TQQtButton.h"
#include "qt/TQQtInspectorPanel.h"
#include "qt/TQQtMiniCurveEditor.h"
#include "src/parameters/TQMiniCurveEditorGroupController.h"
#include "src/parameters/TQParameterInspectorDelegate.h"

namespace {

CMTime position(double p) { return TQTarnTimeForChannelSeconds(p, 0x40000); }

class QtInspectorPanel : public ::testing::Test {
protected:
    void SetUp() override {
        object = host.scene().adoptObject(std::make_unique<TQChannelObjectRootBase>("Object", 1));
        opacity = static_cast<TQChannel*>(
            object->addChild(std::make_unique<TQChannel>("Opacity", 10, 0.25)));
        opacity->getImpl()->range().setRange(0.0, 1.0);
        opacity->getInfo()->displayScale = 100.0;
        opacity->setSliderMaximum(1.0);
        gradient = static_cast<TQChannel2DOverRange*>(
            object->addChild(std::make_unique<TQChannel2DOverRange>("Gradient", 11)));
        gradient->getXChannel()->setKeyframe(position(0.5), 2.0);
        rows.push_back(std::make_unique<TQChanDoubleController>(opacity, context));
        rows.push_back(
            TQMakeOverRangeGroup<TQChannel2DOverRangeController>(gradient, &host, context));
        for (auto& row : rows) row->update();
        panel.setRows({rows[0].get(), rows[1].get()});
        panel.resize(320, 600);
        panel.show();
    }
    void TearDown() override { panel.setRows({}); }
    // The widgets here carry no meta-object of their own: found by their C++ class.
    template <class Widget>
    Widget* find(bool (*accept)(Widget&) = nullptr) {
        for (QWidget* w : panel.findChildren<QWidget*>())
            if (auto* found = dynamic_cast<Widget*>(w); found && (!accept || accept(*found)))
                return found;
        return nullptr;
    }

    TQHostAppDelegate host;
    TQParameterInspectorDelegate bridge{&host};
    JNBuildContext context{&bridge};
    TQChannelObjectRootBase* object = nullptr;
    TQChannel* opacity = nullptr;
    TQChannel2DOverRange* gradient = nullptr;
    std::vector<std::unique_ptr<TQViewController>> rows;
    TQQtInspectorPanel panel;
};

TEST_F(QtInspectorPanel, typed_number_sets_the_channel_in_one_undo_step) {
    QList<QLineEdit*> fields = panel.findChildren<QLineEdit*>();
    ASSERT_FALSE(fields.isEmpty());
    QLineEdit* field = fields.front();
    EXPECT_EQ(field->text(), QStringLiteral("25.00"));
    field->selectAll();
    QTest::keyClicks(field, "60");
    QTest::keyClick(field, Qt::Key_Return);
    EXPECT_DOUBLE_EQ(opacity->getValueAsDouble(kCMTimeZero), 0.6);
    ASSERT_TRUE(host.undo());
    EXPECT_DOUBLE_EQ(opacity->getValueAsDouble(kCMTimeZero), 0.25);
    EXPECT_FALSE(host.canUndo());
}

TEST_F(QtInspectorPanel, over_range_parameter_opens_onto_its_mini_editor_and_resets) {
    TQQtMiniCurveEditor* editor = find<TQQtMiniCurveEditor>();
    ASSERT_NE(editor, nullptr);
    auto& group = static_cast<TQMiniCurveEditorGroupController&>(*rows[1]);
    ASSERT_TRUE(group.editorController()->isHidden());
    EXPECT_FALSE(editor->isVisible()) << "the parameter starts closed";
    auto* disclosure =  // the heading
        find<QToolButton>([](QToolButton& b) { return b.text() == QStringLiteral("Gradient"); });
    ASSERT_NE(disclosure, nullptr);
    disclosure->click();
    EXPECT_TRUE(editor->isVisible());

    auto* reset = find<TQQtButton>(
        [](TQQtButton& b) { return b.model() && b.model()->action() == "resetChannel:"; });
    ASSERT_NE(reset, nullptr);
    reset->click();
    EXPECT_TRUE(gradient->getXChannel()->getKeyframes(false).empty());
    ASSERT_TRUE(host.undo());
    EXPECT_EQ(gradient->getXChannel()->getKeyframes(false).size(), 1u);
}

TEST(QtButton, a_switch_steps_its_model_and_shows_it) {
    auto model = std::make_shared<RWButton>();
    TQQtButton button;
    button.setModel(model);
    EXPECT_TRUE(button.isCheckable());
    button.click();
    EXPECT_EQ(model->state(), 1);
    model->setState(0);
    EXPECT_FALSE(button.isChecked());
    model->setEnabled(false);
    EXPECT_FALSE(button.isEnabled());
}

}  // namespace
