// Compares formatted numbers with the C library's formatting, byte by byte.
//
//     number_text [COUNT]        100,000,000 unless said otherwise

#include <Engine/Base/value.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <random>
#include <string>

namespace {

std::string formatted(double d) {
    char buffer[128];
    std::snprintf(buffer, sizeof buffer, std::abs(d) >= 1000.0 ? "%.1f" : "%.2f", d);
    std::string text = buffer;
    if (text.find('.') != std::string::npos) {
        while (text.back() == '0') text.pop_back();
        if (text.back() == '.') text.pop_back();
    }
    return text == "-0" ? "0" : text;
}

double fromBits(std::uint64_t bits) {
    double d;
    std::memcpy(&d, &bits, sizeof d);
    return d;
}

}  // namespace

int main(int argc, char** argv) {
    long long const count = argc > 1 ? std::atoll(argv[1]) : 100000000;
    std::mt19937_64 random(2);
    for (long long i = 0; i < count; ++i) {
        std::uint64_t const word = random();
        double d = 0.0;
        switch (i % 8) {
            case 0: d = fromBits(word); break;
            // Exact ties, and their neighbours on either side.
            case 1: d = static_cast<double>(word % 1600000) / 8.0 - 100000.0; break;
            case 2:
                d = std::nextafter(static_cast<double>(word % 16000) / 8.0 - 1000.0, 1e9);
                break;
            case 3:
                d = std::nextafter(static_cast<double>(word % 16000) / 8.0 - 1000.0, -1e9);
                break;
            // Hundredths and half hundredths, as close as a double comes.
            case 4: d = static_cast<double>(word % 400000) / 200.0 - 1000.0; break;
            case 5:
                d = std::ldexp(static_cast<double>(word >> 11), -static_cast<int>(word % 128));
                break;
            // Powers of ten, and numbers that are cut.
            case 6:
                d = std::pow(10.0, static_cast<double>(word % 309)) * (word % 2 == 0 ? 1 : -1);
                break;
            default:
                d = std::ldexp(static_cast<double>(word >> 11), 360 + static_cast<int>(word % 20));
                break;
        }
        std::string const text = to_string(tarn::engine::Value(d));
        if (text != formatted(d)) {
            std::printf("%a: %s instead of %s\n", d, text.c_str(), formatted(d).c_str());
            return 1;
        }
    }
    std::printf("%lld numbers have the text that the C library gives\n", count);
}
