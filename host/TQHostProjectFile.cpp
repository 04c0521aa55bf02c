#include "host/TQHostProjectFile.h"

#include <cstdio>
#include <filesystem>
#include <memory>

#include "host/TQHostAppDelegate.h"
#include "host/internal/TQHostProjectIO.h"
#include "host/internal/TQHostProjectScope.h"

struct TQHostProject::Loaded : tq_host::LoadedProject {};

TQHostProject::TQHostProject(TQHostAppDelegate& host)
    : _host(host),
      _state(std::make_unique<TQCurveEditorState>()),
      _curveSets(std::make_unique<TQCurveSetListSerializer>()) {
    _host.setCurveSetListSerializer(_curveSets.get());
}

TQHostProject::~TQHostProject() {
    if (_host.getCurveSetListSerializer() == _curveSets.get())
        _host.setCurveSetListSerializer(nullptr);
}

void TQHostProject::newDocument(TQHostObjectFamily family) {
    _host.resetScene(family);
    _host.setFrameDuration(CMTimeMake(1, 30));
    _host.setDisplayRange(CMTimeRangeMake(kCMTimeZero, CMTimeMake(10, 1)));
    _host.setPlayRange(_host.displayRange());
    _host.setFirstFrameNumber(0);
    _host.setStartTimecode(0);
    _host.setSecondsPerTextStep(CMTimeMake(1, 1));
    _host.setDisplayTimeAsFrames(false);
    _host.setCurrentTime(kCMTimeZero);
    _host.setVersion(TQHostAppDelegate::kDocumentVersion);
    _state = std::make_unique<TQCurveEditorState>();
    _curveSets = std::make_unique<TQCurveSetListSerializer>();
    _host.setCurveSetListSerializer(_curveSets.get());
    _host.postNotification(kTQNotifySceneChanged);
}

// ---- Writing ----------------------------------------------------------------------------

std::optional<BNSerializerError> TQHostProject::write(BNOutputSink& sink) {
    // The range the editor shows is the host's.
    _state->setDisplayRange(_host.displayRange());
    BNSerializerWriteStream stream(sink);
    tq_host::writeProject(stream, _host, *_state, *_curveSets);
    return stream.finish();
}

std::optional<BNSerializerError> TQHostProject::save(const std::string& path) {
    const std::string temporary = path + ".saving";
    std::FILE* file = std::fopen(temporary.c_str(), "wb");
    if (!file) return BNSerializerError{0, 0, "the file \"" + temporary + "\" cannot be written"};
    BNFileSink sink(file);
    std::optional<BNSerializerError> error = write(sink);
    if (std::fclose(file) != 0 && !error)
        error = BNSerializerError{0, 0, "the file \"" + temporary + "\" cannot be written"};
    std::error_code ec;
    if (!error) {
        std::filesystem::rename(temporary, path, ec);
        if (ec)
            error = BNSerializerError{0, 0, "\"" + path + "\" cannot be replaced: " + ec.message()};
    }
    if (error) std::filesystem::remove(temporary, ec);
    return error;
}

// ---- Reading ----------------------------------------------------------------------------

std::optional<BNSerializerError> TQHostProject::read(std::string_view document) {
    auto loaded = std::make_unique<Loaded>();
    auto error = tq_host::readProject(
        [document](BNSerializerReadStream& stream, BNSerializer& handler) {
            return stream.read(document, handler);
        },
        *loaded);
    return commit(std::move(error), std::move(loaded));
}

std::optional<BNSerializerError> TQHostProject::open(const std::string& path) {
    auto loaded = std::make_unique<Loaded>();
    auto error = tq_host::readProject(
        [&path](BNSerializerReadStream& stream, BNSerializer& handler) {
            return stream.readFile(path, handler);
        },
        *loaded);
    return commit(std::move(error), std::move(loaded));
}

std::optional<BNSerializerError> TQHostProject::commit(std::optional<BNSerializerError> error,
                                                       std::unique_ptr<Loaded> loaded) {
    if (error) return error;  // nothing of the document has been touched
    TQHostAppDelegate& host = _host;
    host.resetScene(loaded->family);
    for (auto& object : loaded->objects) host.scene().adoptObject(std::move(object));
    host.setFrameDuration(loaded->frameDuration);
    host.setDisplayRange(loaded->displayRange);
    host.setPlayRange(loaded->displayRange);
    host.setFirstFrameNumber(loaded->firstFrameNumber);
    host.setStartTimecode(loaded->startTimecode);
    host.setSecondsPerTextStep(loaded->secondsPerTextStep);
    host.setDisplayTimeAsFrames(loaded->displayTimeAsFrames);
    host.setCurrentTime(loaded->currentTime);  // also hands the time to the object roots
    std::vector<TQChannelBase*> selection;
    for (TQChannelId id : loaded->selection)
        if (TQChannelBase* object = host.scene().objectWithId(id)) selection.push_back(object);
    host.setSelectedObjects(selection);
    host.setVersion(loaded->version);
    _state = std::move(loaded->state);
    _curveSets = std::move(loaded->curveSets);
    host.setCurveSetListSerializer(_curveSets.get());
    // Loading announces nothing the user did.
    host.undoStack().clear();
    host.resetModifiedChannels();
    host.postNotification(kTQNotifySceneChanged);
    return std::nullopt;
}

// ---- The editor's trees alone -----------------------------------------------------------

namespace {

class EditorTreesHandler final : public BNSerializer {
public:
    EditorTreesHandler(TQCurveEditorState& state, TQCurveSetListSerializer& curveSets)
        : _state(state), _curveSets(curveSets) {}
    void writeHeader(BNSerializerWriteStream&, bool) override {}
    void writeBody(BNSerializerWriteStream&, bool, bool, bool) override {}
    bool parseBegin(BNSerializerReadStream& stream) override {
        stream.pushScope(tq_host::kProjectScope);
        return true;
    }
    bool parseEnd(BNSerializerReadStream&) override { return true; }
    bool parseElement(BNSerializerReadStream& stream, BNStreamElement& element) override {
        if (element.depth() <= 2 && tq_host::readEditorTree(stream, element, _state, _curveSets))
            return false;
        return element.depth() > 1;  // below the root anything else is skipped whole
    }

private:
    TQCurveEditorState& _state;
    TQCurveSetListSerializer& _curveSets;
};

}  // namespace

std::optional<BNSerializerError> TQHostReadEditorTrees(std::string_view document,
                                                       TQCurveEditorState& state,
                                                       TQCurveSetListSerializer& curveSets,
                                                       int32_t version,
                                                       const CMTime& frameDuration) {
    BNSerializerReadStream stream;
    stream.setVersion(version);
    stream.setFrameDuration(frameDuration);
    EditorTreesHandler handler(state, curveSets);
    return stream.read(document, handler);
}
