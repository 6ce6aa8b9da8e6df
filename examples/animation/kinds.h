// The built-in kinds of patches: how each computes its outputs from its inputs, which are
// identified by their tags.
//
//     Kind const* kind = kindByNumber(*stringToKind("oscillator"));

#ifndef ANIMATION_KINDS_H
#define ANIMATION_KINDS_H

#include <Engine/Base/value.h>

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

// The time of the frame that is evaluated.
struct Moment {
    long long frame = 0;
    double framesPerSecond = 60.0;
    double seconds() const { return static_cast<double>(frame) / framesPerSecond; }
};

// The inputs and outputs of a patch for one element of its loops. Each input is clamped to the
// bounds of its port and converted to its type.
struct Call {
    Moment moment;
    // The input with this tag; 0.0 where there is none.
    std::function<tarn::engine::Value const&(unsigned long long tag)> in;
    // All inputs, in order.
    std::vector<tarn::engine::Value> const& inputs;
    // The type of the output with this tag; `Float` where there is none.
    std::function<tarn::engine::Type(unsigned long long tag)> outType;
    // Appends a value, converted to the port's type, to the output with this tag; ignored beyond
    // `kLongestLoop`.
    std::function<void(unsigned long long tag, tarn::engine::Value value)> out;
};

// The limit of a loop: a mistyped count must not exhaust memory.
constexpr std::size_t kLongestLoop = 1000;

struct Kind {
    unsigned long long number;
    // Null for the kinds that the evaluator handles itself: groups, their ends, and unknown kinds.
    void (*evaluate)(Call const&);
    // The tags of its ports with descriptions, for people.
    char const* ports;
};

// The kinds that other code refers to: those that the evaluator handles itself, and layers, which
// the scene draws.
constexpr unsigned long long kUnknownKind = 0;
constexpr unsigned long long kGroupKind = 1;
constexpr unsigned long long kGroupInputKind = 2;
constexpr unsigned long long kGroupOutputKind = 3;
constexpr unsigned long long kLayerKind = 21;

// Null for an undefined number.
Kind const* kindByNumber(unsigned long long number);

#endif
