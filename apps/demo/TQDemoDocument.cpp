#include "apps/demo/TQDemoDocument.h"

#include <algorithm>
#include <filesystem>
#include <vector>

#include "apps/demo/TQDemoInspector.h"
#include "host/TQHostDenseScene.h"
#include "host/TQHostSampleScene.h"

namespace {

// Marks the document's own replacement of the scene for as long as it runs.
class LoadingScope {
public:
    explicit LoadingScope(bool& flag) : _flag(flag) { _flag = true; }
    ~LoadingScope() { _flag = false; }
    LoadingScope(const LoadingScope&) = delete;
    LoadingScope& operator=(const LoadingScope&) = delete;

private:
    bool& _flag;
};

constexpr TQHostObjectFamily kFamily = TQHostObjectFamily::Kestrel;

}  // namespace

TQDemoDocument::TQDemoDocument(TQHostAppDelegate& host, TQCurveEditorCtrl& controller,
                               TQCurveEditorView& view)
    : _host(host), _controller(controller), _view(view), _project(host) {
    _host.addNotificationReceiver(this);
}

TQDemoDocument::~TQDemoDocument() { _host.removeNotificationReceiver(this); }

std::string TQDemoDocument::displayName() const {
    return isUntitled() ? std::string("Untitled")
                        : std::filesystem::path(_path).filename().string();
}

bool TQDemoDocument::isModified() const {
    return _sceneChanged || _host.undoStack().position() != _savedPosition ||
           customSetsForm() != _savedSets;
}

// ---- Loading and saving ---------------------------------------------------------------------

void TQDemoDocument::loadSample() {
    {
        const LoadingScope loading(_loading);
        _project.newDocument(kFamily);
        TQHostLoadSampleScene(_host, kFamily);
        TQDemoSeedOverRangeCurves(_host);
        // The title and the bouncing logo: the piece's two busiest objects.
        _host.setSelectedObjects({_host.scene().objectNamed(kTQHostSampleTitleObject),
                                  _host.scene().objectNamed(kTQHostSampleBehaviorObject)});
    }
    _path.clear();
    markSaved();
}

void TQDemoDocument::loadStress() {
    {
        const LoadingScope loading(_loading);
        _project.newDocument(kFamily);
        TQHostLoadDenseScene(_host, kFamily, TQHostStressSceneLayout());
        const std::vector<TQChannelObjectRootBase*> objects = _host.scene().objects();
        const std::vector<TQChannelBase*> firstTwo(
            objects.begin(), objects.begin() + std::min<std::ptrdiff_t>(2, std::ssize(objects)));
        _host.setSelectedObjects(firstTwo);
    }
    _path.clear();
    markSaved();
}

void TQDemoDocument::newDocument() {
    {
        const LoadingScope loading(_loading);
        _project.newDocument(kFamily);
        editorFollowsDocument();
    }
    _path.clear();
    markSaved();
}

std::optional<BNSerializerError> TQDemoDocument::open(const std::string& path) {
    {
        const LoadingScope loading(_loading);
        if (std::optional<BNSerializerError> error = _project.open(path)) return error;
        editorFollowsDocument();
    }
    _path = path;
    markSaved();
    return std::nullopt;
}

std::optional<BNSerializerError> TQDemoDocument::saveAs(const std::string& path) {
    collectEditorState();
    _controller.saveCurveSets(&_project.curveSets());
    if (std::optional<BNSerializerError> error = _project.save(path)) return error;
    _path = path;
    // The file is of the present version now, whatever version it was opened from.
    _host.setVersion(TQHostAppDelegate::kDocumentVersion);
    markSaved();
    return std::nullopt;
}

void TQDemoDocument::editorFollowsDocument() {
    // The sets of the document that was open go; the list names the shown set anew.
    _controller.removeAllCurveSets();
    _controller.constructCurveSets();
    _controller.refreshPopUp();
    applyEditorState();
}

void TQDemoDocument::applyEditorState() {
    const TQCurveEditorState& state = _project.editorState();
    _view.setAutoZoom(state.autoZoom() ? 1 : 0);
    _view.setSnapCursor(state.snapping() ? 1 : 0);
    _view.setLockKeyframesInU(state.lockKeyframesInTime() ? 1 : 0);
    _view.setShowAudio(state.displayAudioWaveform() ? 1 : 0);
    _controller.setSnapshotChannels(state.snapshotChannels());
    // The horizontal part of the view is the host's display range, which the document set.
    const CMTimeRange range = _host.displayRange();
    _view.setTotalRange(&range.start, &range.duration);
    _view.setInitialTime(&range);
    _view.setDisplayRange(&range.start, &range.duration);
    _controller.updateUI();
}

void TQDemoDocument::collectEditorState() {
    TQCurveEditorState& state = _project.editorState();
    state.setAutoZoom(_view.autoZoom() != 0);
    state.setSnapping(_view.snapCursor() != 0);
    state.setLockKeyframesInTime(_view.lockKeyframesInU() != 0);
    state.setDisplayAudioWaveform(_view.showAudio() != 0);
    state.setSnapshotChannels(_controller.snapshotChannels());
    state.setCurrentViewVolume(BNRect<double>::fromCGRect(_view.getCurrentViewVolume()));
}

// ---- Modified -------------------------------------------------------------------------------

void TQDemoDocument::notify(TQNotificationWord word) {
    if (!_loading && (word & (kTQNotifySceneChanged | kTQNotifySceneReset))) _sceneChanged = true;
}

std::vector<TQDemoDocument::SavedSetForm> TQDemoDocument::customSetsForm() const {
    std::vector<SavedSetForm> forms;
    for (const TQCurveSetPtr& set : _controller.curveSets()) {
        if (!set) continue;
        SavedSetForm form{set->curveSetName(), set->isRelative(), {}};
        if (set->isRelative()) {
            // What a relative set shows follows the objects selected; its paths are the set.
            for (const TQChannelRef& ref : *set->references())
                form.members.emplace_back(ref.getText(), 0);
        } else {
            for (const TQCurveEditorItemPtr& item : set->allItems()) {
                const auto* channelItem = dynamic_cast<const TQCurveEditorChannelItem*>(item.get());
                if (channelItem && channelItem->channelRef())
                    form.members.emplace_back(channelItem->channelRef()->getText(),
                                              channelItem->colorIndex());
            }
        }
        forms.push_back(std::move(form));
    }
    return forms;
}

void TQDemoDocument::markSaved() {
    _savedPosition = _host.undoStack().position();
    _savedSets = customSetsForm();
    _sceneChanged = false;
}
