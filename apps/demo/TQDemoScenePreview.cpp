#include "apps/demo/TQDemoScenePreview.h"

#include <QPainter>
#include <QPainterPath>

#include <algorithm>
#include <cmath>

#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelRef.h"

namespace {

constexpr TQNotificationWord kRepaintWords = kTQNotifyHostTimeChanged | kTQNotifyTimeChanged |
                                             kTQNotifyChannelsChanging | kTQNotifyChannelsChanged |
                                             kTQNotifyCurvesInvalidated | kTQNotifySceneChanged |
                                             kTQNotifySceneReset;

// A colour per object, after the curve colours' hues.
QColor colourOf(size_t index) {
    static const QColor colours[] = {QColor(240, 200, 80), QColor(90, 180, 240),
                                     QColor(230, 110, 150), QColor(120, 210, 130)};
    return colours[index % std::size(colours)];
}

}  // namespace

TQDemoScenePreview::TQDemoScenePreview(TQHostAppDelegate& host, QWidget* parent)
    : QWidget(parent), _host(host) {
    setAttribute(Qt::WA_OpaquePaintEvent);
    _host.addNotificationReceiver(this);
}

TQDemoScenePreview::~TQDemoScenePreview() { _host.removeNotificationReceiver(this); }

void TQDemoScenePreview::notify(TQNotificationWord word) {
    if (word & kRepaintWords) update();
}

TQDemoScenePreview::Pose TQDemoScenePreview::poseOf(const TQChannelObjectRootBase& object) const {
    const TQHostObjectFamily family = _host.scene().family();
    const CMTime now = _host.currentTime();
    // The channel's value now (in its own time), or the fallback without such a channel.
    auto value = [&](TQHostProperty property, size_t axis, double fallback) {
        const std::vector<BNString>& paths = TQHostPropertyPaths(family, property);
        if (axis >= paths.size()) return fallback;
        const auto* channel = dynamic_cast<const TQChannel*>(
            TQChannelRef(paths[axis]).getChannel(static_cast<const TQChannelBase*>(&object)));
        if (!channel) return fallback;
        const double v = channel->getValueAsDouble(channel->toChannelTime(&now));
        return std::isfinite(v) ? v : fallback;
    };
    Pose p;
    p.x = value(TQHostProperty::Position, 0, 0.0);
    p.y = value(TQHostProperty::Position, 1, 0.0);
    p.scaleX = value(TQHostProperty::Scale, 0, 1.0);
    p.scaleY = value(TQHostProperty::Scale, 1, 1.0);
    // The turn in the picture's plane: the last angle of the rotation.
    p.rotation = value(TQHostProperty::Rotation,
                       TQHostPropertyPaths(family, TQHostProperty::Rotation).size() - 1, 0.0);
    p.shearX = value(TQHostProperty::Shear, 0, 0.0);
    p.shearY = value(TQHostProperty::Shear, 1, 0.0);
    p.pivotX = value(TQHostProperty::Pivot, 0, 0.0);
    p.pivotY = value(TQHostProperty::Pivot, 1, 0.0);
    p.opacity = std::clamp(value(TQHostProperty::Opacity, 0, 1.0), 0.0, 1.0);
    return p;
}

void TQDemoScenePreview::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.fillRect(rect(), QColor(18, 18, 20));
    // The picture, as large as fits, centred.
    const double fit = std::min(width() / kPictureWidth, height() / kPictureHeight);
    const QRectF picture((width() - kPictureWidth * fit) / 2.0,
                         (height() - kPictureHeight * fit) / 2.0, kPictureWidth * fit,
                         kPictureHeight * fit);
    painter.fillRect(picture, Qt::black);
    painter.setClipRect(picture);
    painter.setRenderHint(QPainter::Antialiasing);

    const std::vector<TQChannelObjectRootBase*> objects = _host.scene().objects();
    // The first object on top: drawn last.
    for (size_t i = objects.size(); i-- > 0;) {
        const TQChannelObjectRootBase& object = *objects[i];
        const Pose pose = poseOf(object);
        if (pose.opacity <= 0.0) continue;
        painter.save();
        // Picture units, centre origin, y up; then the object's transform about its pivot.
        painter.translate(picture.center());
        painter.scale(fit, -fit);
        painter.translate(pose.x, pose.y);
        painter.rotate(pose.rotation * 180.0 / M_PI);
        painter.shear(pose.shearY, pose.shearX);
        painter.scale(pose.scaleX, pose.scaleY);
        painter.translate(-pose.pivotX, -pose.pivotY);
        painter.setOpacity(pose.opacity);
        const QColor colour = colourOf(i);
        const std::string& name = object.getName();

        // Text is drawn upright: y is flipped back around its box.
        auto text = [&](const QRectF& box, double size, const QColor& c) {
            painter.save();
            painter.translate(0.0, box.center().y() * 2.0);
            painter.scale(1.0, -1.0);
            QFont font = painter.font();
            font.setPixelSize(static_cast<int>(size));
            font.setBold(true);
            painter.setFont(font);
            painter.setPen(c);
            painter.drawText(box, Qt::AlignCenter, QString::fromStdString(name));
            painter.restore();
        };
        if (name == kTQHostSampleQuaternionObject) {
            // A backdrop larger than the picture, with bands that show its drift and turn.
            const QRectF back(-1100.0, -650.0, 2200.0, 1300.0);
            painter.fillRect(back, QColor(34, 38, 58));
            painter.setPen(QPen(QColor(60, 68, 100), 6.0));
            for (double x = -1100.0; x <= 1100.0; x += 160.0)
                painter.drawLine(QPointF(x, -650.0), QPointF(x, 650.0));
        } else if (name == kTQHostSampleBehaviorObject) {
            // A disc with a notch, so that its turn shows.
            painter.setBrush(colour);
            painter.setPen(Qt::NoPen);
            painter.drawEllipse(QPointF(0.0, 0.0), 90.0, 90.0);
            painter.setBrush(QColor(18, 18, 20));
            painter.drawRect(QRectF(-12.0, 40.0, 24.0, 55.0));
        } else if (name == kTQHostSampleOffsetObject) {
            const QRectF bar(-420.0, -55.0, 840.0, 110.0);
            painter.fillRect(bar, colour.darker(140));
            text(bar, 60.0, Qt::white);
        } else if (name == kTQHostSampleTitleObject) {
            text(QRectF(-700.0, -120.0, 1400.0, 240.0), 200.0, colour);
        } else {
            const QRectF box(-160.0, -80.0, 320.0, 160.0);
            painter.setBrush(colour.darker(150));
            painter.setPen(QPen(colour, 6.0));
            painter.drawRoundedRect(box, 24.0, 24.0);
            text(box, 48.0, Qt::white);
        }
        painter.restore();
    }
    painter.setClipping(false);
    painter.setPen(QColor(70, 70, 74));
    painter.drawRect(picture.adjusted(0.0, 0.0, -1.0, -1.0));
}
