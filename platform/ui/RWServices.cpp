#include "platform/ui/RWServices.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <type_traits>

// ---- Pasteboard helpers -----------------------------------------------------------------

bool RWPasteboard::setString(const std::string& text, const std::string& type) {
    return setData(std::vector<uint8_t>(text.begin(), text.end()), type);
}

void RWPasteboard::declareTypes(const std::vector<std::string>& types) {
    clearContents();
    for (const std::string& type : types) setData({}, type);
}

std::optional<std::string> RWPasteboard::stringForType(const std::string& type) const {
    auto data = dataForType(type);
    if (!data) return std::nullopt;
    return std::string(data->begin(), data->end());
}

std::optional<std::string> RWPasteboard::availableTypeFromArray(
    const std::vector<std::string>& wanted) const {
    const std::vector<std::string> held = types();
    for (const auto& type : wanted)
        if (std::find(held.begin(), held.end(), type) != held.end()) return type;
    return std::nullopt;
}

int64_t RWMemoryPasteboard::clearContents() {
    _items.clear();
    return ++_changeCount;
}

bool RWMemoryPasteboard::setData(const std::vector<uint8_t>& data, const std::string& type) {
    auto it =
        std::find_if(_items.begin(), _items.end(), [&](const auto& p) { return p.first == type; });
    if (it != _items.end())
        it->second = data;
    else
        _items.emplace_back(type, data);
    return true;
}

std::optional<std::vector<uint8_t>> RWMemoryPasteboard::dataForType(const std::string& type) const {
    auto it =
        std::find_if(_items.begin(), _items.end(), [&](const auto& p) { return p.first == type; });
    if (it == _items.end()) return std::nullopt;
    return it->second;
}

std::vector<std::string> RWMemoryPasteboard::types() const {
    std::vector<std::string> out;
    out.reserve(_items.size());
    for (const auto& [type, data] : _items) out.push_back(type);
    return out;
}

// ---- User defaults ----------------------------------------------------------------------

namespace {

// Numbers and booleans convert into each other; a text converts when it reads as a number
// ("YES"/"true" count as true), as the toolkit's defaults do.
std::optional<double> numberOf(const RWDefaultsValue& value) {
    return std::visit(
        [](const auto& v) -> std::optional<double> {
            using V = std::decay_t<decltype(v)>;
            if constexpr (std::is_same_v<V, bool>) {
                return v ? 1.0 : 0.0;
            } else if constexpr (std::is_same_v<V, std::string>) {
                if (v == "YES" || v == "true") return 1.0;
                if (v == "NO" || v == "false") return 0.0;
                char* end = nullptr;
                const double d = std::strtod(v.c_str(), &end);
                if (end == v.c_str()) return std::nullopt;
                return d;
            } else {
                return static_cast<double>(v);
            }
        },
        value);
}

}  // namespace

bool RWUserDefaults::boolForKey(const std::string& key) const {
    auto value = objectForKey(key);
    if (!value) return false;
    auto n = numberOf(*value);
    return n && *n != 0.0;
}

int64_t RWUserDefaults::integerForKey(const std::string& key) const {
    auto value = objectForKey(key);
    if (!value) return 0;
    if (auto* i = std::get_if<int64_t>(&*value)) return *i;
    auto n = numberOf(*value);
    if (!n || !std::isfinite(*n) || std::fabs(*n) >= 9.2e18) return 0;
    return static_cast<int64_t>(*n);
}

double RWUserDefaults::doubleForKey(const std::string& key) const {
    auto value = objectForKey(key);
    if (!value) return 0.0;
    return numberOf(*value).value_or(0.0);
}

std::string RWUserDefaults::stringForKey(const std::string& key) const {
    auto value = objectForKey(key);
    if (!value) return {};
    if (auto* s = std::get_if<std::string>(&*value)) return *s;
    // Only texts answer as texts; numbers are not formatted.
    return {};
}

std::optional<RWDefaultsValue> RWMemoryUserDefaults::objectForKey(const std::string& key) const {
    if (auto it = _values.find(key); it != _values.end()) return it->second;
    if (auto it = _registered.find(key); it != _registered.end()) return it->second;
    return std::nullopt;
}

void RWMemoryUserDefaults::setObject(const RWDefaultsValue& value, const std::string& key) {
    _values[key] = value;
}

void RWMemoryUserDefaults::removeObjectForKey(const std::string& key) { _values.erase(key); }

void RWMemoryUserDefaults::registerDefaults(
    const std::map<std::string, RWDefaultsValue>& defaults) {
    for (const auto& [key, value] : defaults) _registered[key] = value;
}

// ---- Time -------------------------------------------------------------------------------

double RWSteadyClock::now() const {
    using namespace std::chrono;
    return duration<double>(steady_clock::now().time_since_epoch()).count();
}

void RWQueuedTimer::dispatchAfter(uint64_t nanoseconds, std::function<void()> block) {
    if (!block) return;
    _pending.push_back(
        {_clock.now() + static_cast<double>(nanoseconds) * 1e-9, _nextOrder++, std::move(block)});
}

size_t RWQueuedTimer::runDueBlocks() {
    size_t ran = 0;
    for (;;) {
        const double now = _clock.now();
        // Earliest due first; equal times in the order they were dispatched.
        auto next = _pending.end();
        for (auto it = _pending.begin(); it != _pending.end(); ++it) {
            if (it->due > now) continue;
            if (next == _pending.end() || it->due < next->due ||
                (it->due == next->due && it->order < next->order))
                next = it;
        }
        if (next == _pending.end()) return ran;
        std::function<void()> block = std::move(next->block);
        _pending.erase(next);
        block();  // may dispatch more
        ++ran;
    }
}

// ---- Process-wide access ----------------------------------------------------------------

namespace {

struct HeadlessServices {
    RWSteadyClock clock;
    RWQueuedTimer timer{clock};
    RWHeadlessModal modal;
    RWMemoryPasteboard pasteboard;
    RWMemoryUserDefaults userDefaults;

    RWServiceSet all() { return {&clock, &timer, &modal, &pasteboard, &userDefaults}; }
};

HeadlessServices& headless() {
    static HeadlessServices services;
    return services;
}

RWServiceSet& installed() {
    static RWServiceSet set = headless().all();
    return set;
}

}  // namespace

const RWServiceSet& RWApplicationServices() { return installed(); }

void RWInstallServices(const RWServiceSet& services) {
    RWServiceSet& set = installed();
    if (services.clock) set.clock = services.clock;
    if (services.timer) set.timer = services.timer;
    if (services.modal) set.modal = services.modal;
    if (services.pasteboard) set.pasteboard = services.pasteboard;
    if (services.userDefaults) set.userDefaults = services.userDefaults;
}

void RWResetServices() { installed() = headless().all(); }

RWQueuedTimer& RWHeadlessTimer() { return headless().timer; }
