// document_road: reads a document, prints it, answers questions about it and animates it.
//
//     document_road examples/documents/small.json --frames 3

#include "console.h"

#include "animation/document.h"
#include "animation/labels.h"
#include "report/drawing.h"
#include "report/marks.h"
#include "report/page.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <optional>
#include <sstream>

#include <unistd.h>

using namespace tarn::engine;

namespace {

constexpr int kBadInput = 2;
constexpr int kDiffers = 1;

// A progress line on standard error, which is only shown on a terminal.
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

// Writes a file completely or not at all; other targets, such as a pipe, are written directly.
void writeFile(std::string const& name, std::string const& contents) {
    std::error_code error;
    DocumentError problem;
    bool const exists = std::filesystem::exists(name, error);
    if (!exists || std::filesystem::is_regular_file(name, error)) {
        if (replaceFile(name, contents, &problem)) return;
    } else {
        std::ofstream stream(name, std::ios::binary);
        stream << contents << std::flush;
        if (stream) return;
        problem.message = "it is not taken";
    }
    throw std::runtime_error(printable(name) + " cannot be written: " + problem.message);
}

void refuseToReplace(std::string const& document, std::string const& written) {
    std::error_code error;
    if (std::filesystem::equivalent(document, written, error)) {
        throw std::runtime_error(printable(written) + " is the document itself");
    }
}

// Quotes a word for a shell.
std::string quoted(std::string const& text) {
    std::string result = "'";
    for (char const c : text) result += c == '\'' ? std::string("'\\''") : std::string(1, c);
    return result + "'";
}

struct Options {
    std::string file;
    bool debug = false;
    long long frames = 13;
    long long every = 1;
    long long reportFrames = 120;
    bool paths = false;
    std::string report;
    std::string picture;
    std::string copy;
    std::optional<std::string> other;
    std::optional<unsigned long long> patchId;
    std::optional<unsigned long long> portId;

    explicit Options(CLI::App& app) {
        app.add_option("FILE", file, "The document")->required()->envname("DOCUMENT_ROAD_FILE");
        app.add_flag("--debug", debug, "Print the graph's debug output");
        app.add_option("--patch", patchId, "Describe the patch ID and its connections")
            ->type_name("ID");
        app.add_option("--port", portId, "Describe the port ID and its connections")
            ->type_name("ID");
        addFrames(app);
        addFiles(app);
    }

private:
    void addFrames(CLI::App& app) {
        app.add_option("--frames", frames, "The number of frames to evaluate; 0 for none")
            ->type_name("N")
            ->check(CLI::Range(0LL, 10000000LL))
            ->capture_default_str();
        app.add_option("--every", every, "Print every K-th frame")
            ->type_name("K")
            ->check(CLI::Range(1LL, 10000000LL))
            ->capture_default_str();
        app.add_flag("--paths", paths, "Print the drawing in those frames as SVG path data");
    }

    void addFiles(CLI::App& app) {
        app.add_option("--report", report,
                       "Write a page with the graph, the animation and its plots (needs Graphviz)")
            ->type_name("HTML")
            ->take_last();
        app.add_option("--report-frames", reportFrames, "The number of frames of the page")
            ->type_name("N")
            ->check(CLI::Range(1LL, 10000LL))
            ->capture_default_str();
        app.add_option("--picture", picture,
                       "Write a picture of the graph and of the last frame (needs Graphviz)")
            ->type_name("SVG");
        app.add_option("--write", copy,
                       "Save the graph as a document in our own format; may be FILE itself")
            ->type_name("JSON");
        app.add_option(
               "--compare", other,
               "Print the changes from FILE to FILE2, one per line. Exit with 0 if they are equal, "
               "1 if not, 2 on an error. With --report, the page shows FILE2 and marks the changes")
            ->type_name("FILE2");
    }
};

// Exit status as of `diff`: 0 for equal documents, 1 for changes, 2 for errors.
int compare(Options const& options) {
    std::string const& file = options.file;
    std::string const& other = *options.other;
    std::string const* current = &file;
    try {
        Document const before = openDocument(file);
        current = &other;
        Document const after = openDocument(other);
        Marks const marks = marksOf(before, after);
        if (!options.report.empty()) {
            for (std::string const& input : {file, other}) refuseToReplace(input, options.report);
            std::filesystem::path const fileName = std::filesystem::path(other).filename();
            writeFile(options.report,
                      pageText(after, fileName.string(), options.reportFrames, &marks));
        }
        std::string const text = to_string(marks.changes) + marks.frameRates;
        std::cout << text << std::flush;
        if (!std::cout) throw std::runtime_error("the output cannot be written");
        return text.empty() ? 0 : kDiffers;
    } catch (InputError const& error) {
        std::cerr << "document_road: " << printable(*current) << ": " << error.what() << "\n";
    } catch (std::runtime_error const& error) {
        std::cerr << "document_road: " << error.what() << "\n";
    } catch (std::bad_alloc const&) {
        std::cerr << "document_road: " << printable(*current) << ": not enough memory\n";
    }
    return kBadInput;
}

// Computes the output, and writes the files that were asked for.
std::string answer(Document const& document, Options const& options) {
    std::ostringstream output;
    output << countsText(document);
    if (options.debug) output << "\n" << document.root << "\n";
    if (options.patchId) {
        std::string const text = patchText(document, *options.patchId);
        if (text.empty()) throw InputError("no patch " + std::to_string(*options.patchId));
        output << "\n" << text;
    }
    if (options.portId) {
        std::string const text = portText(document, *options.portId);
        if (text.empty()) throw InputError("no port " + std::to_string(*options.portId));
        output << "\n" << text;
    }
    if (options.frames > 0) {
        Progress progress(options.frames);
        output << "\n"
               << framesText(document, options.frames, options.every,
                             [&](long long frame) { progress(frame); });
    }
    if (options.paths) output << "\n" << pathsText(document, options.frames, options.every);
    for (std::string const& written : {options.picture, options.report})
        refuseToReplace(options.file, written);
    if (!options.picture.empty()) {
        writeFile(options.picture, pictureText(document, std::max(options.frames - 1, 0LL)));
    }
    if (!options.copy.empty())
        writeFile(options.copy, writeDocument(document.root, document.info.framesPerSecond));
    if (!options.report.empty()) {
        std::filesystem::path const fileName = std::filesystem::path(options.file).filename();
        writeFile(options.report, pageText(document, fileName.string(), options.reportFrames));
        std::string const place = std::filesystem::absolute(options.report).string();
        output << "\nreport: " << printable(place)
               << "\nopen it in a browser, for example: xdg-open " << quoted(printable(place))
               << "\n";
    }
    return output.str();
}

}  // namespace

int main(int argc, char** argv) {
    CLI::App app("Reads a document of patches, or a node graph exported by a browser-based "
                 "node editor (JSON), and animates it.",
                 "document_road");
    Options options(app);
    try {
        app.parse(argc, argv);
    } catch (CLI::ParseError const& error) {
        return app.exit(error) == 0 ? 0 : kBadInput;
    }

    if (options.other) return compare(options);
    std::string const shownName = printable(options.file);
    try {
        Document const document = openDocument(options.file);
        std::string const changes = document.info.summary();
        if (!changes.empty())
            std::cerr << "document_road: " << shownName << ": " << changes << "\n";
        // Computes all of the output before any of it is written.
        std::cout << answer(document, options) << std::flush;
        if (!std::cout) {
            std::cerr << "document_road: the output cannot be written\n";
            return 1;
        }
    } catch (InputError const& error) {
        std::cerr << "document_road: " << shownName << ": " << error.what() << "\n";
        return kBadInput;
    } catch (std::runtime_error const& error) {
        std::cerr << "document_road: " << error.what() << "\n";
        return 1;
    } catch (std::bad_alloc const&) {
        std::cerr << "document_road: " << shownName << ": not enough memory\n";
        return kBadInput;
    }
    return 0;
}
