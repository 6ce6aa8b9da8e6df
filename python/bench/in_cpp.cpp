// The C++ side of bench.py: runs the operation in each line of the input once, and prints its
// seconds.
//
//     ease CURVE VALUES        read FILE

#include <Engine/Base/easing.h>
#include <Engine/Base/patch_index.h>
#include <Engine/Document/document.h>

#include <chrono>
#include <cstddef>
#include <cstdlib>
#include <iomanip>
#include <iostream>
#include <memory>
#include <string>
#include <thread>
#include <vector>

using namespace tarn::engine;

namespace {

double ease(EasingFunction function, std::size_t count) {
    std::vector<double> progress(count);
    for (std::size_t i = 0; i < count; ++i) {
        progress[i] = static_cast<double>(i) / static_cast<double>(count - 1);
    }
    auto const start = std::chrono::steady_clock::now();
    // Uninitialised memory, like a new array of results.
    std::unique_ptr<double[]> const results(new double[count]);
    easeEach(function, 10.0, 20.0, progress.data(), count, results.get());
    auto const end = std::chrono::steady_clock::now();
    if (results[count - 1] != 20.0) std::abort();
    return std::chrono::duration<double>(end - start).count();
}

double read(std::string const& file) {
    auto const start = std::chrono::steady_clock::now();
    PatchIndex const index(*loadDocument(file));
    std::size_t found = 0;
    std::vector<Patch const*> pending{&index.root()};
    while (!pending.empty()) {
        Patch const& patch = *pending.back();
        pending.pop_back();
        for (Port const& port : *patch.inputs) {
            if (index.incomingConnection(port.id) != nullptr) ++found;
        }
        for (Patch const& child : *patch.children) pending.push_back(&child);
    }
    auto const end = std::chrono::steady_clock::now();
    if (found == 0) std::abort();
    return std::chrono::duration<double>(end - start).count();
}

}  // namespace

int main() {
    // With a single thread, shared pointers would be counted without atomic operations.
    std::thread other([] {
        for (;;) std::this_thread::sleep_for(std::chrono::hours(1));
    });
    other.detach();
    std::cout << std::setprecision(9);
    std::string command;
    while (std::cin >> command) {
        if (command == "ease") {
            int function = 0;
            std::size_t count = 0;
            std::cin >> function >> count;
            std::cout << ease(EasingFunction(function), count) << std::endl;
        } else {
            std::string file;
            std::cin >> file;
            std::cout << read(file) << std::endl;
        }
    }
}
