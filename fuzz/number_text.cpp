// Compares formatted numbers with the C library, for any decimal points of the C and the C++
// library.

#include "model.h"

#include "support/locales.h"

#include <Engine/Base/value.h>

#include <iterator>
#include <optional>

using namespace fuzz;

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    Input input(data, size);
    std::optional<tests::CLocaleWithComma> withComma;
    if (input.below(2) == 1) withComma.emplace();
    char const points[] = {'.', '.', ',', ';'};
    char const point = points[input.below(std::size(points))];
    tests::CoutDecimalPoint const shown(point);
    do {
        double const d = input.anyDouble();
        std::string const text = numberText(d, point);
        check(to_string(tarn::engine::Value(d)) == text, "the string of a number");
        tarn::engine::Value const vector(tarn::engine::FloatVec2{d, -d});
        check(to_string(vector) == text + ", " + numberText(-d, point), "the string of a vector");
    } while (!input.ended());
    return 0;
}
