// The vertical mapping: how each channel's values land on the view's shared world y.
//
// Each item gets a scale and an offset (a label at world y reads offsetY + scaleY * y) so
// that its curve, padded by 5 percent, spans a whole number of tick steps of the view.
// Items are scaled once and keep their mapping across edits until something marks them with
// setUpdateScale: a curve being dragged must not rescale under the pointer.

#include <cmath>

#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelTypes.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/data/TQCurveEditorItem.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

// Share of the extent added above and below a curve.
constexpr double kExtentPadding = 0.05;

// A channel that sets no tick step lets the view choose: one unit.
double tickStepOf(const TQChannel& channel) {
    const double t = channel.getInfo()->tickStep;
    return (t > 0.0 && std::isfinite(t)) ? t : 1.0;
}

void rangeOf(const TQChannel& channel, double* lo, double* hi) {
    channel.getImpl()->getRangeMin(lo);
    channel.getImpl()->getRangeMax(hi);
}

}  // namespace

void TQCurveEditorViewBase::computeVerticalTickMarks() {
    if (!_controller || _controller->numberOfRootItems() == 0) return;
    _printScale = _controller->numberOfDisplayedChannels() == 1 ? 1 : 0;

    const double T = numberOfTickMarks();
    const double S = _gridSpacingY;
    const double Z = _zoomFactorY;
    // Without a label step (a view that draws no grid) or a usable zoom there is no tick to
    // fit: such a view shows values as they are (scale 1, offset 0), and the items stay
    // marked so that they are fitted once there is a grid.
    const bool unfitted = !(S > 0.0) || !(T > 0.0) || !(Z > 0.0) || !std::isfinite(S * T / Z);

    const uint32_t count = _controller->numberOfChannelItems();
    for (uint32_t i = 0; i < count; ++i) {
        auto set = _controller->selectedCurveSet();
        if (!set) break;
        TQCurveEditorItemPtr item = set->channeItemAtIndex(i);
        if (!item) continue;
        TQChannel* channel = item->channel();
        if (!channel) break;  // the walk ends at the first item whose channel is gone
        auto* channelItem = dynamic_cast<TQCurveEditorChannelItem*>(item.get());
        if (!channelItem || !channelItem->updateScale()) continue;
        if (unfitted) {
            channelItem->setScaleY(1.0);
            channelItem->setOffsetY(0.0);
            continue;
        }

        const double conv = channelItem->conversionFactor();
        const double t = tickStepOf(*channel);

        // Curve-shaped and opaque data have no value worth a label.
        if (dynamic_cast<TQChannelCurve*>(channel) || dynamic_cast<TQChannelBlindData*>(channel))
            _printScale = 0;

        // The extent, in displayed units. A compound spans all of its components, each in the
        // first component's units.
        const bool compound = channelItem->isCompound();
        std::vector<TQCurveEditorChannelItem*> componentItems;
        TQChannel* rangeChannel = channel;
        double hi = 0.0;
        double lo = 0.0;
        if (compound) {
            const std::vector<TQChannelBase*> components = channelItem->compoundChannelComponents();
            double f = conv;
            if (!components.empty()) {
                if (auto* first = dynamic_cast<TQCurveEditorChannelItem*>(
                        set->itemWithChannel(components[0]).get()))
                    f = first->conversionFactor();
                if (auto* firstChannel = dynamic_cast<TQChannel*>(components[0]))
                    rangeChannel = firstChannel;
            }
            hi = -HUGE_VAL;
            lo = HUGE_VAL;
            for (TQChannelBase* component : components) {
                auto* componentItem =
                    dynamic_cast<TQCurveEditorChannelItem*>(set->itemWithChannel(component).get());
                if (!componentItem) continue;
                componentItems.push_back(componentItem);
                hi = std::fmax(hi, f * componentItem->maxY());
                lo = std::fmin(lo, f * componentItem->minY());
            }
            if (componentItems.empty()) {  // no component is shown: the item's own extent
                hi = conv * channelItem->maxY();
                lo = conv * channelItem->minY();
            }
        } else {
            hi = conv * channelItem->maxY();
            lo = conv * channelItem->minY();
        }

        double scale = 0.0;
        double offset = 0.0;
        if (std::fabs(hi - lo) < kTQZeroTolerance && !_hasFixedScale) {
            // Flat: two tick steps above and below the initial value, labels on its step.
            const double c = channel->getInitialValue() * conv;
            const double half = (2.0 * t * S / Z) * conv;
            const double a = c + half;
            const double b = c - half;
            const double pad = std::fabs(a - b) * kExtentPadding;
            hi = a + pad;
            lo = b - pad;
            scale = t * conv / Z;
            offset = c - std::remainder(c, S * scale);
        } else {
            if (_hasFixedScale) {
                double rmin = 0.0;
                double rmax = 0.0;
                rangeOf(*rangeChannel, &rmin, &rmax);
                hi = conv * rmax;
                lo = conv * rmin;
            }
            const double pad = std::fabs(hi - lo) * kExtentPadding;
            hi += pad;
            lo -= pad;
            const double base = std::floor(lo);
            const double span = std::ceil(hi) - base;
            double s = t * T * S * conv / Z;
            const double r0 = (span == 0.0 ? 1.0 : span) / s;
            if (r0 < 1.0 && r0 > 0.0) {
                // Halve the step until the span needs at least one of it.
                double r = r0;
                int n = -1;
                while (r < 1.0) {
                    r *= 2.0;
                    ++n;
                }
                s = s / std::exp2(n);
            } else {
                s = s * std::ceil(r0);
            }
            // The span goes up to a whole multiple of T.
            const double q = s / T;
            s = s + (std::ceil(q) - q) * T;
            scale = s / (S * T);
            offset = base + s * 0.5;
        }

        // The channel's full range takes over when it is no larger than the padded extent.
        double m0 = 0.0;
        double m1 = 0.0;
        rangeOf(*channel, &m0, &m1);
        m0 *= conv;
        m1 *= conv;
        const double rangePad = std::fabs(m1 - m0) * kExtentPadding;
        const double rangeHigh = m1 + rangePad;
        const double rangeLow = m0 - rangePad;
        const double R = rangeHigh - rangeLow;
        if (R <= hi - lo && std::fabs(R) >= kTQZeroTolerance) {
            _gridScaleY = R / (S * T) / Z;
            // The factor 2 does not follow the number of tick marks; it never has.
            _gridOffsetY = rangeLow + _gridScaleY * 2.0 * S;
        } else {
            _gridScaleY = scale;
            _gridOffsetY = offset;
        }

        channelItem->setScaleY(_gridScaleY);
        channelItem->setOffsetY(_gridOffsetY);
        channelItem->setUpdateScale(0);
        for (TQCurveEditorChannelItem* componentItem : componentItems) {
            componentItem->setScaleY(_gridScaleY);
            componentItem->setOffsetY(_gridOffsetY);
            componentItem->setUpdateScale(0);
        }
    }
}
