#pragma once
// The engine fixture seen through the view: a controller that applies the view's horizontal
// requests to its display range (as the full editor's does) and records them, a recording
// encoder for whole frames past the 1/30 s gate, frames as text for recorded baselines, and
// gestures as RWEvent sequences at world points of the last frame. The stub host is 800 x 400
// points at scale 1 with the view at the window's origin, so a window point is a pixel.

#include <cstdint>
#include <cstdio>
#include <sstream>
#include <string>
#include <vector>

#include "platform/draw/HXDPrimitives.h"
#include "platform/draw/testing/HXDRecordingEncoder.h"
#include "src/resources/TQStrings.h"
#include "tests/support/EngineFixture.h"
#include "tests/support/TextBaseline.h"

namespace view_test {

using namespace engine_test;
using tests_support::matchesBaseline;

// Screen positions go through a single-precision matrix.
inline constexpr double kPixelTolerance = 1e-3;
inline constexpr double kWorldTolerance = 1e-5;
// A time or value that went through the projection and back.
inline constexpr double kDragTolerance = 1e-3;
inline constexpr uint64_t kShift = RWEventModifierFlagShift;
inline constexpr uint64_t kControl = RWEventModifierFlagControl;
inline constexpr uint64_t kOption = RWEventModifierFlagOption;
inline constexpr uint64_t kCommand = RWEventModifierFlagCommand;
// Past the gate between two drag steps.
inline constexpr double kStepSeconds = 0.05;

class RangeController : public TQCurveEditorCtrlBase {
public:
    void didSetViewContentsHorizontalOrigin(double origin, double andDuration) override {
        const CMTime start = seconds(origin), duration = seconds(andDuration);
        getView()->setDisplayRange(&start, &duration);
    }
    void didSetViewContentsHorizontalOffset(double offset) override {
        offsets.push_back(offset);
        const CMTime start = seconds(CMTimeGetSeconds(getView()->getDisplayRange().start) + offset);
        getView()->setDisplayRange(&start, nullptr);
    }
    void windowWasPanned(double fraction) override { panned.push_back(fraction); }
    void selectionChangedTo(TQCurveSelectionList*) override { ++selectionChanges; }
    void currentViewVolumeChangedTo(const CGRect*) override { ++volumeChanges; }
    // With onGrid a moved keypoint lands on the 1/30 s grid, as the full editor's does.
    CMTime convertToCurveEditorAxis(CMTime time) const override {
        if (!onGrid) return time;
        return BN_CMTimeFloorToSampleDuration(BN_CMTimeSaferAdd(time, CMTimeMake(1, 60)),
                                              CMTimeMake(1, 30));
    }
    bool onGrid = false;

    std::vector<double> offsets;
    std::vector<double> panned;
    int selectionChanges = 0;
    int volumeChanges = 0;
};

// Names an image of the view's tables: "key c/state/selected" or "tangent".
inline std::string imageName(const TQCurveEditorViewBase& view, const HXDPixelTexture* texture) {
    if (!texture) return "none";
    if (texture == view.tangentAsset().texture.get()) return "tangent";
    for (uint32_t k = 0; k < 64; ++k)
        if (view.keyframeAsset(k / 8, k / 2 % 4, k % 2).texture.get() == texture)
            return "key " + std::to_string(k / 8) + "/" + std::to_string(k / 2 % 4) + "/" +
                   std::to_string(k % 2);
    return "other";
}

class ViewFixture : public EngineFixture {
protected:
    void SetUp() override {
        EngineFixture::SetUp();
        const CMTime start = seconds(0.0), duration = seconds(10.0);
        view.setDisplayRange(&start, &duration);
        TQCurveEditorItem::resetColorIndex();  // colours as the baselines hold them
    }
    std::unique_ptr<TQCurveEditorCtrlBase> makeController() override {
        return std::make_unique<RangeController>();
    }
    RangeController& range() { return static_cast<RangeController&>(ctrl()); }

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

    // A keyframe named as "A#1": the channel's name and its index in time order.
    std::string keyName(TQKeyframeHandle h) const {
        std::vector<TQChannelBase*> all;
        object->getAllDescendantsFlattened(all, 0, true);
        for (TQChannelBase* c : all) {
            const auto keys = static_cast<TQChannel*>(c)->getKeyframes(false);
            for (size_t i = 0; i < keys.size(); ++i)
                if (keys[i] == h) return c->getName() + "#" + std::to_string(i);
        }
        return "?";
    }

    // The last frame as text, one line per primitive in drawing order: its kind, hit word,
    // item and keyframe (numbered as keyName does), and what the eye sees of it (places in
    // world units, colours, images by name, strings).
    std::string frameText() const {
        std::ostringstream out;
        char buf[200];
        const auto colour = [&](const HXDColor& c) {
            std::snprintf(buf, sizeof buf, " rgba(%.3f %.3f %.3f %.3f)", c.red, c.green, c.blue,
                          c.alpha);
            return std::string(buf);
        };
        const auto point = [&](double x, double y) {
            std::snprintf(buf, sizeof buf, " (%.4g %.4g)", x, y);
            return std::string(buf);
        };
        for (const auto& p : view.primitives()) {
            std::snprintf(buf, sizeof buf, "hit=%x", p->hitInfo().hitID());
            out << buf;
            const HXDExtraInfo& extra = p->hitInfo().extraInfo();
            if (const HXDNumber* id = extra.objectForKey("ID")) {
                const auto item =
                    controllerPtr->channelItemWithIdentifier(uint32_t(id->integerValue()));
                out << " " << (item && item->channelBase() ? item->channelBase()->getName() : "?");
            }
            if (const HXDNumber* h = extra.objectForKey("Handle"))
                out << " key " << keyName(TQKeyframeHandle(h->unsignedLongLongValue()));
            if (const HXDBlendingInfo& b = p->blendingInfo(); !(b == HXDBlendingInfo{})) {
                std::snprintf(buf, sizeof buf, " blend(%d %d%d %d%d %d%d)", b.enabled,
                              int(b.rgbOperation), int(b.alphaOperation), int(b.sourceRGB),
                              int(b.destinationRGB), int(b.sourceAlpha), int(b.destinationAlpha));
                out << buf;
            }
            if (const auto* m = dynamic_cast<const HXDMultiline*>(p.get())) {
                const auto& v = m->vertices();
                out << (dynamic_cast<const HXDLine*>(p.get()) ? " line" : " multiline")
                    << " n=" << v.size() << " runs=" << m->numberOfRuns() << " w=" << m->width()
                    << (m->antialiased() ? " aa" : "");
                if (m->stippled()) {
                    std::snprintf(buf, sizeof buf, " stipple=%x*%g", m->stipplePattern(),
                                  m->stippleScale());
                    out << buf;
                }
                if (m->loop()) out << " loop";
                // Ends and three inner vertices stand for the shape.
                for (size_t k :
                     {size_t{0}, v.size() / 4, v.size() / 2, 3 * v.size() / 4, v.size() - 1})
                    if (k < v.size()) out << point(v[k].start.x, v[k].start.y);
                if (!v.empty()) out << colour(v.front().color) << colour(v.back().color);
            } else if (const auto* q = dynamic_cast<const HXDQuadTexture*>(p.get())) {
                const CGRect& r = q->destinationRect();
                out << " image " << imageName(view, q->texture().get())
                    << point(r.origin.x, r.origin.y) << point(r.size.width, r.size.height);
            } else if (const auto* s = dynamic_cast<const HXDScreenspaceQuad*>(p.get())) {
                out << " band" << point(s->frame().origin.x, s->frame().origin.y)
                    << point(s->frame().size.width, s->frame().size.height) << colour(s->color());
            } else if (const auto* t = dynamic_cast<const HXDText*>(p.get())) {
                out << " text \"" << t->string() << "\"" << point(t->position().x, t->position().y)
                    << colour(t->attributes().color);
            } else {
                out << " other";
            }
            out << "\n";
        }
        return out.str();
    }

    // The last frame against the recorded baseline `name`, after `before` (an earlier frame).
    ::testing::AssertionResult frameMatches(const std::string& name,
                                            const std::string& before = "") const {
        return matchesBaseline(name, before + frameText(), "src/view/tests/baselines");
    }

    // What the view shows and asked for: its volume, its display range, the cursors it set
    // (each change once) and its hiding and showing of the cursor, whether it waits to zoom to
    // fit, and the controller's requests (horizontal offsets, pans, selection and volume
    // changes).
    std::string viewText() {
        std::ostringstream out;
        out.precision(5);
        const CGRect& v = view.getCurrentViewVolume();
        out << "volume " << v.origin.x << " " << v.origin.y << " " << v.size.width << " "
            << v.size.height << ", range " << CMTimeGetSeconds(view.getDisplayRange().start) << " "
            << CMTimeGetSeconds(view.getDisplayRange().duration) << ", cursors";
        for (size_t i = 0; i < viewHost.cursors().size(); ++i)
            if (i == 0 || viewHost.cursors()[i] != viewHost.cursors()[i - 1])
                out << " " << static_cast<int>(viewHost.cursors()[i]);
        out << (viewHost.hiding().empty() ? "" : " hiding ") << viewHost.hiding()
            << (view.needsAutoZoom() ? ", zoom due" : "")
            << (view.fourCornerBoxInitialized() ? ", box" : "") << ", offsets";
        for (double o : range().offsets) out << " " << o;
        out << ", pans";
        for (double p : range().panned) out << " " << p + 0.0;
        out << ", selection changes " << range().selectionChanges << ", volume changes "
            << range().volumeChanges;
        return out.str();
    }

    // ---- Gestures ----
    RWEvent mouseAt(RWEventType type, const CGPoint& world, uint64_t mods,
                    int64_t clicks = 1) const {
        return RWEvent::mouseEvent(type, view.getPointScreen(world), mods, clicks);
    }
    // A gesture as a script: "d t v", "m t v" (a drag step past the gate), "q t v" (one
    // inside it), "u t v", "c t v" (a click), "2 t v" (a double click), each point followed by
    // its modifiers if any: s Shift, o Option, c Command, x Control; "r t v" a right click
    // on a fresh frame (notes the menu it answers); "k" and "K" press and release the space
    // bar, "R" repeats its key, "z" turns auto-zoom off, "g" puts moves on the 1/30 s grid,
    // "f" draws a frame, "b" takes the box tool, "S" the sketch tool with every item selected, "a name:" sends a key map's action
    // (notes one the view does not know), "D" detaches the controller. Steps are separated by
    // "|".
    void gesture(const std::string& script) {
        std::istringstream in(script);
        for (std::string step; std::getline(in, step, '|');) {
            std::istringstream words(step);
            char op = 0;
            double t = 0, v = 0;
            std::string mods;
            if (words >> op && op == 'a') {
                struct KeySender final : RWActionSender {
                    int64_t tag() const override { return 0; }
                } sender;
                words >> mods;
                if (!view.performAction(mods, sender)) notes.append("unknown ").append(mods) += ' ';
                continue;
            }
            words >> t >> v >> mods;
            uint64_t m = 0;
            for (char c : mods)
                m |= c == 's' ? kShift : c == 'o' ? kOption : c == 'c' ? kCommand : kControl;
            const CGPoint p = CGPointMake(t, v);
            if (op == 'd' || op == 'c' || op == '2')
                view.mouseDown(mouseAt(RWEventType::LeftMouseDown, p, m, op == '2' ? 2 : 1));
            if (op == 'm' || op == 'q') {
                clock.advance(op == 'm' ? kStepSeconds : 0.01);
                view.mouseDragged(mouseAt(RWEventType::LeftMouseDragged, p, m));
            }
            if (op == 'u' || op == 'c' || op == '2')
                view.mouseUp(mouseAt(RWEventType::LeftMouseUp, p, m));
            if (op == 'k') view.customKeyEquivalent(RWEvent::keyEvent(RWEventType::KeyDown, " "));
            if (op == 'K') view.keyUp(RWEvent::keyEvent(RWEventType::KeyUp, " "));
            if (op == 'R') view.keyDown(RWEvent::keyEvent(RWEventType::KeyDown, " ", 0, 0, true));
            if (op == 'z') view.setAutoZoom(0);
            if (op == 'f') frame();
            if (op == 'g') range().onGrid = true;
            if (op == 'D') view.setController(nullptr);
            if (op == 'b') ctrl().setCurrentTool(TQTool::kBox);
            if (op == 'S') {
                ctrl().setCurrentTool(TQTool::kSketch);
                for (const auto& i : items) i->select(1);
            }
            if (op == 'r') {
                frame();
                const RWMenuPtr menu =
                    view.menuForEvent(mouseAt(RWEventType::RightMouseDown, p, m));
                notes.append("menu ").append(menu == ctrl().getKeyframeMenu()  ? "keypoint"
                                             : menu == ctrl().getTangentMenu() ? "tangent"
                                             : menu == ctrl().getCurveMenu()   ? "curve"
                                             : menu == ctrl().getDefaultMenu() ? "default"
                                                                               : "none") += ' ';
            }
        }
    }

    HXDRecordingEncoder encoder{800, 400};
    std::string notes;  // what gesture() saw on the way
};

}  // namespace view_test
