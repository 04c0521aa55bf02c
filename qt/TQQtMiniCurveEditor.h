#pragma once
// The mini editor of src/mini as widgets: its curve view in a TQQtCurveViewWidget, the two
// axis labels (the Y label turned), and, for the inspector form, the tool switch, the auto fit
// switch and the two zoom scrollers. Everything is placed by the models' frames (origin at the
// bottom left, turned into Qt's top left here); sync() follows the models again after a
// change of layout (auto fit shows the scrollers and shrinks the view).
//
// The editor model is not owned and must outlive the widget.

#include <QLabel>
#include <QWidget>

class TQMiniCurveEditor;
class TQMiniCurveEditorInspector;
class TQQtButton;
class TQQtCurveViewWidget;
class TQQtSegmentedControl;
class TQQtZoomScroller;

class TQQtMiniCurveEditor final : public QWidget {
public:
    explicit TQQtMiniCurveEditor(TQMiniCurveEditor& editor, QWidget* parent = nullptr);
    ~TQQtMiniCurveEditor() override;

    TQMiniCurveEditor& editor() const { return _editor; }
    TQQtCurveViewWidget* curveWidget() const { return _curveWidget; }
    // Places and shows the parts as the models say, and shows the labels' texts.
    void sync();

    QSize sizeHint() const override;

private:
    QRect qtRect(double x, double y, double w, double h) const;

    TQMiniCurveEditor& _editor;
    TQMiniCurveEditorInspector* _inspector = nullptr;  // the same editor, when of that form
    TQQtCurveViewWidget* _curveWidget = nullptr;
    QLabel* _axisX = nullptr;
    QLabel* _axisY = nullptr;
    TQQtSegmentedControl* _modes = nullptr;
    TQQtButton* _autoFit = nullptr;
    TQQtZoomScroller* _vertical = nullptr;
    TQQtZoomScroller* _horizontal = nullptr;
};
