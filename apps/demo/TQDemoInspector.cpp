#include "apps/demo/TQDemoInspector.h"

#include <QLabel>
#include <QScrollArea>
#include <QVBoxLayout>

#include "host/TQHostObjectModel.h"
#include "platform/channels/TQChannelRef.h"
#include "platform/channels/TQChannelTypes.h"
#include "platform/inspector/TQChanNumberControllers.h"
#include "platform/inspector/TQInspectorRows.h"
#include "qt/TQQtInspectorPanel.h"
#include "qt/TQQtMiniCurveEditor.h"
#include "src/parameters/TQMiniCurveEditorGroupController.h"

namespace {

CMTime position(double p) { return TQTarnTimeForChannelSeconds(p, 0x40000); }

TQChannelBase* channelAt(const TQChannelBase* object, const BNString& path) {
    return object ? TQChannelRef(path).getChannel(const_cast<TQChannelBase*>(object)) : nullptr;
}

}  // namespace

void TQDemoSeedOverRangeCurves(TQHostAppDelegate& host) {
    const TQHostTypedChannelPaths& paths = TQHostTypedPaths(host.scene().family());
    for (TQChannelBase* object : host.scene().objects()) {
        if (auto* gradient = dynamic_cast<TQChannelPair*>(channelAt(object, paths.gradient))) {
            TQChannel* x = gradient->getXChannel();
            TQChannel* y = gradient->getYChannel();
            if (x && y && x->getKeyframes(false).empty()) {
                for (const auto& [p, v] : {std::pair{0.0, 0.0}, {0.4, 0.8}, {1.0, 0.2}})
                    x->setKeyframe(position(p), v);
                for (const auto& [p, v] : {std::pair{0.0, 1.0}, {0.6, 0.3}, {1.0, 0.6}})
                    y->setKeyframe(position(p), v);
            }
        }
        if (auto* taper = dynamic_cast<TQChannelPair*>(channelAt(object, paths.taper))) {
            TQChannel* x = taper->getXChannel();
            TQChannel* y = taper->getYChannel();
            if (x && y && x->getKeyframes(false).empty())
                for (TQChannel* c : {x, y}) {
                    c->setKeyframe(position(0.0), 1.0);
                    c->setKeyframe(position(1.0), 0.5);
                }
        }
    }
    host.resetModifiedChannels();
}

TQDemoInspector::TQDemoInspector(TQHostAppDelegate& host, QWidget* parent)
    : QDockWidget(tr("Inspector"), parent), _host(host) {
    setObjectName(QStringLiteral("inspector"));
    TQCurveEditorAppDelegate* curves = &_host;
    _mapping.registerClass<TQChannel2DOverRange>(
        [curves](TQChannelBase* c, const JNBuildContext& ctx) -> std::unique_ptr<TQViewController> {
            return TQMakeOverRangeGroup<TQChannel2DOverRangeController>(c, curves, ctx);
        });
    _mapping.registerClass<TQChannelScaleOverRange>(
        [curves](TQChannelBase* c, const JNBuildContext& ctx) -> std::unique_ptr<TQViewController> {
            return TQMakeOverRangeGroup<TQChannelScaleOverRangeController>(c, curves, ctx);
        });
    _mapping.registerClass<TQChannelAngle>([](TQChannelBase* c, const JNBuildContext& ctx) {
        return std::make_unique<TQChanAngleController>(c, ctx);
    });

    auto* scroll = new QScrollArea(this);
    scroll->setWidgetResizable(true);
    _panel = new TQQtInspectorPanel(scroll);
    scroll->setWidget(_panel);
    scroll->setMinimumWidth(300);
    setWidget(scroll);

    _hud = new QWidget(parent, Qt::Tool);
    _hud->setWindowTitle(tr("Heads-Up Editor"));
    auto* column = new QVBoxLayout(_hud);
    _hudTitle = new QLabel(_hud);
    column->addWidget(_hudTitle);
    _hudWidget = new TQQtMiniCurveEditor(_hudEditor, _hud);
    column->addWidget(_hudWidget);
    rebuild();
}

TQDemoInspector::~TQDemoInspector() {
    _panel->setRows({});
    delete _hud;  // its editor widget refers to the editor model, a member
}

void TQDemoInspector::rebuild() {
    const std::vector<TQChannelBase*> selected = _host.selectedObjectsRootChannels();
    const TQChannelBase* object = selected.empty() ? nullptr : selected.front();
    _panel->setRows({});
    _rows.clear();
    _shownObject = object;
    const TQHostObjectFamily family = _host.scene().family();
    const TQHostTypedChannelPaths& typed = TQHostTypedPaths(family);
    std::vector<BNString> paths;
    const std::vector<BNString>& opacity = TQHostPropertyPaths(family, TQHostProperty::Opacity);
    paths.insert(paths.end(), opacity.begin(), opacity.end());
    paths.insert(paths.end(), {typed.volume, typed.softness, typed.gradient, typed.taper});
    std::vector<TQViewController*> shown;
    for (const BNString& path : paths) {
        TQChannelBase* channel = channelAt(object, path);
        auto row = _mapping.controllerForChannel(channel, _context);
        if (!row) continue;
        // A single row gets its label beside it; a group brings its own heading.
        if (!dynamic_cast<TQViewControllerGroup*>(row.get()))
            row = std::make_unique<TQLabeledParamController>(
                std::make_unique<TQChanLabelController>(channel, _context), std::move(row),
                _context);
        row->update();
        shown.push_back(row.get());
        _rows.push_back(std::move(row));
    }
    _panel->setRows(shown);

    TQChannelBase* gradient = channelAt(object, typed.gradient);
    _hudEditor.setChannel(gradient);
    _hudTitle->setText(gradient
                           ? tr("Gradient of %1").arg(QString::fromStdString(object->getName()))
                           : tr("No object selected"));
    _hudWidget->sync();
}

void TQDemoInspector::notify(TQNotificationWord word) {
    const std::vector<TQChannelBase*> selected = _host.selectedObjectsRootChannels();
    const TQChannelBase* object = selected.empty() ? nullptr : selected.front();
    if ((word & (kTQNotifySceneChanged | kTQNotifySceneReset | kTQNotifyObjectSelectionChanged)) ||
        object != _shownObject) {
        rebuild();
        return;
    }
    for (const auto& row : _rows) row->notify(word);
    if (word & (kTQNotifyChannelsChanging | kTQNotifyChannelsChanged)) {
        _hudEditor.update();
        for (const auto& row : _rows) row->update();
    }
    _panel->sync();
    _hudWidget->sync();
}
