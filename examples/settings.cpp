// Reads options from a JSON file, with defaults, and reports values of the wrong kind.
//
//     settings examples/settings.json

#include <Engine/Base/json.h>

#include <fstream>
#include <iostream>

using namespace tarn::engine;

int main(int argc, char** argv) {
    std::string const name = argc > 1 ? argv[1] : "settings.json";
    std::ifstream file(name);
    nlohmann::json const json = nlohmann::json::parse(file, nullptr, false);
    if (json.is_discarded()) {
        std::cerr << name << ": cannot be read, or is not JSON\n";
        return 1;
    }
    Unstructured const settings = fromJson(json);

    Unstructured::Lookup lookup = Unstructured::Lookup::Missing;
    auto const report = [&](char const* path, char const* wanted) {
        if (lookup != Unstructured::Lookup::WrongKind) return;
        std::cerr << name << ": " << path << " is not " << wanted << "; using the default\n";
    };
    long long const width = settings.integerAt({"render", "size", 0}, 1280, &lookup);
    report("render.size[0]", "an integer");
    double const scale = settings.numberAt({"render", "scale"}, 1.0, &lookup);
    report("render.scale", "a number");
    bool const loop = settings.boolAt({"playback", "loop"}, true, &lookup);
    report("playback.loop", "true or false");
    std::string const theme = settings.stringAt({"theme"}, "light", &lookup);
    report("theme", "a string");

    std::cout << "width " << width << ", scale " << scale << ", loop " << loop << ", theme "
              << theme << "\n";
}
