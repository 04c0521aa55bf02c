#pragma once
// The cells of the channel list's "Key" and "Menu" columns, on the inspector's animation
// status cell: they bind it to the editor's selected channels and to the commands of its
// controller.
//
//   TQCurveEditorAnimStatusCell  "Key": the keyframe mark at the current time with previous,
//                                next, add or delete; its menu on a right press
//   TQCurveEditorAnimMenuCell    "Menu": an icon on the row under the pointer that opens the
//                                animation menu
//
// The menu (newMenuUseImages) holds the animation commands with this cell as their target;
// each action goes to the controller's animMenu... action of the same meaning, which works on
// the selected channels (a press in the list selects its row first). validateMenuItem enables
// and marks the items from the selected channels as they are when the menu opens.
//
// The controller is not owned and must outlive the cell, or be cleared from it first.

#include <cstdint>

#include "platform/inspector/TQAnimStatusCell.h"
#include "src/channellist/TQChannelListStatusCell.h"

class TQCurveEditorCtrl;

class TQCurveEditorAnimStatusCell : public TQAnimStatusCell, public TQChannelListStatusCell {
public:
    // initWithController:
    explicit TQCurveEditorAnimStatusCell(TQCurveEditorCtrl* controller = nullptr);

    TQCurveEditorCtrl* controller() const { return _mainCurveEditorController; }
    void setController(TQCurveEditorCtrl* controller) { _mainCurveEditorController = controller; }

    // ---- TQChannelListStatusCell ----
    void updateChannel(TQChannelBase* channel, CMTime time) override {
        TQAnimStatusCell::updateChannel(channel, time);
    }
    const TQChannelBase* associatedChannel() const override { return _pChan; }
    void setIsMouseOverRow(bool over) override { setMouseOverRow(over); }
    void setMouseOver(bool over) override { _mouseOver = over; }
    void setMouseOverLocation(int64_t part) override;
    void setMouseDownLocation(int64_t part) override;
    void rightMouseDown(const RWEvent& event, RWOutlineView& view) override {
        TQAnimStatusCell::rightMouseDown(event, view);
    }
    bool mouseOver() const { return _mouseOver; }
    bool mouseDown() const { return _mouseDown; }
    int64_t mouseInPartIndex() const { return _mouseInPartIndex; }

    // ---- The cell ----
    // Whether the channel is a folder, then the base's state.
    void updateState() override;
    bool isFolder() const { return _isFolder; }
    // Nothing for a folder.
    void drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const override;
    // The pressed row's channel again (the one cell served other rows meanwhile), the base's
    // tracking, and the list's press ends.
    void stopTracking(const CGPoint& point, RWOutlineView& view, bool mouseIsUp) override;
    // Stops the host, moves its current time, posts kTQNotifyTimeChanged; the channel is not
    // read.
    void setCurrentTimeAndNotify(CMTime time, TQChannelBase* channel) override;

    // ---- The animation menu ----
    // Null without a selected channel, or when the first has no channel.
    RWMenuPtr newMenuUseImages(bool useImages) override;
    bool validateMenuItem(RWMenuItem& item) override;
    // The menu's actions, each forwarded to the controller with the sender.
    bool performAction(const std::string& action, RWActionSender& sender) override;

private:
    TQCurveEditorCtrl* _mainCurveEditorController = nullptr;  // not owned
    bool _mouseOver = false;
    bool _mouseDown = false;
    bool _isFolder = false;
    int64_t _mouseInPartIndex = 0;
};

class TQCurveEditorAnimMenuCell : public TQCurveEditorAnimStatusCell {
public:
    static constexpr const char* kMenuImage = "S_Inspector_ParameterMenu_Normal";

    explicit TQCurveEditorAnimMenuCell(TQCurveEditorCtrl* controller = nullptr);
    // The menu icon on the row under the pointer, unless the row is a folder's.
    void drawWithFrame(const CGRect& frame, RWCellDrawing& drawing) const override;
    // The list opens the menu on any press of the column; the cell tracks none.
    bool trackMouse(const RWEvent&, const CGPoint&, const CGRect&, RWOutlineView&, bool) override {
        return false;
    }
};
