#pragma once
// What the channel list and its controller ask of the cells of the "Key" and "Menu" columns,
// the animation status cells: the "Key" cell shows whether the row's channel has a keyframe at
// the current time and steps between keyframes, the "Menu" cell opens the animation menu.
// Those cells come with their own module and implement this beside RWCell; they become the
// two columns' data cells when the host sets them (setDataCell). A column without one shows
// nothing and takes no press.
//
// One cell serves every row of its column: each use starts with updateChannel, so that no
// state is assumed from an earlier row. The channel given is resolved for that use only.

#include <cstdint>

#include "platform/channels/TQChannelBase.h"
#include "platform/media/CMTime.h"
#include "platform/ui/RWEvent.h"

class RWOutlineView;

class TQChannelListStatusCell {
public:
    virtual ~TQChannelListStatusCell() = default;
    // The row's channel (null: none) and the playhead.
    virtual void updateChannel(TQChannelBase* channel, CMTime time) = 0;
    // The channel of the last updateChannel; compared with the hovered row's, never read.
    virtual const TQChannelBase* associatedChannel() const = 0;
    // Hover state of the row being drawn: the pointer is over the row, over the cell, over
    // which part of it (1 previous, 2 add or delete, 3 next; 0 elsewhere), and pressing which.
    virtual void setIsMouseOverRow(bool over) = 0;
    virtual void setMouseOver(bool over) = 0;
    virtual void setMouseOverLocation(int64_t part) = 0;
    virtual void setMouseDownLocation(int64_t part) = 0;
    // A right press (or a press in the "Menu" column): the cell opens its menu in the view.
    virtual void rightMouseDown(const RWEvent& event, RWOutlineView& view) = 0;
};
