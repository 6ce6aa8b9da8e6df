// Any bytes are a document, or one line says why not; a document is taken through everything that
// the example does with one.

#include "fuzz.h"

#include "document.h"
#include "report.h"

#include <sstream>

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    std::string const bytes(reinterpret_cast<char const*>(data), size);
    try {
        Document const document = parseDocument(bytes);
        std::ostringstream text;
        text << countsText(document) << document.root;
        text << patchText(document, document.root.id);
        text << portText(document, 1);
        text << framesText(document, 3, 1, [](long long) {});
        fuzz::check(!text.str().empty(), "a document has a text");
    } catch (InputError const& error) {
        std::string const line = error.what();
        fuzz::check(!line.empty() && line.find('\n') == std::string::npos, "one line");
    }
    return 0;
}
