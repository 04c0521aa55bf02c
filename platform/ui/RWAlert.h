#pragma once
// An alert as a model: a message, an informative text below it and a style, run modally
// through the modal service (RWServices.h) like any panel. The adapter shows it as its
// toolkit's message box with one OK button; a run that nothing could show answers at once.
// The window's title is the message, so that a service that tells runs apart by title tells
// alerts apart by what they say.

#include <cstdint>
#include <string>

#include "platform/ui/RWServices.h"
#include "platform/ui/RWWindow.h"

enum : int64_t { RWAlertStyleWarning = 0, RWAlertStyleInformational = 1, RWAlertStyleCritical = 2 };

class RWAlert : public RWPanel {
public:
    const std::string& messageText() const { return title(); }
    void setMessageText(const std::string& text) { setTitle(text); }
    const std::string& informativeText() const { return _informativeText; }
    void setInformativeText(const std::string& text) { _informativeText = text; }
    int64_t alertStyle() const { return _alertStyle; }
    void setAlertStyle(int64_t style) { _alertStyle = style; }

    // Shows the alert until the user dismisses it.
    RWModalResponse runModal() { return RWApplicationServices().modal->runModalForWindow(*this); }

private:
    std::string _informativeText;
    int64_t _alertStyle = RWAlertStyleWarning;
};
