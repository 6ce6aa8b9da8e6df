// Engine/Base/detail/shortest_number.h: numbers as short as they can be written.
//
//     std::string text = "r=";
//     appendShortest(text, 0.1);  // "r=0.1"

#ifndef TARN_ENGINE_BASE_DETAIL_SHORTEST_NUMBER_H
#define TARN_ENGINE_BASE_DETAIL_SHORTEST_NUMBER_H

#include <cfenv>
#include <string>

namespace tarn::engine::detail {

/// While it lives, numbers are rounded to the nearest, in the C library too.
class NearestRounding {
public:
    NearestRounding() : before(std::fegetround()) { set(FE_TONEAREST); }
    ~NearestRounding() { set(before); }
    NearestRounding(NearestRounding const&) = delete;
    NearestRounding& operator=(NearestRounding const&) = delete;

private:
    void set(int mode) const {
        if (before != FE_TONEAREST) std::fesetround(mode);
    }
    int before;
};

/// Appends the shortest decimal number that reads back to the same double, which is finite: in any
/// locale "-0.25", without a fraction where there is none, and with an exponent ("1.5e21", "1e-7")
/// from 1e21 on and below 1e-6. Under a `NearestRounding` alone.
void appendShortest(std::string& text, double number);

}  // namespace tarn::engine::detail

#endif
