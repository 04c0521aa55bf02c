#pragma once
// A small picture of the scene at the host's current time: each object drawn as a shape or a
// text where its channels put it, with its position, scale, rotation (about its pivot),
// shear and opacity read from them (behaviours included), so that an edited curve changes the
// motion as the piece plays.
//
// The picture is 1920 by 1080 units with the origin at its centre and y up, as the sample
// project is keyed, shown at the largest size that fits the widget. Objects are drawn in the
// order of the scene, the first on top. The sample's objects get their own looks (a title, a
// bouncing disc, a lower-third bar, a background); any other object is a labelled box.
//
// The preview hears the host's words and repaints on those that change what it shows. The
// host outlives it.

#include <QWidget>

#include "host/TQHostAppDelegate.h"

class TQDemoScenePreview final : public QWidget, public TQNotificationReceiver {
public:
    static constexpr double kPictureWidth = 1920.0;
    static constexpr double kPictureHeight = 1080.0;

    explicit TQDemoScenePreview(TQHostAppDelegate& host, QWidget* parent = nullptr);
    ~TQDemoScenePreview() override;

    QSize sizeHint() const override { return QSize(320, 180); }
    QSize minimumSizeHint() const override { return QSize(160, 90); }

    // What an object shows at the current time, from its channels.
    struct Pose {
        double x = 0.0, y = 0.0;
        double scaleX = 1.0, scaleY = 1.0;
        double rotation = 0.0;  // radians, counter-clockwise
        double shearX = 0.0, shearY = 0.0;
        double pivotX = 0.0, pivotY = 0.0;
        double opacity = 1.0;
    };
    Pose poseOf(const TQChannelObjectRootBase& object) const;

    void notify(TQNotificationWord word) override;

protected:
    void paintEvent(QPaintEvent* event) override;

private:
    TQHostAppDelegate& _host;
};
