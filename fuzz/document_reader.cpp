// Reads any bytes as a document: the result is a document, which survives writing and reading back
// and everything that the example program does, or an error of one line.

#include "fuzz.h"

#include "animation/document.h"
#include "animation/labels.h"
#include "document_road/console.h"

#include <sstream>

using namespace tarn::engine;

namespace {

void checkLine(std::string const& line) {
    fuzz::check(!line.empty() && line.find('\n') == std::string::npos, "one line");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    std::string const bytes(reinterpret_cast<char const*>(data), size);
    DocumentError error;
    Optional<Patch> const root = readDocument(bytes, &error);
    if (!root) {
        std::ostringstream line;
        line << error;
        checkLine(line.str());
        return 0;
    }
    std::string const written = writeDocument(*root);
    Optional<Patch> const back = readDocument(written);
    fuzz::check(back.hasValue() && writeDocument(*back) == written, "what is written is read back");
    try {
        Document const document = parseDocument(bytes);
        std::ostringstream text;
        text << countsText(document) << document.root;
        text << patchText(document, document.root.id);
        text << portText(document, 1);
        text << framesText(document, 3, 1, [](long long) {});
        fuzz::check(!text.str().empty(), "a document is not an empty string");
    } catch (InputError const& refused) {
        checkLine(refused.what());
    }
    return 0;
}
