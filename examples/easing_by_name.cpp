// Finds a curve by the name that an editor shows, and prints its midpoint.
//
//     easing_by_name "Cubic Out" Bounce

#include <Engine/Base/easing.h>

#include <iostream>

using namespace tarn::engine;

int main(int argc, char** argv) {
    int unknown = 0;
    for (int i = 1; i < argc; ++i) {
        Optional<EasingFunction> const function = stringToEasingFunction(argv[i]);
        if (function) {
            std::cout << argv[i] << " is number " << static_cast<int>(*function)
                      << ", and half way " << ease(*function, 0.0, 100.0, 0.5) << "\n";
        } else {
            std::cout << argv[i] << " is no curve; they are:";
            for (std::string const& name : easingFunctionNames())
                std::cout << " \"" << name << "\"";
            std::cout << "\n";
            ++unknown;
        }
    }
    return unknown == 0 ? 0 : 2;
}
