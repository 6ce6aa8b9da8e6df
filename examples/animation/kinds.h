// The built-in kinds of patches: what each computes from its inputs, found by their tags.
//
//     Kind const* kind = kindByNumber(*stringToKind("oscillator"));

#ifndef ANIMATION_KINDS_H
#define ANIMATION_KINDS_H

#include <Engine/Base/value.h>

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

// The moment that is evaluated.
struct Moment {
    long long frame = 0;
    double framesPerSecond = 60.0;
    double seconds() const { return static_cast<double>(frame) / framesPerSecond; }
};

// What a patch computes with, for one element of its loops: each input is cast to its port and read
// as the port's type.
struct Call {
    Moment moment;
    // By tag; an input that the patch has not is 0.0.
    std::function<tarn::engine::Value const&(unsigned long long tag)> in;
    // Every input, in order.
    std::vector<tarn::engine::Value> const& inputs;
    // The type of the output with this tag; `Float` where there is none.
    std::function<tarn::engine::Type(unsigned long long tag)> outType;
    // Appends to the values of the output with this tag, read as its type; up to `kLongestLoop`.
    std::function<void(unsigned long long tag, tarn::engine::Value value)> out;
};

// No output grows longer: a mistyped count is not to fill the memory.
constexpr std::size_t kLongestLoop = 1000;

struct Kind {
    unsigned long long number;
    // Null for kinds that the evaluator handles itself: groups and their ends, and unknown ones.
    void (*evaluate)(Call const&);
    // The tags of its ports and what they mean, for people.
    char const* ports;
};

// The kinds that have a number of their own in the evaluator.
constexpr unsigned long long kUnknownKind = 0;
constexpr unsigned long long kGroupKind = 1;
constexpr unsigned long long kGroupInputKind = 2;
constexpr unsigned long long kGroupOutputKind = 3;
constexpr unsigned long long kLayerKind = 21;

// Null for a number of no kind.
Kind const* kindByNumber(unsigned long long number);

#endif
