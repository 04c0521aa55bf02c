#pragma once
// A row of segments, each with a label or an image (by the name of an image of the
// framework's resources, which the adapter loads), an accessibility description and its own
// enabled flag. With RWSegmentSwitchTracking::SelectOne one segment is selected and stays so
// (a tool switch); with Momentary a click selects its segment only for the action (an add and
// remove pair), and none is selected afterwards.

#include <cstdint>
#include <string>
#include <vector>

#include "platform/ui/RWControl.h"

enum class RWSegmentSwitchTracking { SelectOne, Momentary };

class RWSegmentedControl : public RWControl {
public:
    int64_t segmentCount() const { return static_cast<int64_t>(_segments.size()); }
    // New segments are empty and enabled; a selection past the new count is dropped.
    void setSegmentCount(int64_t count);

    // Out-of-range segments are ignored by the setters and answer empty or false.
    void setLabel(const std::string& label, int64_t forSegment);
    std::string labelForSegment(int64_t segment) const;
    void setImageName(const std::string& imageName, int64_t forSegment);
    std::string imageNameForSegment(int64_t segment) const;
    void setAccessibilityDescription(const std::string& description, int64_t forSegment);
    std::string accessibilityDescriptionForSegment(int64_t segment) const;
    void setEnabled(bool enabled, int64_t forSegment);
    bool isEnabledForSegment(int64_t segment) const;
    using RWControl::setEnabled;

    // -1 when none.
    int64_t selectedSegment() const { return _selectedSegment; }
    // -1 or an index out of range selects none.
    void setSelectedSegment(int64_t segment);

    bool isBordered() const { return _bordered; }
    void setBordered(bool bordered);
    RWSegmentSwitchTracking trackingMode() const { return _trackingMode; }
    void setTrackingMode(RWSegmentSwitchTracking mode) { _trackingMode = mode; }

    // ---- The user ----
    // A click on a segment: nothing while the control or the segment is disabled.
    void userClickSegment(int64_t segment);

private:
    struct Segment {
        std::string label;
        std::string imageName;
        std::string accessibilityDescription;
        bool enabled = true;
    };
    const Segment* segmentAt(int64_t index) const;
    Segment* segmentAt(int64_t index);

    std::vector<Segment> _segments;
    int64_t _selectedSegment = -1;
    bool _bordered = true;
    RWSegmentSwitchTracking _trackingMode = RWSegmentSwitchTracking::SelectOne;
};
