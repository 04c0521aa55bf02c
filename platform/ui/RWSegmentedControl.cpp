#include "platform/ui/RWSegmentedControl.h"

void RWSegmentedControl::setSegmentCount(int64_t count) {
    _segments.resize(count > 0 ? static_cast<size_t>(count) : 0);
    if (_selectedSegment >= segmentCount()) _selectedSegment = -1;
    changed();
}

const RWSegmentedControl::Segment* RWSegmentedControl::segmentAt(int64_t index) const {
    return index >= 0 && index < segmentCount() ? &_segments[static_cast<size_t>(index)] : nullptr;
}

RWSegmentedControl::Segment* RWSegmentedControl::segmentAt(int64_t index) {
    return index >= 0 && index < segmentCount() ? &_segments[static_cast<size_t>(index)] : nullptr;
}

void RWSegmentedControl::setLabel(const std::string& label, int64_t forSegment) {
    if (Segment* s = segmentAt(forSegment)) {
        s->label = label;
        changed();
    }
}

std::string RWSegmentedControl::labelForSegment(int64_t segment) const {
    const Segment* s = segmentAt(segment);
    return s ? s->label : std::string();
}

void RWSegmentedControl::setImageName(const std::string& imageName, int64_t forSegment) {
    if (Segment* s = segmentAt(forSegment)) {
        s->imageName = imageName;
        changed();
    }
}

std::string RWSegmentedControl::imageNameForSegment(int64_t segment) const {
    const Segment* s = segmentAt(segment);
    return s ? s->imageName : std::string();
}

void RWSegmentedControl::setAccessibilityDescription(const std::string& description,
                                                     int64_t forSegment) {
    if (Segment* s = segmentAt(forSegment)) {
        s->accessibilityDescription = description;
        changed();
    }
}

std::string RWSegmentedControl::accessibilityDescriptionForSegment(int64_t segment) const {
    const Segment* s = segmentAt(segment);
    return s ? s->accessibilityDescription : std::string();
}

void RWSegmentedControl::setEnabled(bool enabled, int64_t forSegment) {
    if (Segment* s = segmentAt(forSegment)) {
        s->enabled = enabled;
        changed();
    }
}

bool RWSegmentedControl::isEnabledForSegment(int64_t segment) const {
    const Segment* s = segmentAt(segment);
    return s && s->enabled;
}

void RWSegmentedControl::setSelectedSegment(int64_t segment) {
    _selectedSegment = segmentAt(segment) ? segment : -1;
    changed();
}

void RWSegmentedControl::setBordered(bool bordered) {
    _bordered = bordered;
    changed();
}

void RWSegmentedControl::userClickSegment(int64_t segment) {
    if (!isEnabled() || !isEnabledForSegment(segment)) return;
    const std::shared_ptr<RWControl> keep = weak_from_this().lock();  // the action may drop it
    _selectedSegment = segment;
    changed();
    sendAction();
    if (_trackingMode == RWSegmentSwitchTracking::Momentary) {
        _selectedSegment = -1;
        changed();
    }
}
