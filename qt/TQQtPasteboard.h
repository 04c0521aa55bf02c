#pragma once
// The general pasteboard of platform/ui on the system clipboard (QClipboard). Each type is
// one MIME format of the clipboard's data; "text/plain" is what other programs paste as text.
//
// Writing. Qt replaces the clipboard's data as a whole, so a new type is written together
// with every format the clipboard holds: those written since clearContents, or another
// program's when it took the clipboard meanwhile.
//
// The change count rises on every change of the clipboard, also by other programs, and at
// each clearContents. Make one after the QApplication, on the main thread.

#include <QMetaObject>

#include <string>
#include <vector>

#include "platform/ui/RWServices.h"

class TQQtPasteboard final : public RWPasteboard {
public:
    TQQtPasteboard();
    ~TQQtPasteboard() override;
    TQQtPasteboard(const TQQtPasteboard&) = delete;
    TQQtPasteboard& operator=(const TQQtPasteboard&) = delete;

    int64_t clearContents() override;
    int64_t changeCount() const override { return _changeCount; }
    bool setData(const std::vector<uint8_t>& data, const std::string& type) override;
    std::optional<std::vector<uint8_t>> dataForType(const std::string& type) const override;
    std::vector<std::string> types() const override;

private:
    QMetaObject::Connection _changed;
    int64_t _changeCount = 0;
};
