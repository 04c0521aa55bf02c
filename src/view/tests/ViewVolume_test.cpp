// The view volume: conversions through the last frame, zoom, pan, the wheel, auto-zoom,
// framing and the resets, with the words they post.

#include <cmath>
#include <sstream>

#include "src/view/tests/ViewFixture.h"
#include "tests/support/StepScript.h"

namespace view_test {
namespace {

class ViewVolume : public ViewFixture {
protected:
    // Runs view operations: "zoom fx fy" (by factors, about the centre), "drag dx dy" (a zoom
    // by a pointer drag about "at x y", in pixels), "pan dx dy" (pixels), "draw", "wheel n" (n
    // wheel events of a line queued behind one, and a key), "frame all|values", "auto", "due",
    // "reset", "resetpan", "scale s" (the backing scale), "A: 1=0 2=1" (an enabled item with its
    // mapping, as the draw pass leaves it), "off A", and "clean" A's curve. Noted on the way:
    // "screen t v", "world x y", "size x y" and "snap t v" (conversions through the last
    // frame), "dirty" (A's curve) and "?" (the volume). Answers the notes, then the volume, the
    // zoom factors (of the volume, then of the grid), the posted words (as bracketText has
    // them) and the requests to the controller (horizontal offsets, pans):
    // "x y w h *zx *zy #gz !word >offset ~pan".
    std::string run(const std::string& script) {
        tests_support::StepArgs a;
        const auto N = [&](size_t i) { return a.number(i); };
        std::ostringstream out;
        out.precision(5);
        const auto point = [&](const CGPoint& p) { out << p.x << " " << p.y << " / "; };
        const auto volume = [&](const char* after) {
            const CGRect& v = view.getCurrentViewVolume();
            out << v.origin.x << " " << v.origin.y << " " << v.size.width << " " << v.size.height
                << after;
        };
        const tests_support::Steps steps = {
            {"zoom", [&] { view.zoomWithFactor(N(0), N(1)); }},
            {"at", [&] { view.setMouseOrigin(CGPointMake(N(0), N(1))); }},
            {"drag", [&] { view.zoom(N(0), N(1)); }},
            {"pan", [&] { view.pan(N(0), N(1)); }},
            {"page", [&] { view.panWithPage(N(0), N(1)); }},
            {"draw", [&] { view.drawProjection(); }},
            {"wheel",
             [&] {
                 for (int i = 0; i < N(0); ++i)
                     viewHost.queueEvent(RWEvent::scrollWheelEvent(-1, 1));
                 viewHost.queueEvent(RWEvent::keyEvent(RWEventType::KeyDown, "x"));
                 view.scrollWheel(RWEvent::scrollWheelEvent(0.0, 1.0));
                 out << "queued " << viewHost.queuedCount() << " / ";
             }},
            {"frame", [&] { view.frameAll(a.rest == "all"); }},
            {"auto", [&] { view.performAutoZoom(false); }},
            {"due", [&] { view.setNeedsAutoZoom(1); }},
            {"reset", [&] { view.resetZoom(); }},
            {"resetpan", [&] { view.resetPan(); }},
            {"clear", [&] { recorder.clearCalls(); }},
            {"off", [&] { item(a.rest)->enableItem(0); }},
            {"?", [&] { volume(" / "); }},
            {"screen", [&] { point(view.getPointScreen(CGPointMake(N(0), N(1)))); }},
            {"world", [&] { point(view.getPointWorld(CGPointMake(N(0), N(1)))); }},
            {"size", [&] { point(view.getSizeWorld(CGPointMake(N(0), N(1)))); }},
            {"snap", [&] { point(view.adjustWorldPointToScreen(CGPointMake(N(0), N(1)))); }},
            {"scale",
             [&] {
                 viewHost.setBackingScaleFactor(N(0));
                 view.viewDidChangeBackingProperties();
             }},
            {"clean", [&] { item("A")->setOriginalCurveDirty(0); }},
            {"dirty", [&] { out << (item("A")->originalCurveDirty() ? "dirty / " : "clean / "); }},
        };
        tests_support::runSteps(script, a, steps, [&](const std::string& name) {
            build(name + " " + a.rest);
            item(name.substr(0, name.size() - 1))->enableItem(1);
            view.computeVerticalTickMarks();
        });
        volume("");
        out << " *" << view.zoomX() << " *" << view.zoomY() << " #" << view.gridZoomY() << " "
            << recorder.bracketText() << " ";
        for (double o : range().offsets) out << ">" << o << " ";
        for (double p : range().panned) out << "~" << p << " ";
        out << "v" << range().volumeChanges;
        return out.str();
    }
};

// From the fixture's 0..10 s by -1..1 on 800 x 400 pixels; what each answers is recorded in
// baselines/volume.txt.
TEST_F(ViewVolume, operations__table) {
    const struct {
        const char* what;
        const char* script;
    } cases[] = {
        {"vertical zoom clamps at 128 about the centre", "zoom 1 1000"},
        {"and at 1/128", "zoom 1 0.001"},
        {"x zoom about the reference centre", "zoom 2 1"},
        // Wider in time, taller in value, about the pointer at (200, 100) px = (2.5, -0.5).
        {"a drag zoom keeps the anchor under the pointer", "at 200 100; drag 40 -40"},
        // The factor would reach 200: the height stays, the anchor keeps its fraction.
        {"a drag zoom past the limit", "zoom 1 100; draw; at 200 100; drag 0 -200"},
        {"pan and back", "pan -160 0; draw; pan -80 -40; ?; draw; pan 80 40"},
        // A twentieth of a page is half a second: the range moves, as it stays after time zero.
        {"a page in time", "page 0.05 0"},
        {"a pan that would reach time zero moves only y", "pan 80 40"},
        // Four events of a line, four pixels a line: 16 px of 400 up, and the three queued
        // ones sideways 12 px of 800; only wheel events taken.
        {"queued wheel events fold into one pan", "wheel 3"},
        // One keypoint each at 2 s: the display range widened by 5 % on each side; the
        // factor is taken before the padding.
        {"frame all on single keypoints", "A: 2=3; B: 2=5; zoom 1 4; clear; frame all"},
        {"frame all spans enabled items only", "A: 1=0 2=1; B: 3=0; Off: 9=0; off Off; frame all"},
        {"frame all never changes the height for one flat curve",
         "Flat: 1=0.5 4=0.5; frame values"},
        // 0..100 needs a factor of 1/50, short of the limit; the draw pass calls it: no word.
        {"auto-zoom only when due", "A: 1=0 2=100; auto; ?; due; auto"},
        // The curve would need 1/50,000: the height stops at 128 times the fixture's, padded.
        {"auto-zoom clamps at 1/128", "A: 1=0 2=100000; due; auto"},
        {"reset zoom", "zoom 2 4; draw; pan -80 -40; clear; reset"},
        {"reset pan keeps the zoom", "zoom 1 2; draw; pan -80 -40; clear; resetpan"},
        // 5.0031 s lies at 400.248 px: it snaps back to the pixel at 400.
        {"conversions through the last frame",
         "screen 5 0; world 800 400; size 80 40; snap 5.0031 0"},
        // The zoom shows only when drawn, and has every curve fetched again.
        {"a zoom is seen once drawn",
         "A: 1=0; clean; zoom 1 2; screen 5 .5; dirty; draw; screen 5 .5"},
        {"drawable pixels, twice as many at a backing scale of 2", "scale 2; screen 5 0"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        TearDown();
        items.clear();
        SetUp();
        view.resetZoom();  // the view outlives the fixture's set-up
        recorder.clearCalls();
        EXPECT_TRUE(tests_support::matchesBaselineBlock("volume", c.what, run(c.script) + "\n",
                                                        "src/view/tests/baselines"));
    }
}

// Before the first frame conversions are not numbers, and snapping invents none; a change of
// tool redraws and posts its word.
TEST_F(ViewVolume, no_frame_and_a_tool_change) {
    TQCurveEditorViewBase fresh;
    fresh.setViewHost(&viewHost);
    fresh.setCurrentViewVolume(CGRectMake(0, 0, 1, 1));
    EXPECT_TRUE(std::isnan(fresh.getPointWorld(CGPointMake(10, 10)).x) &&
                std::isnan(fresh.getPointScreen(CGPointMake(0.5, 0.5)).y) &&
                std::isnan(fresh.adjustWorldPointToScreen(CGPointMake(0.5, 0.5)).x));
    fresh.setAllOriginalCurveDirty(1);  // no controller: no items to mark
    fresh.setAllOriginalCurveScaleDirty(1);
    viewHost.resetRedrawRequests();
    ctrl().setCurrentTool(TQTool::kBox);
    EXPECT_EQ(std::pair(recorder.bracketText(), viewHost.redrawRequests()),
              std::pair(std::string("!4000008"), 1));
}

}  // namespace
}  // namespace view_test
