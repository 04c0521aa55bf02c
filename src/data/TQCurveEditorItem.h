#pragma once
// Editor items: what a curve set holds. A root item (TQCurveEditorFolderItem) stands for one
// scene object and holds a flat list of channel items (TQCurveEditorChannelItem), each the
// editor's view of one curve: its identity, display name, cached samples, ghost and colour.
//
// Lifetime: an item never holds a channel pointer. It keeps a TQChannelRef and resolves it
// against the delegate's sceneChannelRoot at every access, so a channel may vanish under a
// live item; every operation then takes its null branch. The delegate is not owned and must
// outlive the item. Items are built in two phases: construct, then initWithChannel (which
// calls overridable operations).

#include <algorithm>
#include <cstdint>
#include <memory>
#include <optional>
#include <vector>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelFolder.h"
#include "platform/channels/TQChannelRef.h"
#include "platform/media/CMTime.h"
#include "platform/support/BNString.h"

class TQCurveEditorAppDelegate;

// Process-wide counters: the next item identifier, and the next curve colour (used & 7).
extern uint32_t gChannelIdentifier;
extern uint32_t gColorIndex;

class TQCurveEditorItem;
using TQCurveEditorItemPtr = std::shared_ptr<TQCurveEditorItem>;

// An owned sample array and the number of entries it holds, so that a reader given a count
// that has moved on (a new sample count waits for the next fetch) can stay inside it.
template <class T>
struct TQSampleArray {
    std::unique_ptr<T[]> data;
    uint32_t held = 0;

    // Room for `count` + 1 entries, as getSamples wants; holds `count` until told otherwise.
    T* allocate(uint32_t count) {
        data = std::make_unique<T[]>(size_t{count} + 1);
        held = count;
        return data.get();
    }
    void take(std::unique_ptr<T[]> array, uint32_t count) {
        data = std::move(array);
        held = data ? count : 0;
    }
    void reset() { take(nullptr, 0); }
    explicit operator bool() const { return data != nullptr; }
};

class TQCurveEditorItem {
public:
    TQCurveEditorItem() = default;
    virtual ~TQCurveEditorItem() = default;
    TQCurveEditorItem(const TQCurveEditorItem&) = delete;
    TQCurveEditorItem& operator=(const TQCurveEditorItem&) = delete;

    // Stores the delegate, references the channel from sceneChannelRoot, takes the next
    // identifier and builds the names. `numberOfSamples` is used by channel items.
    virtual void initWithChannel(TQChannelBase* channel, double numberOfSamples,
                                 TQCurveEditorAppDelegate* appDelegate, char ignoreHiddenChannels);

    // Rebuilds the root name and the short display name (parents, compound prefix).
    virtual void refreshNames();
    // Re-anchors the item on its channel's object root (meant for root items).
    virtual void refresh();

    virtual bool isValid() const { return true; }
    uint32_t channelId() const { return _identifier; }
    const BNString& simpleName() const { return _name; }
    // Name of the channel's object root; absent when the channel has none.
    const std::optional<BNString>& rootName() const { return _rootName; }
    bool isSelected() const { return _selected != 0; }
    virtual void select(char selected) { _selected = selected; }
    // 1 enabled, 0 disabled, -1 mixed (folders).
    virtual int32_t isEnabledItem() const { return 0; }
    virtual void enableItem(int32_t) {}
    virtual void enableItemNoDescendants(int32_t) {}
    virtual bool isAnimatedChannel() const { return false; }
    bool isLocked() const { return isAnyAncestorLocked(); }
    bool isAnyAncestorLocked() const;
    bool isHidden() const;
    char ignoreHiddenChannels() const { return _ignoreHiddenChannels; }

    // Resolved anew at each call.
    TQChannelBase* channelBase() const;
    TQChannelFolder* folder() const { return dynamic_cast<TQChannelFolder*>(channelBase()); }
    TQChannel* channel() const { return dynamic_cast<TQChannel*>(channelBase()); }
    const TQChannelRef* channelRef() const { return _channel.get(); }
    TQCurveEditorAppDelegate* appDelegate() const { return _appDelegate; }
    // The delegate's playhead; the all-zero time without a delegate.
    CMTime getCurrentTime() const;

    // A new item of the same class for the same channel (new identifier, no samples).
    virtual TQCurveEditorItemPtr copy() const;
    // Same channel pointer (two items whose channels are both gone are equal too).
    bool isEqual(const TQCurveEditorItem& other) const {
        return channelBase() == other.channelBase();
    }

    virtual void takeCurveSnapshot(char) {}

    static void resetColorIndex() { gColorIndex = 0; }

protected:
    // An empty item of the receiver's own class, for copy().
    virtual TQCurveEditorItemPtr makeEmpty() const = 0;

    std::unique_ptr<TQChannelRef> _channel;
    uint32_t _identifier = 0;
    char _selected = 0;
    char _ignoreHiddenChannels = 0;
    TQCurveEditorAppDelegate* _appDelegate = nullptr;  // not owned
    BNString _name;
    std::optional<BNString> _rootName;
};

class TQCurveEditorChannelItem;

class TQCurveEditorFolderItem : public TQCurveEditorItem {
public:
    // Builds the children: the channels of the folder, sub-folders flattened (see .cpp).
    void initWithChannel(TQChannelBase* channel, double numberOfSamples,
                         TQCurveEditorAppDelegate* appDelegate, char ignoreHiddenChannels) override;
    // An empty folder item for the root; the caller adds the children.
    void initWithRoot(TQChannelBase* root, double numberOfSamples,
                      TQCurveEditorAppDelegate* appDelegate, char ignoreHiddenChannels);

    std::vector<TQCurveEditorItemPtr>& children() { return _children; }
    const std::vector<TQCurveEditorItemPtr>& children() const { return _children; }
    std::vector<TQCurveEditorItemPtr>& flattenDescendants() { return _children; }
    // Appends a child; a folder item given as child is appended once per new valid child it
    // has (deliberately: this is how merged roots have always behaved).
    void addChild(const TQCurveEditorItemPtr& child);
    TQCurveEditorItemPtr childrenAtIndex(uint32_t index) const {
        return index < _children.size() ? _children[index] : nullptr;
    }
    uint32_t numberOfChildren() const { return static_cast<uint32_t>(_children.size()); }
    bool hasChildren() const { return !_children.empty(); }
    bool isCollapsed() const;
    void collapse(bool collapsed);

    void select(char selected) override;
    void enableItem(int32_t enabled) override;
    int32_t isEnabledItem() const override;
    void takeCurveSnapshot(char withChannel) override;
    bool isAnimatedChannel() const override;

    TQCurveEditorItemPtr copy() const override;
    // A new root item holding copies of the children.
    std::shared_ptr<TQCurveEditorFolderItem> copyWithRoot() const;

protected:
    TQCurveEditorItemPtr makeEmpty() const override {
        return std::make_shared<TQCurveEditorFolderItem>();
    }

private:
    void addChannelItem(TQChannelBase* channel, double numberOfSamples);

    std::vector<TQCurveEditorItemPtr> _children;
};

class TQCurveEditorChannelItem : public TQCurveEditorItem {
public:
    void initWithChannel(TQChannelBase* channel, double numberOfSamples,
                         TQCurveEditorAppDelegate* appDelegate, char ignoreHiddenChannels) override;

    // Sets the channel's "enabled in curve editor" flag and re-reads the extremes.
    void enableItem(int32_t enabled) override;
    int32_t isEnabledItem() const override;
    bool isAnimatedChannel() const override;
    bool isValid() const override;

    // Dirty marks free the cached arrays, so a stale curve can never be drawn.
    void setOriginalCurveDirty(char dirty);
    void setProcessedCurveDirty(char dirty);
    char originalCurveDirty() const { return _originalCurveDirty; }
    char processedCurveDirty() const { return _processedCurveDirty; }
    // Both counts; marks the keyframed curve dirty without freeing its arrays, so until the
    // next fetch a count may exceed what the arrays hold; readers of the arrays use the
    // readable counts below.
    void setNumberOfSamples(uint32_t count);
    uint32_t numberOfSamples() const { return _numberOfSamples; }
    void setNumberOfProcessedSamples(uint32_t count) { _numberOfProcessedSamples = count; }
    uint32_t numberOfProcessedSamples() const { return _numberOfProcessedSamples; }
    // The count, but no more than the present arrays hold.
    uint32_t readableSamples() const { return readable(_numberOfSamples, _samplesU, _samplesV); }
    uint32_t readableProcessedSamples() const {
        return readable(_numberOfProcessedSamples, _processedSamplesU, _processedSamplesV);
    }
    uint32_t readableSamplesSnapshot() const {
        return readable(_numberOfSamplesSnapshot, _samplesUSnapshot, _samplesVSnapshot);
    }

    // Fetches the keyframed curve when dirty and pins the samples onto the keyframes.
    void refreshOriginalCurve(const CMTime& start, const CMTime& resolution);
    // Fetches the curve as processed by behaviours when dirty.
    void refreshProcessedCurve(const CMTime& start, const CMTime& resolution);

    bool drawProcessedCurve() const;
    void setDrawProcessedCurve(char draw) { _drawProcessedCurve = draw; }
    bool drawGhost() const { return _drawGhost != 0; }
    void setDrawGhost(char draw) { _drawGhost = draw; }
    bool updateScale() const { return _updateScale != 0; }
    void setUpdateScale(char update) { _updateScale = update; }

    // Handles of all keyframes, filled anew at each call; empty without a channel.
    std::vector<TQKeyframeHandle>* keypoints();
    uint32_t numberOfKeypoints() { return static_cast<uint32_t>(keypoints()->size()); }
    double conversionFactor() const { return _channelScale; }

    // Extremes in channel units: the keyframes', widened by the processed curve up to five
    // times the keyframe range.
    double minY();
    double maxY();
    // Both, the channel resolved once: maxY, then minY.
    void extremes(double* minY, double* maxY);
    void setMinY(double v) { _minY = v; }
    void setMaxY(double v) { _maxY = v; }

    // The ghost: a copy of the current samples and, with the flag, of the channel.
    void takeCurveSnapshot(char withChannel) override;
    TQChannel* snapshotChannel() const { return _backupChannel.get(); }

    double currentValue() const;
    void setCurrentValue(double value);

    bool isCompound() const;
    // Own channel first, then the other components of its compound in their order.
    std::vector<TQChannelBase*> compoundChannelComponents() const;

    TQCurveEditorItemPtr copy() const override;

    // The sample arrays: owned, null when absent. Setters free what they replace and are
    // told how many entries the new array holds.
    const CMTime* samplesU() const { return _samplesU.data.get(); }
    const double* samplesV() const { return _samplesV.data.get(); }
    const CMTime* samplesUSnapshot() const { return _samplesUSnapshot.data.get(); }
    const double* samplesVSnapshot() const { return _samplesVSnapshot.data.get(); }
    const CMTime* processedSamplesU() const { return _processedSamplesU.data.get(); }
    const double* processedSamplesV() const { return _processedSamplesV.data.get(); }
    void setSamplesU(std::unique_ptr<CMTime[]> a, uint32_t held) {
        _samplesU.take(std::move(a), held);
    }
    void setSamplesV(std::unique_ptr<double[]> a, uint32_t held) {
        _samplesV.take(std::move(a), held);
    }
    void setSamplesUSnapshot(std::unique_ptr<CMTime[]> a, uint32_t held) {
        _samplesUSnapshot.take(std::move(a), held);
    }
    void setSamplesVSnapshot(std::unique_ptr<double[]> a, uint32_t held) {
        _samplesVSnapshot.take(std::move(a), held);
    }
    void setProcessedSamplesU(std::unique_ptr<CMTime[]> a, uint32_t held) {
        _processedSamplesU.take(std::move(a), held);
    }
    void setProcessedSamplesV(std::unique_ptr<double[]> a, uint32_t held) {
        _processedSamplesV.take(std::move(a), held);
    }
    uint32_t numberOfSamplesSnapshot() const { return _numberOfSamplesSnapshot; }
    void setNumberOfSamplesSnapshot(uint32_t n) { _numberOfSamplesSnapshot = n; }

    double scaleY() const { return _scaleY; }
    void setScaleY(double s) { _scaleY = s; }
    double offsetY() const { return _offsetY; }
    void setOffsetY(double o) { _offsetY = o; }
    uint32_t colorIndex() const { return _colorIndex; }
    void setColorIndex(uint32_t index) { _colorIndex = index; }

protected:
    TQCurveEditorItemPtr makeEmpty() const override {
        return std::make_shared<TQCurveEditorChannelItem>();
    }

private:
    // One walk for both extremes: `sign` is -1 for the minimum, +1 for the maximum. `c` is
    // the item's channel, resolved by the caller.
    double extreme(TQChannel* c, double& cached, int sign);
    // drawProcessedCurve for the channel the caller resolved.
    bool drawsProcessedCurve(const TQChannel* c) const;
    // `count` bounded by the arrays present; with neither present, `count` (nothing to read).
    template <class U, class V>
    static uint32_t readable(uint32_t count, const TQSampleArray<U>& u, const TQSampleArray<V>& v) {
        if (u) count = std::min(count, u.held);
        if (v) count = std::min(count, v.held);
        return count;
    }

    char _originalCurveDirty = 1;
    char _processedCurveDirty = 1;
    char _drawGhost = 0;
    char _drawProcessedCurve = 1;
    TQSampleArray<CMTime> _processedSamplesU;
    TQSampleArray<double> _processedSamplesV;
    uint32_t _numberOfProcessedSamples = 0;
    TQSampleArray<CMTime> _samplesU;
    TQSampleArray<double> _samplesV;
    TQSampleArray<double> _samplesVSnapshot;
    TQSampleArray<CMTime> _samplesUSnapshot;
    uint32_t _numberOfSamples = 0;
    uint32_t _numberOfSamplesSnapshot = 0;
    std::vector<TQKeyframeHandle> _keypoints;
    uint32_t _colorIndex = 0;
    double _scaleY = 0.0;
    double _offsetY = 0.0;
    double _maxY = 0.0;
    double _minY = 0.0;
    char _updateScale = 1;
    double _channelScale = 1.0;
    std::unique_ptr<TQChannel> _backupChannel;
};

using TQCurveEditorFolderItemPtr = std::shared_ptr<TQCurveEditorFolderItem>;
using TQCurveEditorChannelItemPtr = std::shared_ptr<TQCurveEditorChannelItem>;
