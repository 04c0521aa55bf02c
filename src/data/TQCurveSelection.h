#pragma once
// What the user has taken hold of: one selected thing (TQCurveSelection), an ordered list of
// them (TQCurveSelectionList), and a frozen keypoint of a box deformation (TQKeyframe).
// None owns keyframe data; a keyframe is reached through its channel's opaque handle, which
// may go stale at any undo or host edit (the controller repairs entries by their stored time).

#include <cstdint>
#include <memory>
#include <vector>

#include "platform/channels/TQChannelBase.h"
#include "platform/media/CMTime.h"

// Selection kinds: whole words, identical to the hit ids of drawn primitives. Not a mask.
enum : uint64_t {
    TQSelectionCurve = 0x10000000,
    TQSelectionKeypoint = 0x20000000,
    TQSelectionOutTangent = 0x40000000,
    TQSelectionInTangent = 0x80000000,
};

class TQCurveSelection {
public:
    TQCurveSelection() = default;  // every field zero

    TQKeyframeHandle getHandle() const { return _handle; }
    void setHandle(TQKeyframeHandle handle) { _handle = handle; }
    uint64_t getFlags() const { return _flag; }
    void setFlags(uint64_t flag) { _flag = flag; }
    void resetFlags() { _flag = 0; }
    uint32_t getCurveId() const { return _curveId; }
    void setCurveId(uint32_t curveId) { _curveId = curveId; }

    bool isCurve() const { return _flag == TQSelectionCurve; }
    bool isTangent() const {
        return _flag == TQSelectionOutTangent || _flag == TQSelectionInTangent;
    }
    // Deliberately excludes the three other kinds instead of testing for TQSelectionKeypoint:
    // an entry with a handle and no flag counts as a keypoint.
    bool isKeypoint() const {
        return _flag != TQSelectionCurve && _flag != TQSelectionOutTangent &&
               _flag != TQSelectionInTangent && _handle != nullptr;
    }

    // These copy whatever the kind is, then answer isKeypoint. Null out-pointers are skipped.
    bool getKeypointUV(CMTime* pU, double* pV) const;
    bool setKeypointUV(const CMTime& u, double v);
    bool getKeypointTangents(double* inU, double* inV, double* outU, double* outV) const;
    bool setKeypointTangents(double inU, double inV, double outU, double outV);

    // Handle and kind only: the curve id and the stored time and value take no part, so two
    // curve-segment entries of different curves are equal.
    bool isEqual(const TQCurveSelection& other) const {
        return _handle == other._handle && _flag == other._flag;
    }

    std::shared_ptr<TQCurveSelection> copy() const {
        return std::make_shared<TQCurveSelection>(*this);
    }

    // Three-way comparisons of the stored times (not the channel's live ones).
    int compareKeypointAscending(const TQCurveSelection& other) const;
    int compareKeypointDescending(const TQCurveSelection& other) const;

private:
    TQKeyframeHandle _handle = nullptr;
    uint64_t _flag = 0;
    CMTime _u = CMTime{};  // channel time at the last pick or repair
    double _v = 0.0;       // channel units
    double _inTanU = 0.0;
    double _inTanV = 0.0;
    double _outTanU = 0.0;
    double _outTanV = 0.0;
    uint32_t _curveId = 0;
};

using TQCurveSelectionPtr = std::shared_ptr<TQCurveSelection>;

// Ordered entries; index 0 is the primary entry. Entries are shared, not owned exclusively:
// setSelection: makes two lists hold the same entry objects.
class TQCurveSelectionList {
public:
    std::vector<TQCurveSelectionPtr>& getSelectionArray() { return _selection; }
    const std::vector<TQCurveSelectionPtr>& getSelectionArray() const { return _selection; }

    void addSelection(TQCurveSelectionPtr entry) { _selection.push_back(std::move(entry)); }
    void addSelectionFront(TQCurveSelectionPtr entry) {
        _selection.insert(_selection.begin(), std::move(entry));
    }
    bool isSelection(const TQCurveSelection& entry) const;
    // Removes every entry equal to the argument.
    void delSelection(const TQCurveSelection& entry);
    void setSelection(const TQCurveSelectionList& other) { _selection = other._selection; }
    // Callers bound the index by size(); out of range answers null instead of failing.
    TQCurveSelectionPtr selectionAtIndex(uint32_t index) const {
        return index < _selection.size() ? _selection[index] : nullptr;
    }
    uint32_t size() const { return static_cast<uint32_t>(_selection.size()); }
    void reset() { _selection.clear(); }
    bool empty() const { return _selection.empty(); }
    bool isKeypointSelected(TQKeyframeHandle handle) const;
    bool isCurveSelected(uint32_t curveId) const;
    // Removes the entries of this curve, and with them every entry equal to one of them (same
    // handle and kind on another curve): removal goes by equality, as the list's remove does.
    void purge(uint32_t curveId);

    // Deep copy: each entry is copied.
    std::shared_ptr<TQCurveSelectionList> copy() const;

private:
    std::vector<TQCurveSelectionPtr> _selection;
};

// A keypoint frozen in absolute curve-editor coordinates while a box deformation runs.
class TQKeyframe {
public:
    TQKeyframeHandle handle() const { return _handle; }
    void setHandle(TQKeyframeHandle handle) { _handle = handle; }
    uint32_t curveId() const { return _curveId; }
    void setCurveId(uint32_t curveId) { _curveId = curveId; }
    const CMTime& u() const { return _u; }
    void setU(const CMTime& u) { _u = u; }
    double v() const { return _v; }
    void setV(double v) { _v = v; }
    const CMTime& inTanU() const { return _inTanU; }
    void setInTanU(const CMTime& u) { _inTanU = u; }
    double inTanV() const { return _inTanV; }
    void setInTanV(double v) { _inTanV = v; }
    const CMTime& outTanU() const { return _outTanU; }
    void setOutTanU(const CMTime& u) { _outTanU = u; }
    double outTanV() const { return _outTanV; }
    void setOutTanV(double v) { _outTanV = v; }

private:
    TQKeyframeHandle _handle = nullptr;
    uint32_t _curveId = 0;
    CMTime _u = CMTime{};
    double _v = 0.0;
    CMTime _inTanU = CMTime{};
    double _inTanV = 0.0;
    CMTime _outTanU = CMTime{};
    double _outTanV = 0.0;
};
