#include <Engine/Document/document.h>

#include <array>
#include <string_view>

namespace tarn::engine {

namespace {

// Names indexed by number.
constexpr std::array<std::string_view, 23> kNames{
    "unknown", "group",     "input",    "output", "time",      "constant", "ease",   "oscillator",
    "add",     "multiply",  "compose",  "split",  "loop",      "pulse",    "choose", "circle",
    "ellipse", "roundRect", "hexaRect", "arc",    "joinPaths", "layer",    "text"};

}  // namespace

std::string kindToString(unsigned long long builtin) {
    if (builtin >= kNames.size()) return std::string();
    return std::string(kNames[static_cast<std::size_t>(builtin)]);
}

Optional<unsigned long long> stringToKind(std::string const& name) {
    for (std::size_t i = 0; i < kNames.size(); ++i) {
        if (kNames[i] == name) return static_cast<unsigned long long>(i);
    }
    return std::nullopt;
}

}  // namespace tarn::engine
