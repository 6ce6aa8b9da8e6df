// Eases values over frames: a number, a colour, and each element of a loop a little later.
//
//     animate

#include <Engine/Base/easing.h>
#include <Engine/Base/value.h>

#include <algorithm>
#include <iostream>

using namespace tarn::engine;

int main() {
    constexpr int kFrames = 13;
    constexpr double kDelay = 0.1;
    Value const left = 0.0;
    Value const right = 100.0;
    Value const red = FloatVec4{1.0, 0.0, 0.0, 1.0};
    Value const blue = FloatVec4{0.0, 0.0, 1.0, 1.0};
    for (int frame = 0; frame < kFrames; ++frame) {
        double const t = static_cast<double>(frame) / (kFrames - 1);
        std::cout << "frame " << frame << ": x " << ease(EasingFunction::CubicInOut, left, right, t)
                  << ", color " << ease(EasingFunction::SinusoidalOut, red, blue, t) << ", dots";
        for (int dot = 0; dot < 3; ++dot) {
            // `ease` continues beyond its ends; clamp the progress to stay there.
            double const own = std::clamp(t - dot * kDelay, 0.0, 1.0);
            std::cout << " " << ease(EasingFunction::QuadraticOut, left, right, own);
        }
        std::cout << "\n";
    }
}
