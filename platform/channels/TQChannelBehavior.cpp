#include "platform/channels/TQChannelBehavior.h"

#include <cmath>
#include <numbers>

double TQOscillateBehavior::apply(double seconds, double value) const {
    return value + _amplitude * std::sin(2.0 * std::numbers::pi * (_frequency * seconds + _phase));
}

std::unique_ptr<TQChannelBehavior> TQOscillateBehavior::clone() const {
    return std::make_unique<TQOscillateBehavior>(*this);
}

bool TQOscillateBehavior::equals(const TQChannelBehavior& other) const {
    const auto* o = dynamic_cast<const TQOscillateBehavior*>(&other);
    return o && sameFlags(*o) && _amplitude == o->_amplitude && _frequency == o->_frequency &&
           _phase == o->_phase;
}

namespace {

// A 64-bit mix (the finaliser of splitmix64) of a lattice point and the seed: well spread,
// identical on every machine.
uint64_t mix(uint64_t x) {
    x += 0x9e3779b97f4a7c15ull;
    x = (x ^ (x >> 30)) * 0xbf58476d1ce4e5b9ull;
    x = (x ^ (x >> 27)) * 0x94d049bb133111ebull;
    return x ^ (x >> 31);
}

// Value at an integer lattice point, in [-1, 1].
double latticeValue(int64_t point, uint32_t seed) {
    const uint64_t h = mix(static_cast<uint64_t>(point) ^ (uint64_t(seed) << 32));
    return double(h >> 11) * (2.0 / 9007199254740992.0) - 1.0;  // 53 bits to [-1, 1)
}

}  // namespace

double TQNoiseBehavior::noise(double x, uint32_t seed) {
    if (!std::isfinite(x)) return 0.0;
    const double cell = std::floor(x);
    // Beyond 2^62 cells the lattice index would overflow; noise that far out repeats.
    const double wrapped = std::fmod(cell, 4611686018427387904.0);
    const int64_t i = static_cast<int64_t>(wrapped);
    const double f = x - cell;
    const double fade = f * f * f * (f * (f * 6.0 - 15.0) + 10.0);
    const double a = latticeValue(i, seed);
    const double b = latticeValue(i + 1, seed);
    return a + (b - a) * fade;
}

double TQNoiseBehavior::apply(double seconds, double value) const {
    return value + _amplitude * noise(_frequency * seconds, _seed);
}

std::unique_ptr<TQChannelBehavior> TQNoiseBehavior::clone() const {
    return std::make_unique<TQNoiseBehavior>(*this);
}

bool TQNoiseBehavior::equals(const TQChannelBehavior& other) const {
    const auto* o = dynamic_cast<const TQNoiseBehavior*>(&other);
    return o && sameFlags(*o) && _amplitude == o->_amplitude && _frequency == o->_frequency &&
           _seed == o->_seed;
}
