#include "qt/TQQtPasteboard.h"

#include <QByteArray>
#include <QClipboard>
#include <QGuiApplication>
#include <QMimeData>

namespace {

QClipboard* clipboard() { return QGuiApplication::clipboard(); }

QString formatOf(const std::string& type) { return QString::fromStdString(type); }

}  // namespace

TQQtPasteboard::TQQtPasteboard() {
    _changed = QObject::connect(clipboard(), &QClipboard::dataChanged, [this] { ++_changeCount; });
}

TQQtPasteboard::~TQQtPasteboard() { QObject::disconnect(_changed); }

int64_t TQQtPasteboard::clearContents() {
    const int64_t before = _changeCount;
    clipboard()->clear();
    // Some platforms tell of the change later, or not at all, for a clipboard already empty.
    if (_changeCount == before) ++_changeCount;
    return _changeCount;
}

bool TQQtPasteboard::setData(const std::vector<uint8_t>& data, const std::string& type) {
    if (type.empty()) return false;
    auto* next = new QMimeData;
    // What the clipboard holds stays beside the new type (nothing, after clearContents).
    if (const QMimeData* current = clipboard()->mimeData())
        for (const QString& format : current->formats())
            next->setData(format, current->data(format));
    next->setData(formatOf(type), QByteArray(reinterpret_cast<const char*>(data.data()),
                                             static_cast<qsizetype>(data.size())));
    clipboard()->setMimeData(next);
    return true;
}

std::optional<std::vector<uint8_t>> TQQtPasteboard::dataForType(const std::string& type) const {
    const QMimeData* current = clipboard()->mimeData();
    if (!current || !current->hasFormat(formatOf(type))) return std::nullopt;
    const QByteArray bytes = current->data(formatOf(type));
    return std::vector<uint8_t>(bytes.begin(), bytes.end());
}

std::vector<std::string> TQQtPasteboard::types() const {
    std::vector<std::string> out;
    if (const QMimeData* current = clipboard()->mimeData())
        for (const QString& format : current->formats()) out.push_back(format.toStdString());
    return out;
}
