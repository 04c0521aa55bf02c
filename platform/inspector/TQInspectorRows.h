#pragma once
// The plain rows of an inspector: a channel's label, a folder's label with its disclosure, a
// label and a parameter side by side, and a folder row that opens a group below it.

#include <memory>
#include <string>

#include "platform/inspector/TQViewController.h"

// The channel's name, or a text of the host's in its place.
class TQChanLabelController : public TQViewController {
public:
    using TQViewController::TQViewController;
    void setCustomLabelString(const std::string& label) { _customLabel = label; }
    // The custom text when set, else the channel's name; empty without a channel.
    std::string labelString() const;

private:
    std::string _customLabel;
};

// A label with a disclosure triangle. The row that holds it listens to the triangle.
class TQFolderLabelController : public TQChanLabelController {
public:
    using TQChanLabelController::TQChanLabelController;
    bool isOpen() const { return _open; }
    void setOpen(bool open) { _open = open; }

private:
    bool _open = false;
};

// A label and a parameter in one row. It owns both; enabling, updates and words go to both.
class TQLabeledParamController : public TQViewController {
public:
    TQLabeledParamController(std::unique_ptr<TQViewController> label,
                             std::unique_ptr<TQViewController> param,
                             const JNBuildContext& context);
    TQViewController* label() const { return _label.get(); }
    TQViewController* param() const { return _param.get(); }
    bool isEnabled() const override;
    void updateEnableState() override;
    void setHidden(bool hidden) override;
    void update() override;
    void notify(uint32_t word) override;
    void didTwiddle(bool open) override;

private:
    std::unique_ptr<TQViewController> _label;
    std::unique_ptr<TQViewController> _param;
};

// A heading row whose disclosure opens and closes the group under it. Owns both.
class TQFolderGroupController : public TQViewControllerGroup {
public:
    TQFolderGroupController(std::unique_ptr<TQViewController> heading,
                            std::unique_ptr<TQViewControllerGroup> enclosed,
                            const JNBuildContext& context);
    TQViewController* heading() const { return _heading; }
    TQViewControllerGroup* enclosedGroup() const { return _enclosed; }
    // The user turned the disclosure: the enclosed group opens or closes.
    void twiddle(bool open);

private:
    TQViewController* _heading = nullptr;        // owned as a row of this group
    TQViewControllerGroup* _enclosed = nullptr;  // owned as a row of this group
};
