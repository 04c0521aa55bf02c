#pragma once
// Two controls of the full editor that differ from the toolkit's in one operation each.

#include "platform/ui/RWMenu.h"
#include "platform/ui/RWZoomScroller.h"

// The editor's vertical zoom scroller: it never shortens itself for the window's resize
// corner, which the editor's layout keeps clear on its own.
class TQVantaZoomScroller : public RWZoomScroller {
protected:
    void _adjustForGrowBox() override {}
};

// The curve set pop-up's menu: keys pressed in the editor never reach its items, whatever
// key equivalents they carry.
class TQIgnoreKeyEquivalentsMenu : public RWMenu {
public:
    using RWMenu::RWMenu;
    bool performKeyEquivalent(const RWEvent&) override { return false; }
};
