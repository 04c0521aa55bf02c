#include "src/data/TQCurveSelection.h"

#include <algorithm>

bool TQCurveSelection::getKeypointUV(CMTime* pU, double* pV) const {
    if (pU) *pU = _u;
    if (pV) *pV = _v;
    return isKeypoint();
}

bool TQCurveSelection::setKeypointUV(const CMTime& u, double v) {
    _u = u;
    _v = v;
    return isKeypoint();
}

bool TQCurveSelection::getKeypointTangents(double* inU, double* inV, double* outU,
                                           double* outV) const {
    if (inU) *inU = _inTanU;
    if (inV) *inV = _inTanV;
    if (outU) *outU = _outTanU;
    if (outV) *outV = _outTanV;
    return isKeypoint();
}

bool TQCurveSelection::setKeypointTangents(double inU, double inV, double outU, double outV) {
    _inTanU = inU;
    _inTanV = inV;
    _outTanU = outU;
    _outTanV = outV;
    return isKeypoint();
}

int TQCurveSelection::compareKeypointAscending(const TQCurveSelection& other) const {
    CMTime mine, theirs;
    getKeypointUV(&mine, nullptr);
    other.getKeypointUV(&theirs, nullptr);
    const int32_t c = CMTimeCompare(mine, theirs);
    return c < 0 ? -1 : (c > 0 ? 1 : 0);
}

int TQCurveSelection::compareKeypointDescending(const TQCurveSelection& other) const {
    return -compareKeypointAscending(other);
}

bool TQCurveSelectionList::isSelection(const TQCurveSelection& entry) const {
    return std::any_of(_selection.begin(), _selection.end(),
                       [&](const TQCurveSelectionPtr& e) { return e && e->isEqual(entry); });
}

void TQCurveSelectionList::delSelection(const TQCurveSelection& entry) {
    // Copy the key first: the argument may be one of the entries being removed.
    const TQCurveSelection key = entry;
    std::erase_if(_selection, [&](const TQCurveSelectionPtr& e) { return e && e->isEqual(key); });
}

bool TQCurveSelectionList::isKeypointSelected(TQKeyframeHandle handle) const {
    return std::any_of(_selection.begin(), _selection.end(),
                       [&](const TQCurveSelectionPtr& e) { return e && e->getHandle() == handle; });
}

bool TQCurveSelectionList::isCurveSelected(uint32_t curveId) const {
    return std::any_of(_selection.begin(), _selection.end(), [&](const TQCurveSelectionPtr& e) {
        return e && e->getCurveId() == curveId;
    });
}

void TQCurveSelectionList::purge(uint32_t curveId) {
    std::vector<TQCurveSelectionPtr> matching;
    for (const TQCurveSelectionPtr& e : _selection)
        if (e && e->getCurveId() == curveId) matching.push_back(e);
    for (const TQCurveSelectionPtr& m : matching) delSelection(*m);
}

std::shared_ptr<TQCurveSelectionList> TQCurveSelectionList::copy() const {
    auto list = std::make_shared<TQCurveSelectionList>();
    list->_selection.reserve(_selection.size());
    for (const TQCurveSelectionPtr& e : _selection)
        list->_selection.push_back(e ? e->copy() : nullptr);
    return list;
}
