#include "host/internal/TQHostSceneLoading.h"

#include "host/TQHostAppDelegate.h"

void TQHostLoadBuiltScene(TQHostAppDelegate& host, TQHostObjectFamily family,
                          const CMTime& frameDuration, const CMTimeRange& displayRange,
                          const std::function<void(TQHostScene&)>& populate) {
    host.resetScene(family);
    host.setFrameDuration(frameDuration);
    host.setDisplayRange(displayRange);
    host.setPlayRange(displayRange);
    populate(host.scene());
    host.setCurrentTime(kCMTimeZero);
    if (!host.scene().objects().empty()) host.selectObject(host.scene().objects().front());
    host.undoStack().clear();
    host.resetModifiedChannels();
    host.postNotification(kTQNotifySceneChanged);
}
