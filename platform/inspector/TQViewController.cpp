#include "platform/inspector/TQViewController.h"

#include <algorithm>
#include <typeinfo>

#include "platform/channels/TQChannelBase.h"

TQViewController::TQViewController(TQChannelBase* channel, const JNBuildContext& context)
    : _channel(channel), _context(context) {}

TQViewController::~TQViewController() {
    // An edit left open by a row that goes in mid-drag is closed with it.
    endChannelChange();
}

bool TQViewController::addOrResetAssociatedChannel(TQChannelBase* channel, bool isAdd, bool force) {
    if (!isAdd) {
        _channel = channel;
        _channelList.clear();
        return true;
    }
    if (!channel || channel == _channel) return false;
    if (std::find(_channelList.begin(), _channelList.end(), channel) != _channelList.end())
        return false;
    // A row edits channels of one kind together, unless told otherwise.
    if (!force && _channel && typeid(*_channel) != typeid(*channel)) return false;
    if (!_channel)
        _channel = channel;
    else
        _channelList.push_back(channel);
    return true;
}

void TQViewController::setEnabled(bool enabled) {
    _enabled = enabled;
    updateEnableState();
}

void TQViewController::resizeColumnsLabelWidth(float labelWidth, float paramWidth) {
    _frame.size.width = static_cast<double>(labelWidth) + static_cast<double>(paramWidth);
}

void TQViewController::notify(uint32_t word) {
    (void)word;
    update();
}

CMTime TQViewController::currentTime() const {
    JNInspectorDelegate* d = delegate();
    return d ? d->currentTimeForChannel(_channel) : kCMTimeZero;
}

void TQViewController::aboutToChangeChannel() {
    JNInspectorDelegate* d = delegate();
    if (!d || !_channel) return;
    _changing = true;
    d->beginChannelChange(this, _channel);
    for (TQChannelBase* other : _channelList) d->beginChannelChange(this, other);
}

void TQViewController::endChannelChange() {
    if (!_changing) return;
    _changing = false;
    if (JNInspectorDelegate* d = delegate()) d->endChannelChange(this);
}

// ---- Group ---------------------------------------------------------------------------------

TQViewControllerGroup::~TQViewControllerGroup() = default;

TQViewController* TQViewControllerGroup::addController(std::unique_ptr<TQViewController> controller,
                                                       bool appendSubview) {
    if (!controller) return nullptr;
    TQViewController* row = controller.get();
    if (appendSubview) {
        // Below the others: the frames stack downwards from the group's origin.
        double y = 0.0;
        for (const auto& other : _controllers) y -= other->frame().size.height;
        row->setFrame(CGRectMake(row->frame().origin.x, y - row->frame().size.height,
                                 row->frame().size.width, row->frame().size.height));
    }
    row->setHidden(isHidden() || _collapsed);
    _controllers.push_back(std::move(controller));
    return row;
}

void TQViewControllerGroup::indent() {
    for (const auto& row : _controllers) row->setIndentation(row->indentation() + kIndentStep);
}

void TQViewControllerGroup::collapse() {
    setIsCollapsed(true);
    for (const auto& row : _controllers) row->setHidden(true);
}

void TQViewControllerGroup::expand() {
    setIsCollapsed(false);
    showRows();
}

void TQViewControllerGroup::showRows() {
    for (const auto& row : _controllers) row->setHidden(isHidden() || isCollapsed());
}

void TQViewControllerGroup::setHidden(bool hidden) {
    TQViewController::setHidden(hidden);
    showRows();
}

void TQViewControllerGroup::updateEnableState() {
    for (const auto& row : _controllers) row->updateEnableState();
}

void TQViewControllerGroup::update() {
    for (const auto& row : _controllers) row->update();
}

void TQViewControllerGroup::notify(uint32_t word) {
    for (const auto& row : _controllers) row->notify(word);
}
