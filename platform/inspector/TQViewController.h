#pragma once
// A row of a parameter inspector, and a group of rows.
//
// A row (TQViewController) has a view of its own, placed by the toolkit adapter from the
// row's frame, and the controls the subclass puts in it. It is tied to a channel (not owned:
// the host's), and optionally to a list of further channels that it edits together with the
// first (several selected objects). It reads and writes them at the time its delegate gives.
//
// A group (TQViewControllerGroup) owns its rows, in order, and can be collapsed (its rows
// hidden), indented, and enabled or disabled as a whole. Updates and notification words go to
// every row of a group, in order.
//
// Lifetime: the channels and the context's delegate must outlive the rows, or the host clears
// the association (addOrResetAssociatedChannel with null) first.

#include <cstdint>
#include <memory>
#include <vector>

#include "platform/geometry/CGGeometry.h"
#include "platform/inspector/JNBuildContext.h"

class TQChannelBase;

class TQViewController {
public:
    TQViewController(TQChannelBase* channel, const JNBuildContext& context);
    virtual ~TQViewController();
    TQViewController(const TQViewController&) = delete;
    TQViewController& operator=(const TQViewController&) = delete;

    // ---- Channels ----
    TQChannelBase* associatedChannel() const { return _channel; }
    const std::vector<TQChannelBase*>& associatedChannelList() const { return _channelList; }
    // With isAdd, the channel joins the list (unless it is there, or force is false and the
    // row already has a channel of another kind); otherwise it becomes the row's only channel.
    // Answers whether the row took it.
    virtual bool addOrResetAssociatedChannel(TQChannelBase* channel, bool isAdd, bool force);

    // ---- State ----
    const JNBuildContext& context() const { return _context; }
    JNInspectorDelegate* delegate() const { return _context.delegate(); }
    bool isHUD() const { return _context.isHUD(); }
    // The row's own switch; subclasses add what their controls depend on.
    virtual bool isEnabled() const { return _enabled; }
    void setEnabled(bool enabled);
    // Brings the controls' enabled state in step with isEnabled.
    virtual void updateEnableState() {}
    bool isHidden() const { return _hidden; }
    virtual void setHidden(bool hidden) { _hidden = hidden; }

    // ---- View ----
    const CGRect& frame() const { return _frame; }
    void setFrameSize(const CGSize& size) { _frame.size = size; }
    void setFrame(const CGRect& frame) { _frame = frame; }
    double minWidth() const { return _minWidth; }
    void setMinWidth(double width) { _minWidth = width; }
    // The row draws a box around its view.
    void encloseViewInBox() { _enclosedInBox = true; }
    bool isEnclosedInBox() const { return _enclosedInBox; }
    virtual void resizeColumnsLabelWidth(float labelWidth, float paramWidth);
    double indentation() const { return _indentation; }
    void setIndentation(double points) { _indentation = points; }

    // ---- Refresh ----
    // Shows the channel's present state in the controls.
    virtual void update() {}
    // A notification word of the host.
    virtual void notify(uint32_t word);
    // A disclosure in this row opened (true) or closed.
    virtual void didTwiddle(bool) {}
    // The time the row reads and writes at: the delegate's for the channel.
    virtual CMTime currentTime() const;

protected:
    // The undo step of an edit, through the delegate: opened for the channel and each of the
    // list, closed once.
    virtual void aboutToChangeChannel();
    void endChannelChange();
    bool isChanging() const { return _changing; }

private:
    TQChannelBase* _channel = nullptr;  // not owned
    std::vector<TQChannelBase*> _channelList;
    JNBuildContext _context;
    CGRect _frame = CGRectZero;
    double _minWidth = 0.0;
    double _indentation = 0.0;
    bool _enabled = true;
    bool _hidden = false;
    bool _enclosedInBox = false;
    bool _changing = false;
};

class TQViewControllerGroup : public TQViewController {
public:
    // The indentation of an indented group's rows.
    static constexpr double kIndentStep = 12.0;

    using TQViewController::TQViewController;
    ~TQViewControllerGroup() override;

    // Takes the row; with appendSubview its view goes below the group's others. Answers it.
    TQViewController* addController(std::unique_ptr<TQViewController> controller,
                                    bool appendSubview);
    const std::vector<std::unique_ptr<TQViewController>>& controllers() const {
        return _controllers;
    }
    // Every row indented by one step more.
    void indent();
    virtual bool isCollapsed() const { return _collapsed; }
    virtual void setIsCollapsed(bool collapsed) { _collapsed = collapsed; }
    // Hides the rows (collapse) or shows them again (expand).
    void collapse();
    void expand();

    void setHidden(bool hidden) override;
    void updateEnableState() override;
    void update() override;
    void notify(uint32_t word) override;

private:
    void showRows();
    std::vector<std::unique_ptr<TQViewController>> _controllers;
    bool _collapsed = false;
};
