#include <Engine/Base/points.h>

#include <stdexcept>

namespace tarn::engine::detail {

void throwOutOfRange(char const* what) { throw std::out_of_range(what); }
void throwLengthError(char const* what) { throw std::length_error(what); }

}  // namespace tarn::engine::detail
