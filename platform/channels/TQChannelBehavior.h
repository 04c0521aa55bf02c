#pragma once
// Behaviours: procedural modifiers that a channel carries on top of its keyframed curve.
// The keyframed curve is what the editor edits; the processed curve is that curve with every
// enabled behaviour applied in order. A behaviour is a value: it is copied by clone(), compared
// by equals(), and owned by exactly one channel.

#include <cstdint>
#include <memory>

#include "platform/support/BNString.h"

class TQChannelBehavior {
public:
    virtual ~TQChannelBehavior() = default;

    // The value at `seconds` (channel time) given the value of everything below this behaviour.
    // Must be a pure function of its arguments and the behaviour's parameters, so that sampling
    // the same span twice gives the same values.
    virtual double apply(double seconds, double value) const = 0;

    virtual std::unique_ptr<TQChannelBehavior> clone() const = 0;
    // Same kind and bit-for-bit the same parameters and flags.
    virtual bool equals(const TQChannelBehavior& other) const = 0;
    virtual BNString kindName() const = 0;

    bool isEnabled() const { return _enabled; }
    void setEnabled(bool enabled) { _enabled = enabled; }
    // Selection is a state of the behaviour in the host's user interface; curve sets ask
    // whether a channel is moved by a selected behaviour.
    bool isSelected() const { return _selected; }
    void setSelected(bool selected) { _selected = selected; }

protected:
    TQChannelBehavior() = default;
    TQChannelBehavior(const TQChannelBehavior&) = default;
    TQChannelBehavior& operator=(const TQChannelBehavior&) = default;
    bool sameFlags(const TQChannelBehavior& other) const {
        return _enabled == other._enabled && _selected == other._selected;
    }

private:
    bool _enabled = true;
    bool _selected = false;
};

// Adds amplitude * sin(2 pi (frequency * t + phase)); phase is in cycles (0..1).
class TQOscillateBehavior final : public TQChannelBehavior {
public:
    TQOscillateBehavior(double amplitude, double frequency, double phase = 0.0)
        : _amplitude(amplitude), _frequency(frequency), _phase(phase) {}

    double apply(double seconds, double value) const override;
    std::unique_ptr<TQChannelBehavior> clone() const override;
    bool equals(const TQChannelBehavior& other) const override;
    BNString kindName() const override { return "Oscillate"; }

    double amplitude() const { return _amplitude; }
    double frequency() const { return _frequency; }
    double phase() const { return _phase; }
    void setAmplitude(double amplitude) { _amplitude = amplitude; }
    void setFrequency(double frequency) { _frequency = frequency; }
    void setPhase(double phase) { _phase = phase; }

private:
    double _amplitude;
    double _frequency;
    double _phase;
};

// Adds amplitude * n(frequency * t) where n is smooth value noise in [-1, 1]: random values
// at integer lattice points (a hash of the point and the seed, so deterministic across runs and
// machines) joined by a quintic fade, which has continuous first and second derivatives.
class TQNoiseBehavior final : public TQChannelBehavior {
public:
    TQNoiseBehavior(double amplitude, double frequency, uint32_t seed = 0)
        : _amplitude(amplitude), _frequency(frequency), _seed(seed) {}

    double apply(double seconds, double value) const override;
    std::unique_ptr<TQChannelBehavior> clone() const override;
    bool equals(const TQChannelBehavior& other) const override;
    BNString kindName() const override { return "Noise"; }

    double amplitude() const { return _amplitude; }
    double frequency() const { return _frequency; }
    uint32_t seed() const { return _seed; }
    void setAmplitude(double amplitude) { _amplitude = amplitude; }
    void setFrequency(double frequency) { _frequency = frequency; }
    void setSeed(uint32_t seed) { _seed = seed; }

    // The unscaled noise, in [-1, 1]; exposed for tests and for hosts that draw it.
    static double noise(double x, uint32_t seed);

private:
    double _amplitude;
    double _frequency;
    uint32_t _seed;
};
