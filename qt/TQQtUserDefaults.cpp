#include "qt/TQQtUserDefaults.h"

#include <QVariant>

namespace {

QString qtKey(const std::string& key) { return QString::fromStdString(key); }

std::optional<RWDefaultsValue> fromVariant(const QVariant& value) {
    switch (value.typeId()) {
        case QMetaType::Bool: return RWDefaultsValue{value.toBool()};
        case QMetaType::Int:
        case QMetaType::UInt:
        case QMetaType::LongLong:
        case QMetaType::ULongLong: return RWDefaultsValue{int64_t{value.toLongLong()}};
        case QMetaType::Float:
        case QMetaType::Double: return RWDefaultsValue{value.toDouble()};
        default: break;
    }
    if (value.canConvert<QString>()) return RWDefaultsValue{value.toString().toStdString()};
    return std::nullopt;
}

QVariant toVariant(const RWDefaultsValue& value) {
    return std::visit(
        [](const auto& v) -> QVariant {
            using V = std::decay_t<decltype(v)>;
            if constexpr (std::is_same_v<V, std::string>) {
                return QString::fromStdString(v);
            } else if constexpr (std::is_same_v<V, int64_t>) {
                return QVariant(static_cast<qlonglong>(v));
            } else {
                return QVariant(v);
            }
        },
        value);
}

}  // namespace

TQQtUserDefaults::TQQtUserDefaults() : _settings(std::make_unique<QSettings>()) {}

TQQtUserDefaults::TQQtUserDefaults(const QString& iniPath)
    : _settings(std::make_unique<QSettings>(iniPath, QSettings::IniFormat)) {}

std::optional<RWDefaultsValue> TQQtUserDefaults::objectForKey(const std::string& key) const {
    if (_settings->contains(qtKey(key))) return fromVariant(_settings->value(qtKey(key)));
    const auto registered = _registered.find(key);
    if (registered == _registered.end()) return std::nullopt;
    return registered->second;
}

void TQQtUserDefaults::setObject(const RWDefaultsValue& value, const std::string& key) {
    _settings->setValue(qtKey(key), toVariant(value));
}

void TQQtUserDefaults::removeObjectForKey(const std::string& key) { _settings->remove(qtKey(key)); }

void TQQtUserDefaults::registerDefaults(const std::map<std::string, RWDefaultsValue>& defaults) {
    for (const auto& [key, value] : defaults) _registered[key] = value;
}
