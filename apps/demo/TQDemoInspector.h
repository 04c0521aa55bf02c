#pragma once
// The demo's parameter inspector and heads-up editor for the first selected object.
//
// The inspector (a dock beside the editor) shows a row per parameter through the host's
// channel-to-row table: the opacity, the volume and the softness as numbers with sliders, the
// orientation's angles with dials, and the two over-range parameters, Gradient (2D) and Taper
// (scale), as mini editor groups: a heading with the curve strip that opens onto the mini
// editor and the rows of its selected keypoint. The heads-up window holds the bare mini editor
// of the Gradient, fitting its curves.
//
// Both follow the host's notification words (notify), and are rebuilt when the selection of
// objects changes. They own their rows; the host must outlive them.

#include <QDockWidget>
#include <QWidget>

#include <memory>
#include <vector>

#include "host/TQHostAppDelegate.h"
#include "platform/inspector/TQChannelControllerMapping.h"
#include "src/mini/TQMiniCurveEditor.h"
#include "src/parameters/TQParameterInspectorDelegate.h"

class TQQtInspectorPanel;
class TQQtMiniCurveEditor;
class QLabel;

// Gives the over-range curves of the sample's objects a shape to edit.
void TQDemoSeedOverRangeCurves(TQHostAppDelegate& host);

class TQDemoInspector final : public QDockWidget {
public:
    TQDemoInspector(TQHostAppDelegate& host, QWidget* parent);
    ~TQDemoInspector() override;

    void notify(TQNotificationWord word);
    // The floating window with the heads-up editor.
    QWidget* headsUpWindow() const { return _hud; }
    TQQtInspectorPanel* panel() const { return _panel; }
    const std::vector<std::unique_ptr<TQViewController>>& rows() const { return _rows; }

private:
    void rebuild();

    TQHostAppDelegate& _host;
    TQParameterInspectorDelegate _bridge{&_host};
    JNBuildContext _context{&_bridge};
    TQChannelControllerMapping _mapping;
    std::vector<std::unique_ptr<TQViewController>> _rows;
    const TQChannelBase* _shownObject = nullptr;
    TQQtInspectorPanel* _panel = nullptr;
    QWidget* _hud = nullptr;
    QLabel* _hudTitle = nullptr;
    TQMiniCurveEditorHUD _hudEditor{&_host};
    TQQtMiniCurveEditor* _hudWidget = nullptr;
};
