#pragma once
// An inspector's rows (platform/inspector, and the over-range groups of src/parameters) as
// widgets, one under the other: a label, a number field, a slider or a dial, a disclosure for
// a folder, the curve strip with its reset button, the mini editor. Widgets are bound to the
// rows' control models; sync() brings what the models do not carry (hidden rows, enabled
// state, labels, the dial) in step, and runs after every disclosure and notification.
//
// The rows are not owned: the host keeps them, and clears the panel (setRows({})) before they
// go.

#include <QWidget>

#include <functional>
#include <vector>

class QVBoxLayout;
class TQViewController;

class TQQtInspectorPanel final : public QWidget {
public:
    explicit TQQtInspectorPanel(QWidget* parent = nullptr);
    ~TQQtInspectorPanel() override;

    void setRows(const std::vector<TQViewController*>& rows);
    void sync();

private:
    // The widget of one row; `twiddle` opens or closes the group a disclosure in it belongs to.
    QWidget* build(TQViewController* row, const std::function<void(bool)>& twiddle);
    QWidget* buildParam(TQViewController* row);

    struct Bound {
        QWidget* widget;
        TQViewController* row;
        std::function<void()> sync;  // what the models do not carry; may be empty
    };
    std::vector<Bound> _bound;
    QWidget* _content = nullptr;
    QVBoxLayout* _layout = nullptr;
};
