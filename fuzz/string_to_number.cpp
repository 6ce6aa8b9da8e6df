// Converts any string to a number and to a boolean.

#include "model.h"

#include "support/locales.h"

#include <Engine/Base/value.h>

#include <optional>

using namespace fuzz;

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    Input input(data, size);
    std::optional<tests::CLocaleWithComma> withComma;
    if (input.below(2) == 1) withComma.emplace();
    std::string const text = input.rest();
    tarn::engine::Value const value(text);
    double const number = textAsNumber(text);
    errno = 12345;
    check(same(double(value), number), "a string as a number");
    check(static_cast<long long>(value) == toInteger(number), "a string as an integer");
    check(bool(value) == !text.empty(), "a string as a boolean");
    check(static_cast<unsigned long long>(value) == 0, "a string as an identifier");
    check(errno == 12345, "errno stays as it was");
    check(*value.ifString() == text, "the string is unchanged");
    return 0;
}
