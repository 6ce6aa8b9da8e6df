#include <Engine/Base/assertion.h>

#include <cstdio>
#include <cstdlib>

namespace tarn::engine {

void assertionFailed(char const* condition, char const* function, char const* module,
                     int line) noexcept {
    std::fprintf(stderr, "Assertion failed: (%s), function %s, file %s, line %d.\n", condition,
                 function, module, line);
    std::abort();
}

}  // namespace tarn::engine
