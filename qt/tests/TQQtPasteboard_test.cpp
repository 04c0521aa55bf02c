// Keypoints through the system clipboard: both forms go out together and the private one
// reads back exactly; other programs see the readable one as text, and their text is not
// taken for keypoints.

#include <gtest/gtest.h>

#include <QClipboard>
#include <QGuiApplication>

#include "qt/TQQtServices.h"
#include "src/editor/TQKeypointClipboard.h"

namespace {

TEST(QtPasteboardTest, keypoints__both_forms_on_the_clipboard_and_read_back) {
    const TQQtServiceInstaller services;
    RWPasteboard& board = *RWApplicationServices().pasteboard;
    // Doubles at the edges of what a double holds, and every state off its default.
    TQKeyframeState key{.time = CMTimeMake(7, 30),
                        .value = -0.0,
                        .inU = 5e-324,
                        .inV = 1.7976931348623157e308,
                        .outU = 0.1,
                        .outV = -1.0 / 3.0,
                        .interpolation = kTQInterpolationEaseIn,
                        .locked = true,
                        .enabled = false,
                        .broken = true,
                        .scaled = true};
    TQKeypointClip clip;
    clip.channels.push_back({"./1/100", "TQChannelAngle", {TQKeyframeState{}, key}});

    TQPutKeypointClip(board, clip);
    EXPECT_EQ(QGuiApplication::clipboard()->text().toStdString(), TQDescribeKeypointClip(clip));
    const TQKeypointClipReading read = TQTakeKeypointClip(board);
    ASSERT_EQ(read.status, TQKeypointClipRead::kOk) << "the first form kept beside the second";
    // The form is exact, so a clip read back writes the same text.
    EXPECT_EQ(TQWriteKeypointClip(read.clip), TQWriteKeypointClip(clip));

    QGuiApplication::clipboard()->setText("another program's text");
    EXPECT_EQ(TQTakeKeypointClip(board).status, TQKeypointClipRead::kNone);
}

}  // namespace
