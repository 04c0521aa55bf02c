#pragma once
// The user defaults on QSettings. Stored values persist where Qt keeps the application's
// settings (by its organisation and application names), or in an INI file of the caller's;
// registered defaults stay in memory, beneath the stored values, as registration does with
// the toolkit's defaults. Values come back in the type they were written in while the
// settings object lives; after a restart an INI file gives text, which the typed readers of
// RWUserDefaults convert.

#include <QSettings>
#include <QString>

#include <map>
#include <memory>
#include <string>

#include "platform/ui/RWServices.h"

class TQQtUserDefaults final : public RWUserDefaults {
public:
    // The application's settings.
    TQQtUserDefaults();
    // The settings in an INI file.
    explicit TQQtUserDefaults(const QString& iniPath);

    std::optional<RWDefaultsValue> objectForKey(const std::string& key) const override;
    void setObject(const RWDefaultsValue& value, const std::string& key) override;
    void removeObjectForKey(const std::string& key) override;
    void registerDefaults(const std::map<std::string, RWDefaultsValue>& defaults) override;

    // Writes what is pending to permanent storage (Qt also does so by itself, later).
    void synchronize() { _settings->sync(); }

private:
    std::unique_ptr<QSettings> _settings;
    std::map<std::string, RWDefaultsValue> _registered;
};
