#include "src/data/TQCurveEditorItem.h"

#include <algorithm>
#include <cfloat>
#include <cmath>

#include "platform/channels/TQChannelObjectRootBase.h"
#include "src/contract/TQCurveEditorAppDelegate.h"

uint32_t gChannelIdentifier = 0;
uint32_t gColorIndex = 0;

namespace {

constexpr double kZeroTolerance = 1e-7;
// How far a behaviour may widen the extremes beyond the keyframes' range.
constexpr double kProcessedWideningLimit = 5.0;

bool isFolder(const TQChannelBase* c) { return dynamic_cast<const TQChannelFolder*>(c) != nullptr; }

bool isObjectRootWithoutNameFlag(const TQChannelBase* c) {
    return dynamic_cast<const TQChannelObjectRootBase*>(c) != nullptr &&
           !c->testFlag(kTQChannelFlagNameInDisplayName);
}

}  // namespace

// ---------------------------------------------------------------------------------------------
// TQCurveEditorItem

void TQCurveEditorItem::initWithChannel(TQChannelBase* channel, double,
                                        TQCurveEditorAppDelegate* appDelegate,
                                        char ignoreHiddenChannels) {
    _appDelegate = appDelegate;
    _selected = 0;
    _channel = std::make_unique<TQChannelRef>(
        channel, appDelegate ? appDelegate->sceneChannelRoot() : nullptr);
    _identifier = gChannelIdentifier++;
    _ignoreHiddenChannels = ignoreHiddenChannels;
    refreshNames();
}

TQChannelBase* TQCurveEditorItem::channelBase() const {
    if (!_channel || !_appDelegate) return nullptr;
    return _channel->getChannel(_appDelegate->sceneChannelRoot());
}

void TQCurveEditorItem::refreshNames() {
    // The order of these steps decides which parents a name shows; keep it.
    TQChannelBase* c = channelBase();
    _rootName.reset();
    if (c) {
        if (const TQChannelBase* root = c->getChannelRoot()) _rootName = root->getName();
    }
    _name.clear();
    if (!c) return;
    _name = c->getName();
    const TQChannelBase* p = c->getParent();
    if (!p) return;
    if (auto* f = dynamic_cast<const TQChannelFolder*>(p); f && f->isCompoundChannel()) {
        _name = p->getName() + "." + _name;
        p = p->getParent();
    }
    if (!p) return;
    // A missing root name is contained nowhere.
    if (_rootName && _name.find(*_rootName) != BNString::npos) return;
    if (isObjectRootWithoutNameFlag(p)) return;
    const TQChannelBase* g = p->getParent();
    if (!g) return;
    if (isObjectRootWithoutNameFlag(g)) return;
    _name = p->getName() + "." + _name;
    if (g->testFlag(kTQChannelFlagNameInDisplayName)) _name = g->getName() + "." + _name;
}

void TQCurveEditorItem::refresh() {
    TQChannelBase* c = channelBase();
    TQChannelBase* root = c ? c->getChannelRoot() : nullptr;
    _channel = std::make_unique<TQChannelRef>(root, nullptr);
    refreshNames();
}

bool TQCurveEditorItem::isAnyAncestorLocked() const {
    // Callers expect a live channel; a vanished one counts as unlocked rather than failing.
    TQChannelBase* c = channelBase();
    return c ? c->isAnyAncestorLocked() : false;
}

bool TQCurveEditorItem::isHidden() const {
    TQChannelBase* c = channelBase();
    if (!c) return true;
    return c->testFlag(kTQChannelFlagHidden) ||
           (_ignoreHiddenChannels && c->testFlag(kTQChannelFlagHiddenInCurveEditor));
}

CMTime TQCurveEditorItem::getCurrentTime() const {
    return _appDelegate ? _appDelegate->currentTime() : CMTime{};
}

TQCurveEditorItemPtr TQCurveEditorItem::copy() const {
    TQCurveEditorItemPtr item = makeEmpty();
    item->initWithChannel(channelBase(), 0, _appDelegate, _ignoreHiddenChannels);
    item->select(_selected);
    return item;
}

// ---------------------------------------------------------------------------------------------
// TQCurveEditorFolderItem

void TQCurveEditorFolderItem::initWithRoot(TQChannelBase* root, double numberOfSamples,
                                           TQCurveEditorAppDelegate* appDelegate,
                                           char ignoreHiddenChannels) {
    TQCurveEditorItem::initWithChannel(root, numberOfSamples, appDelegate, ignoreHiddenChannels);
    _children.clear();
}

void TQCurveEditorFolderItem::addChannelItem(TQChannelBase* channel, double numberOfSamples) {
    auto item = std::make_shared<TQCurveEditorChannelItem>();
    item->initWithChannel(channel, numberOfSamples, _appDelegate, _ignoreHiddenChannels);
    if (item->isValid()) _children.push_back(std::move(item));
}

void TQCurveEditorFolderItem::initWithChannel(TQChannelBase* channel, double numberOfSamples,
                                              TQCurveEditorAppDelegate* appDelegate,
                                              char ignoreHiddenChannels) {
    TQCurveEditorItem::initWithChannel(channel, numberOfSamples, appDelegate, ignoreHiddenChannels);
    _children.clear();
    auto* folderChannel = dynamic_cast<TQChannelFolder*>(channel);
    if (!folderChannel) return;
    // Deliberately the reverse of what the name suggests: a folder hidden in curve editors is
    // left empty only when hidden channels are not ignored.
    if (!_ignoreHiddenChannels && folderChannel->testFlag(kTQChannelFlagHiddenInCurveEditor))
        return;

    // Descendants left out of the flattened list: hidden ones, and those hidden in curve
    // editors too unless hidden channels are ignored (the same reversal as above).
    const uint32_t excluded =
        _ignoreHiddenChannels ? uint32_t{kTQChannelFlagHidden}
                              : uint32_t{kTQChannelFlagHidden | kTQChannelFlagHiddenInCurveEditor};
    const bool flattenAll = folderChannel->testFlag(kTQChannelFlagShowFlattened);
    const std::vector<TQChannelBase*>* kids = folderChannel->getChildren();
    if (kids) {
        std::vector<TQChannelBase*> flattened;
        for (TQChannelBase* child : *kids) {
            if (!child) continue;  // a null child yields nothing, flattened or not
            if (dynamic_cast<TQChannel*>(child)) {
                addChannelItem(child, numberOfSamples);
                continue;
            }
            const bool objectRoot = dynamic_cast<TQChannelObjectRootBase*>(child) != nullptr;
            if ((!isFolder(child) || objectRoot) && !flattenAll) continue;
            auto* sub = dynamic_cast<TQChannelFolder*>(child);
            if (!sub) continue;
            if (_ignoreHiddenChannels && sub->testFlag(kTQChannelFlagHiddenInCurveEditor)) continue;
            flattened.clear();
            sub->getAllDescendantsFlattened(flattened, excluded, !flattenAll);
            for (TQChannelBase* descendant : flattened) addChannelItem(descendant, numberOfSamples);
        }
    }
    collapse(false);
}

void TQCurveEditorFolderItem::addChild(const TQCurveEditorItemPtr& child) {
    if (!child) return;
    auto* folderChild = dynamic_cast<TQCurveEditorFolderItem*>(child.get());
    if (!folderChild) {
        _children.push_back(child);
        return;
    }
    // Deliberately appends the folder itself, once for each valid child it brings that is not
    // here yet; merged roots have always relied on it.
    for (const TQCurveEditorItemPtr& grandChild : folderChild->_children) {
        if (!grandChild || !grandChild->isValid()) continue;
        const bool present = std::any_of(
            _children.begin(), _children.end(),
            [&](const TQCurveEditorItemPtr& c) { return c && c->isEqual(*grandChild); });
        if (!present) _children.push_back(child);
    }
}

bool TQCurveEditorFolderItem::isCollapsed() const {
    TQChannelFolder* f = folder();
    return f ? f->testFoldFlag(kTQFoldFlagCollapsed) : false;
}

void TQCurveEditorFolderItem::collapse(bool collapsed) {
    TQChannelFolder* f = folder();
    if (!f) return;
    if (collapsed)
        f->setFoldFlag(kTQFoldFlagCollapsed);
    else
        f->resetFoldFlag(kTQFoldFlagCollapsed);
}

void TQCurveEditorFolderItem::select(char selected) {
    TQCurveEditorItem::select(selected);
    for (const TQCurveEditorItemPtr& c : _children)
        if (c) c->select(selected);
}

void TQCurveEditorFolderItem::enableItem(int32_t enabled) {
    for (const TQCurveEditorItemPtr& c : _children)
        if (c) c->enableItem(enabled);
}

int32_t TQCurveEditorFolderItem::isEnabledItem() const {
    if (_children.empty()) return 1;
    std::optional<int32_t> common;
    for (const TQCurveEditorItemPtr& c : _children) {
        const int32_t state = c ? c->isEnabledItem() : 0;
        if (!common)
            common = state;
        else if (*common != state)
            return -1;
    }
    return *common;
}

void TQCurveEditorFolderItem::takeCurveSnapshot(char withChannel) {
    for (const TQCurveEditorItemPtr& c : _children)
        if (c) c->takeCurveSnapshot(withChannel);
}

bool TQCurveEditorFolderItem::isAnimatedChannel() const {
    return std::all_of(_children.begin(), _children.end(),
                       [](const TQCurveEditorItemPtr& c) { return c && c->isAnimatedChannel(); });
}

TQCurveEditorItemPtr TQCurveEditorFolderItem::copy() const {
    TQCurveEditorItemPtr base = TQCurveEditorItem::copy();
    auto* item = static_cast<TQCurveEditorFolderItem*>(base.get());
    item->_children.clear();
    for (const TQCurveEditorItemPtr& c : _children)
        if (c) item->_children.push_back(c->copy());
    item->collapse(isCollapsed());
    return base;
}

std::shared_ptr<TQCurveEditorFolderItem> TQCurveEditorFolderItem::copyWithRoot() const {
    auto item = std::make_shared<TQCurveEditorFolderItem>();
    item->initWithRoot(channelBase(), 0, _appDelegate, _ignoreHiddenChannels);
    for (const TQCurveEditorItemPtr& c : _children)
        if (c) item->addChild(c->copy());
    item->collapse(isCollapsed());
    return item;
}

// ---------------------------------------------------------------------------------------------
// TQCurveEditorChannelItem

void TQCurveEditorChannelItem::initWithChannel(TQChannelBase* channel, double numberOfSamples,
                                               TQCurveEditorAppDelegate* appDelegate,
                                               char ignoreHiddenChannels) {
    TQCurveEditorItem::initWithChannel(channel, numberOfSamples, appDelegate, ignoreHiddenChannels);
    _originalCurveDirty = 1;
    _processedCurveDirty = 1;
    _drawGhost = 0;
    _drawProcessedCurve = 1;
    _samplesU.reset();
    _samplesV.reset();
    _samplesUSnapshot.reset();
    _samplesVSnapshot.reset();
    _processedSamplesU.reset();
    _processedSamplesV.reset();
    // Truncated to unsigned; a negative or non-finite count means none.
    const uint32_t count =
        (std::isfinite(numberOfSamples) && numberOfSamples > 0 && numberOfSamples < 4294967296.0)
            ? static_cast<uint32_t>(numberOfSamples)
            : 0u;
    _numberOfSamples = count;
    _numberOfProcessedSamples = count;
    _numberOfSamplesSnapshot = 0;
    _updateScale = 1;
    _backupChannel.reset();
    _colorIndex = gColorIndex & 7;
    ++gColorIndex;
    if (auto* c = dynamic_cast<TQChannel*>(channel)) {
        _maxY = c->getKeyframeMaxValue(true);
        _minY = c->getKeyframeMinValue(true);
    } else {
        _maxY = 0.0;
        _minY = 0.0;
    }
    _channelScale = channel ? channel->getInfo()->displayScale : 1.0;
    enableItem(1);  // a new item shows its curve
}

void TQCurveEditorChannelItem::enableItem(int32_t enabled) {
    TQChannel* c = channel();
    if (!c) return;
    if (enabled)
        c->setFlag(kTQChannelFlagEnabledInCurveEditor, false);
    else
        c->resetFlag(kTQChannelFlagEnabledInCurveEditor, false);
    _maxY = c->getKeyframeMaxValue(true);
    _minY = c->getKeyframeMinValue(true);
    if (enabled) setOriginalCurveDirty(1);
    setUpdateScale(1);
}

int32_t TQCurveEditorChannelItem::isEnabledItem() const {
    TQChannel* c = channel();
    return c && c->testFlag(kTQChannelFlagEnabledInCurveEditor) ? 1 : 0;
}

bool TQCurveEditorChannelItem::isAnimatedChannel() const {
    TQChannel* c = channel();
    return c ? c->canKeyframe() : false;
}

bool TQCurveEditorChannelItem::isValid() const {
    TQChannel* c = channel();
    if (!c) return false;
    if (!_ignoreHiddenChannels) return true;
    return !c->testFlag(kTQChannelFlagHiddenInCurveEditor) && !c->testFlag(kTQChannelFlagHidden);
}

void TQCurveEditorChannelItem::setOriginalCurveDirty(char dirty) {
    _originalCurveDirty = dirty;
    if (dirty) {
        _samplesU.reset();
        _samplesV.reset();
    }
}

void TQCurveEditorChannelItem::setProcessedCurveDirty(char dirty) {
    _processedCurveDirty = dirty;
    if (dirty) {
        _processedSamplesU.reset();
        _processedSamplesV.reset();
    }
}

void TQCurveEditorChannelItem::setNumberOfSamples(uint32_t count) {
    _numberOfSamples = count;
    _numberOfProcessedSamples = count;
    _originalCurveDirty = 1;  // the arrays stay until the next fetch replaces them
}

void TQCurveEditorChannelItem::refreshOriginalCurve(const CMTime& start, const CMTime& resolution) {
    TQChannel* c = channel();
    if (!c) {
        _samplesU.reset();
        _samplesV.reset();
        _numberOfSamples = 0;
        return;
    }
    if (!_originalCurveDirty) return;
    CMTime* times = _samplesU.allocate(_numberOfSamples);
    double* values = _samplesV.allocate(_numberOfSamples);
    c->getSamples(nullptr, start, resolution, _numberOfSamples, &times, &values);
    // The channel may lower the count; a channel that raised it gets no room beyond the arrays.
    const uint32_t n = std::min(_numberOfSamples, _samplesU.held);
    _samplesU.held = _samplesV.held = n;

    // Pin the polyline onto the keyframes: each keyframe takes the first sample at or after
    // it that an earlier keyframe has not taken, however coarse the step.
    const auto earlier = [](const CMTime& a, const CMTime& b) { return CMTimeCompare(a, b) < 0; };
    uint32_t i = 0;
    for (TQKeyframeHandle k : c->getKeyframes(true)) {
        CMTime t{};
        double v = 0.0;
        if (!c->getKeyframe(k, &t, &v)) continue;
        i = static_cast<uint32_t>(std::lower_bound(times + i, times + n, t, earlier) - times);
        if (i == n) break;
        times[i] = t;
        values[i] = v;
    }
    setProcessedCurveDirty(1);  // both curves go stale together
    _originalCurveDirty = 0;
}

void TQCurveEditorChannelItem::refreshProcessedCurve(const CMTime& start,
                                                     const CMTime& resolution) {
    TQChannel* c = channel();
    if (!c) {
        _processedSamplesU.reset();
        _processedSamplesV.reset();
        _numberOfProcessedSamples = 0;
        return;
    }
    if (!_processedCurveDirty) return;
    CMTime* times = _processedSamplesU.allocate(_numberOfProcessedSamples);
    double* values = _processedSamplesV.allocate(_numberOfProcessedSamples);
    c->getSamples(start, resolution, _numberOfProcessedSamples, &times, &values);
    _processedSamplesU.held = _processedSamplesV.held =
        std::min(_numberOfProcessedSamples, _processedSamplesU.held);
    _processedCurveDirty = 0;
}

bool TQCurveEditorChannelItem::drawProcessedCurve() const { return drawsProcessedCurve(channel()); }

bool TQCurveEditorChannelItem::drawsProcessedCurve(const TQChannel* c) const {
    return c && _drawProcessedCurve && c->isChannelAffectedByBehaviors(true);
}

std::vector<TQKeyframeHandle>* TQCurveEditorChannelItem::keypoints() {
    if (TQChannel* c = channel())
        _keypoints = c->getKeyframes(false);
    else
        _keypoints.clear();
    return &_keypoints;
}

double TQCurveEditorChannelItem::minY() { return extreme(channel(), _minY, -1); }
double TQCurveEditorChannelItem::maxY() { return extreme(channel(), _maxY, +1); }

void TQCurveEditorChannelItem::extremes(double* minY, double* maxY) {
    TQChannel* c = channel();
    const double top = extreme(c, _maxY, +1);
    const double bottom = extreme(c, _minY, -1);
    if (maxY) *maxY = top;
    if (minY) *minY = bottom;
}

double TQCurveEditorChannelItem::extreme(TQChannel* c, double& cached, int sign) {
    if (!c) {
        cached = 0.0;
        return 0.0;
    }
    const bool wantMax = sign > 0;
    cached = wantMax ? c->getKeyframeMaxValue(true) : c->getKeyframeMinValue(true);
    if (!drawsProcessedCurve(c)) return cached;

    const bool absent = !_processedSamplesV;
    if (absent) {
        const CMTimeRange range = _appDelegate ? _appDelegate->displayRange() : CMTimeRange{};
        const CMTime frame = _appDelegate ? _appDelegate->getFrameDuration() : CMTime{};
        const double frames = CMTimeGetSeconds(range.duration) / CMTimeGetSeconds(frame);
        // No usable frame rate (a missing host gives zero times): measure nothing.
        _numberOfProcessedSamples = (std::isfinite(frames) && frames > 0 && frames < 4294967296.0)
                                        ? static_cast<uint32_t>(frames)
                                        : 0u;
        refreshProcessedCurve(range.start, frame);
        if (!_processedSamplesV) {
            _processedCurveDirty = 1;
            return cached;
        }
    }
    const double other = wantMax ? c->getKeyframeMinValue(true) : c->getKeyframeMaxValue(true);
    double s = wantMax ? -DBL_MAX : DBL_MAX;
    // A new count set since the fetch is not what the arrays hold: read what they hold.
    const uint32_t n = readableProcessedSamples();
    for (uint32_t i = 0; i < n; ++i) {
        const double value = _processedSamplesV.data[i];
        s = wantMax ? std::max(s, value) : std::min(s, value);
    }
    const bool widens = wantMax ? cached < s : cached > s;
    if (widens) {
        const double d = cached - other;
        if (std::fabs(d) >= kZeroTolerance && std::fabs((s - other) / d) > kProcessedWideningLimit)
            s = other + d * kProcessedWideningLimit;
        cached = s;
    }
    // Samples taken only to measure are not for drawing: fetch again before the next frame.
    if (absent) _processedCurveDirty = 1;
    return cached;
}

void TQCurveEditorChannelItem::takeCurveSnapshot(char withChannel) {
    TQChannel* c = channel();
    if (!c) {
        _samplesUSnapshot.reset();
        _samplesVSnapshot.reset();
        _backupChannel.reset();
        _numberOfSamplesSnapshot = 0;
        return;
    }
    if (!_samplesV) return;  // nothing drawn yet: keep any earlier ghost
    _samplesUSnapshot.reset();
    _samplesVSnapshot.reset();
    _backupChannel.reset();
    if (withChannel) _backupChannel.reset(dynamic_cast<TQChannel*>(c->cloneChannel()));
    // The curve as last fetched: a count set since then is not what the arrays hold.
    const uint32_t n = readableSamples();
    std::copy_n(_samplesV.data.get(), n, _samplesVSnapshot.allocate(n));
    CMTime* times = _samplesUSnapshot.allocate(n);
    if (_samplesU) std::copy_n(_samplesU.data.get(), n, times);
    _numberOfSamplesSnapshot = n;
}

double TQCurveEditorChannelItem::currentValue() const {
    TQChannel* c = channel();
    return c ? c->getValueAsDouble(getCurrentTime(), 0.0) : 0.0;
}

void TQCurveEditorChannelItem::setCurrentValue(double value) {
    TQChannel* c = channel();
    if (!c) return;
    const CMTime now = getCurrentTime();
    c->setValue(&now, value);
}

bool TQCurveEditorChannelItem::isCompound() const {
    TQChannel* c = channel();
    const TQChannelFolder* parent = c ? c->getParent() : nullptr;
    return parent && parent->isCompoundChannel();
}

std::vector<TQChannelBase*> TQCurveEditorChannelItem::compoundChannelComponents() const {
    std::vector<TQChannelBase*> components;
    TQChannel* c = channel();
    if (!c) return components;
    components.push_back(c);
    const TQChannelFolder* parent = c->getParent();
    if (parent && parent->isCompoundChannel()) {
        if (const std::vector<TQChannelBase*>* kids = parent->getChildren())
            for (TQChannelBase* k : *kids)
                if (k && k != c) components.push_back(k);
    }
    return components;
}

TQCurveEditorItemPtr TQCurveEditorChannelItem::copy() const {
    TQCurveEditorItemPtr base = TQCurveEditorItem::copy();
    auto* item = static_cast<TQCurveEditorChannelItem*>(base.get());
    item->_colorIndex = _colorIndex;
    item->_numberOfSamples = _numberOfSamples;
    item->_numberOfProcessedSamples = _numberOfProcessedSamples;
    item->_scaleY = _scaleY;
    item->_offsetY = _offsetY;
    item->_minY = _minY;
    item->_maxY = _maxY;
    return base;
}
