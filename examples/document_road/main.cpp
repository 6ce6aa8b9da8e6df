// document_road: takes a document through the library: read, printed, asked, animated.
//
//     document_road examples/documents/small.json --frames 3

#include "document.h"
#include "report.h"

#include <CLI/CLI.hpp>

#include <chrono>
#include <iostream>
#include <optional>
#include <sstream>

#include <unistd.h>

namespace {

constexpr int kBadInput = 2;

// A line on standard error that is written over, and only where people watch and wait.
class Progress {
public:
    explicit Progress(long long frameCount) : frames(frameCount) {}
    ~Progress() {
        if (shown) std::cerr << "\r\033[K" << std::flush;
    }
    Progress(Progress const&) = delete;
    Progress& operator=(Progress const&) = delete;

    void operator()(long long frame) {
        auto const now = std::chrono::steady_clock::now();
        if (!terminal || now - last < std::chrono::milliseconds(200)) return;
        last = now;
        shown = true;
        std::cerr << "\rframe " << frame << " of " << frames << "\033[K" << std::flush;
    }

private:
    long long frames;
    bool terminal = isatty(STDERR_FILENO) != 0;
    bool shown = false;
    std::chrono::steady_clock::time_point last = std::chrono::steady_clock::now();
};

}  // namespace

int main(int argc, char** argv) {
    CLI::App app("Reads a document of patches, or a node graph exported by a browser's node "
                 "editor (JSON), and animates it.");
    std::string file;
    bool debug = false;
    long long frames = 13;
    long long every = 1;
    std::optional<unsigned long long> patchId;
    std::optional<unsigned long long> portId;
    app.add_option("FILE", file, "The document")->required();
    app.add_flag("--debug", debug, "Print the graph's debug text");
    app.add_option("--patch", patchId, "Say what the patch ID is and is connected to")
        ->type_name("ID");
    app.add_option("--port", portId, "Say what the port ID is and is connected to")
        ->type_name("ID");
    app.add_option("--frames", frames, "How many frames to evaluate; 0 for none")
        ->type_name("N")
        ->check(CLI::Range(0LL, 10000000LL))
        ->capture_default_str();
    app.add_option("--every", every, "Print every K-th frame")
        ->type_name("K")
        ->check(CLI::Range(1LL, 10000000LL))
        ->capture_default_str();
    try {
        app.parse(argc, argv);
    } catch (CLI::ParseError const& error) {
        return app.exit(error) == 0 ? 0 : kBadInput;
    }

    try {
        Document const document = readDocument(file);
        // All of the output is made before any of it is written.
        std::ostringstream output;
        output << countsText(document);
        if (debug) output << "\n" << document.root << "\n";
        if (patchId) {
            std::string const text = patchText(document, *patchId);
            if (text.empty()) throw InputError("", "no patch " + std::to_string(*patchId));
            output << "\n" << text;
        }
        if (portId) {
            std::string const text = portText(document, *portId);
            if (text.empty()) throw InputError("", "no port " + std::to_string(*portId));
            output << "\n" << text;
        }
        if (frames > 0) {
            Progress progress(frames);
            output << "\n"
                   << framesText(document, frames, every,
                                 [&](long long frame) { progress(frame); });
        }
        std::cout << output.str() << std::flush;
        if (!std::cout) {
            std::cerr << "document_road: the output cannot be written\n";
            return 1;
        }
    } catch (InputError const& error) {
        std::cerr << "document_road: " << printable(file) << ": " << error.what() << "\n";
        return kBadInput;
    } catch (std::bad_alloc const&) {
        std::cerr << "document_road: " << printable(file) << ": not enough memory\n";
        return kBadInput;
    }
    return 0;
}
