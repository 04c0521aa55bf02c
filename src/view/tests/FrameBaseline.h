#pragma once
// Frames compared with recorded text baselines. frameText writes one line per primitive of the
// view's last frame, in drawing order: its kind, hit word, item id and keyframe, and what the
// eye sees of it (places in world units, colours, images by name, strings). Colours of items
// come from a process-wide counter: reset it (TQCurveEditorItem::resetColorIndex) first. A baseline is a
// checked-in file, tests/baselines/<name>.txt beside this header, compared line by line.
//
// To record or re-record: run the test with VCE_RECORD_BASELINES=1 in the environment; it
// writes the files instead of comparing. Review the diff before committing it.

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <functional>
#include <sstream>
#include <string>
#include <vector>

#include "platform/draw/HXDPrimitives.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace view_test {

// Names an image of the view's tables: "key c/state/selected" or "tangent".
inline std::string imageName(const TQCurveEditorViewBase& view, const HXDPixelTexture* texture) {
    if (!texture) return "none";
    if (texture == view.tangentAsset().texture.get()) return "tangent";
    for (uint32_t c = 0; c < 8; ++c)
        for (uint32_t state = 0; state < 4; ++state)
            for (uint32_t selected = 0; selected < 2; ++selected)
                if (view.keyframeAsset(c, state, selected).texture.get() == texture)
                    return "key " + std::to_string(c) + "/" + std::to_string(state) + "/" +
                           std::to_string(selected);
    return "other";
}

// Items are named by `nameOfId` (channel ids differ from run to run), keyframes by their index
// in `handles`.
inline std::string frameText(const TQCurveEditorViewBase& view,
                             const std::function<std::string(int64_t)>& nameOfId,
                             const std::vector<TQKeyframeHandle>& handles) {
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
        if (const HXDNumber* id = extra.objectForKey("ID"))
            out << " " << nameOfId(id->integerValue());
        if (const HXDNumber* h = extra.objectForKey("Handle")) {
            const auto key = reinterpret_cast<TQKeyframeHandle>(h->unsignedLongLongValue());
            for (size_t i = 0; i < handles.size(); ++i)
                if (handles[i] == key) out << " key#" << i;
        }
        if (const HXDBlendingInfo& b = p->blendingInfo(); !(b == HXDBlendingInfo{})) {
            std::snprintf(buf, sizeof buf, " blend(%d %d%d %d%d %d%d)", b.enabled,
                          int(b.rgbOperation), int(b.alphaOperation), int(b.sourceRGB),
                          int(b.destinationRGB), int(b.sourceAlpha), int(b.destinationAlpha));
            out << buf;
        }
        if (const auto* m = dynamic_cast<const HXDMultiline*>(p.get())) {
            const auto& v = m->vertices();
            out << (dynamic_cast<const HXDLine*>(p.get()) ? " line" : " multiline")
                << " n=" << v.size() << " runs=" << m->numberOfRuns() << " w=" << m->width();
            if (m->stippled()) {
                std::snprintf(buf, sizeof buf, " stipple=%x", m->stipplePattern());
                out << buf;
            }
            if (m->loop()) out << " loop";
            // Ends and three inner vertices stand for the shape.
            for (size_t k : {size_t{0}, v.size() / 4, v.size() / 2, 3 * v.size() / 4, v.size() - 1})
                if (k < v.size()) out << point(v[k].start.x, v[k].start.y);
            if (!v.empty()) out << colour(v.front().color) << colour(v.back().color);
        } else if (const auto* q = dynamic_cast<const HXDQuadTexture*>(p.get())) {
            const CGRect& r = q->destinationRect();
            out << " image " << imageName(view, q->texture().get()) << point(r.origin.x, r.origin.y)
                << point(r.size.width, r.size.height);
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

// Compares `text` with the baseline `name` in `folder` of the repository, or records it (see
// the top of this file).
inline ::testing::AssertionResult matchesBaseline(
    const std::string& name, const std::string& text,
    const std::string& folder = "src/view/tests/baselines") {
    const char* root = std::getenv("VCE_SOURCE_DIR");
    const std::string path = std::string(root ? root : ".") + "/" + folder + "/" + name + ".txt";
    if (std::getenv("VCE_RECORD_BASELINES")) {
        std::ofstream(path) << text;
        return ::testing::AssertionSuccess() << "recorded " << path;
    }
    std::ifstream file(path);
    if (!file) return ::testing::AssertionFailure() << "no baseline " << path << ": record it";
    std::istringstream got(text);
    std::string want, have;
    for (int line = 1;; ++line) {
        const bool w = static_cast<bool>(std::getline(file, want));
        const bool h = static_cast<bool>(std::getline(got, have));
        if (!w && !h) return ::testing::AssertionSuccess();
        if (w != h || want != have)
            return ::testing::AssertionFailure()
                   << name << " line " << line << "\n  want: " << (w ? want : "(end)")
                   << "\n  have: " << (h ? have : "(end)");
    }
}

}  // namespace view_test
