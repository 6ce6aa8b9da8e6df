// JSON in, questions to it, JSON out.
//
//     unstructured_json

#include <Engine/Base/json.h>

#include <iostream>

using namespace tarn::engine;

int main() {
    Unstructured const data = fromJson(nlohmann::json::parse(R"({
        "title": "Badge", "public": true, "author": null, "size": {"X": 80, "Y": 50.5},
        "tags": ["intro", "loop"], "id": 18446744073709551615, "note": ""
    })"));
    std::cout << data.toText() << "\n";

    // A bool is the integer 1 or 0: the library's data has none of its own.
    std::cout << "public: " << data.boolAt({"public"}, false) << "\n";

    // find, ifMap, ifArray and ifString point to the content; asMap and its siblings copy it.
    if (Unstructured const* tags = data.find("tags")) {
        for (Unstructured const& tag : *tags->ifArray())
            std::cout << "tag " << *tag.ifString() << "\n";
    }
    // What is missing or of another kind has a default, and says which of the two it is.
    Unstructured::Lookup lookup = {};
    std::cout << data.stringAt({"author"}, "nobody", &lookup) << ", "
              << (lookup == Unstructured::Lookup::WrongKind ? "not a string\n" : "\n");

    // Vectors are read from members or elements by position.
    FloatVec2 const size = *data.find("size");
    std::cout << "size: " << size.x << " by " << size.y << "\n";

    // Identifiers keep all of their 64 bits, and read as such alone.
    Unstructured const& id = *data.find("id");
    std::cout << "id: " << id.asId() << ", as an integer " << id.asInteger() << "\n";

    Unstructured const kept = Unstructured::removeEmptyValues(*data.ifMap());
    std::cout << toJson(kept).dump(2) << "\n";
}
