#pragma once
// The view fixture with a recording encoder of the view's drawable size, and helpers that run
// whole frames past the 1/30 s gate and read back what they drew.

#include <memory>
#include <vector>

#include "platform/draw/testing/HXDRecordingEncoder.h"
#include "src/view/tests/FrameBaseline.h"
#include "src/view/tests/ViewFixture.h"

namespace view_test {

class ViewDrawFixture : public ViewFixture {
protected:
    // Past the gate, one frame; answers whether it was drawn. Every frame must hand the
    // encoder premultiplied colours only.
    bool frame() {
        clock.advance(1.0);
        const bool drawn = view.displayLayer(&encoder);
        for (const auto& fault : encoder.colourFaults)
            ADD_FAILURE() << "colour (" << fault.color.red << ", " << fault.color.green << ", "
                          << fault.color.blue << ", " << fault.color.alpha
                          << ") is not premultiplied";
        return drawn;
    }

    // The channel id an item's primitive carries, or -1 without one.
    static int64_t idOf(const HXDDrawPrimitive& p) {
        const HXDNumber* id = p.hitInfo().extraInfo().objectForKey("ID");
        return id ? id->integerValue() : -1;
    }

    // The multilines of the frame's pickable list that belong to the item, in order.
    std::vector<const HXDMultiline*> curvePieces(const TQCurveEditorChannelItemPtr& item) const {
        std::vector<const HXDMultiline*> out;
        for (const auto& p : view.selectionPrimitives())
            if (p->hitInfo().hitID() == TQSelectionCurve && idOf(*p) == item->channelId())
                out.push_back(dynamic_cast<const HXDMultiline*>(p.get()));
        return out;
    }

    // The pickable primitives of one hit id, in drawing order.
    template <class T>
    std::vector<const T*> pickable(uint32_t hitID) const {
        std::vector<const T*> out;
        for (const auto& p : view.selectionPrimitives())
            if (p->hitInfo().hitID() == hitID)
                if (const auto* t = dynamic_cast<const T*>(p.get())) out.push_back(t);
        return out;
    }

    // A linear channel with its item, selected for nothing.
    TQCurveEditorChannelItemPtr linearItem(const char* name,
                                           std::initializer_list<std::pair<double, double>> keys) {
        TQChannel* c = addChannel(name, keys);
        c->setInterpolation(kTQInterpolationLinear);
        return addItem(c);
    }

    // The last frame as text (FrameBaseline.h); keyframes are numbered over every channel of
    // the object in order.
    std::string frameText() const {
        std::vector<TQChannelBase*> channels;
        object->getAllDescendantsFlattened(channels, 0, true);
        std::vector<TQKeyframeHandle> handles;
        for (TQChannelBase* c : channels)
            for (TQKeyframeHandle h : static_cast<TQChannel*>(c)->getKeyframes(false))
                handles.push_back(h);
        const auto nameOf = [this](int64_t id) -> std::string {
            const auto item = controllerPtr->channelItemWithIdentifier(static_cast<uint32_t>(id));
            return item && item->channelBase() ? item->channelBase()->getName() : "?";
        };
        return view_test::frameText(view, nameOf, handles);
    }

    HXDRecordingEncoder encoder{800, 400};
};

}  // namespace view_test
