#pragma once
// How a Qt widget is bound to a control model of platform/ui (see RWControl.h for the
// pattern). The widget class derives from its Qt widget and from this binding:
//
//   model to widget   the binding observes the model; after every change of the model's
//                     state it calls syncFromModel, which shows the state at once with the
//                     widget's own signals blocked, so that a shown change is never taken
//                     for a user's.
//   widget to model   the widget's signals call the model's user... entries; the model sends
//                     its action, and the state the target leaves comes back through the
//                     observer.
//   replacement       the binding is the model's superview: a controller that puts a model
//                     of its own in the old one's place (replaceSubview) rebinds the widget
//                     to the new model, which the widget keeps showing where the old one was.
//
// The widget shares the model (it keeps it alive) and detaches itself when it dies.

#include <memory>

#include "platform/ui/RWControl.h"

template <class Model>
class TQQtControlBinding : public RWControlObserver, public RWControlSuperview {
public:
    TQQtControlBinding() = default;
    ~TQQtControlBinding() override { detach(); }
    TQQtControlBinding(const TQQtControlBinding&) = delete;
    TQQtControlBinding& operator=(const TQQtControlBinding&) = delete;

    const std::shared_ptr<Model>& model() const { return _model; }
    // Null leaves the widget showing nothing of a model (disabled).
    void setModel(std::shared_ptr<Model> model) {
        detach();
        _model = std::move(model);
        if (_model) {
            _model->addObserver(this);
            _model->setSuperview(this);
        }
        syncFromModel();
    }

    void controlDidChange(RWControl&) override { syncFromModel(); }
    // A replacement of another class than this widget shows leaves it without a model.
    void replaceSubview(RWControl& control,
                        const std::shared_ptr<RWControl>& replacement) override {
        if (&control != _model.get()) return;
        setModel(std::dynamic_pointer_cast<Model>(replacement));
    }

protected:
    // Shows the model's state (or, without a model, a disabled widget).
    virtual void syncFromModel() = 0;

private:
    void detach() {
        if (!_model) return;
        _model->removeObserver(this);
        if (_model->superview() == this) _model->setSuperview(nullptr);
        _model.reset();
    }

    std::shared_ptr<Model> _model;
};
