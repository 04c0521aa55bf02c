#include "platform/inspector/TQInspectorRows.h"

#include "platform/channels/TQChannelBase.h"

std::string TQChanLabelController::labelString() const {
    if (!_customLabel.empty()) return _customLabel;
    return associatedChannel() ? std::string(associatedChannel()->getName()) : std::string();
}

TQLabeledParamController::TQLabeledParamController(std::unique_ptr<TQViewController> label,
                                                   std::unique_ptr<TQViewController> param,
                                                   const JNBuildContext& context)
    : TQViewController(param ? param->associatedChannel() : nullptr, context),
      _label(std::move(label)),
      _param(std::move(param)) {
    const double height = std::max(_label ? _label->frame().size.height : 0.0,
                                   _param ? _param->frame().size.height : 0.0);
    setFrameSize(CGSizeMake(
        (_label ? _label->frame().size.width : 0.0) + (_param ? _param->frame().size.width : 0.0),
        height));
}

bool TQLabeledParamController::isEnabled() const { return !_param || _param->isEnabled(); }

void TQLabeledParamController::updateEnableState() {
    for (TQViewController* row : {_label.get(), _param.get()})
        if (row) row->updateEnableState();
}

void TQLabeledParamController::setHidden(bool hidden) {
    TQViewController::setHidden(hidden);
    for (TQViewController* row : {_label.get(), _param.get()})
        if (row) row->setHidden(hidden);
}

void TQLabeledParamController::update() {
    for (TQViewController* row : {_label.get(), _param.get()})
        if (row) row->update();
}

void TQLabeledParamController::notify(uint32_t word) {
    for (TQViewController* row : {_label.get(), _param.get()})
        if (row) row->notify(word);
}

void TQLabeledParamController::didTwiddle(bool open) {
    if (auto* folder = dynamic_cast<TQFolderLabelController*>(_label.get())) folder->setOpen(open);
    if (_param) _param->didTwiddle(open);
}

TQFolderGroupController::TQFolderGroupController(std::unique_ptr<TQViewController> heading,
                                                 std::unique_ptr<TQViewControllerGroup> enclosed,
                                                 const JNBuildContext& context)
    : TQViewControllerGroup(heading ? heading->associatedChannel() : nullptr, context) {
    _heading = addController(std::move(heading), true);
    auto* group = enclosed.get();
    _enclosed = group && addController(std::move(enclosed), true) ? group : nullptr;
    if (_enclosed && _enclosed->isCollapsed()) _enclosed->collapse();
    if (_heading) _heading->didTwiddle(_enclosed && !_enclosed->isCollapsed());
}

void TQFolderGroupController::twiddle(bool open) {
    if (!_enclosed) return;
    if (open)
        _enclosed->expand();
    else
        _enclosed->collapse();
    if (_heading) _heading->didTwiddle(open);
}
