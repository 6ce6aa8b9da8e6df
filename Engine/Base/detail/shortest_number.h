// Engine/Base/detail/shortest_number.h: the shortest decimal representation of a double.
//
//     std::string text = "r=";
//     appendShortest(text, 0.1);  // "r=0.1"

#ifndef TARN_ENGINE_BASE_DETAIL_SHORTEST_NUMBER_H
#define TARN_ENGINE_BASE_DETAIL_SHORTEST_NUMBER_H

#include <cfenv>
#include <string>

namespace tarn::engine::detail {

/// Sets the rounding mode to nearest, for the C library too, and restores it when destroyed.
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

/// Appends the shortest decimal number that converts back to the same double, which must be finite.
/// In every locale it looks like "-0.25"; there is no fraction where none is needed, and an
/// exponent ("1.5e21", "1e-7") from 1e21 on and below 1e-6. Needs a `NearestRounding` in scope.
void appendShortest(std::string& text, double number);

}  // namespace tarn::engine::detail

#endif
