// Parses JSON, looks values up in it, and writes it.
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

    // A boolean is the integer 1 or 0: the library's data has no booleans.
    std::cout << "public: " << data.boolAt({"public"}, false) << "\n";

    // find, ifMap, ifArray and ifString return pointers to the content; asMap and similar functions
    // copy it.
    if (Unstructured const* tags = data.find("tags")) {
        for (Unstructured const& tag : *tags->ifArray())
            std::cout << "tag " << *tag.ifString() << "\n";
    }
    // Missing values and values of another kind have a default; `lookup` tells the two apart.
    Unstructured::Lookup lookup = {};
    std::cout << data.stringAt({"author"}, "nobody", &lookup) << ", "
              << (lookup == Unstructured::Lookup::WrongKind ? "not a string\n" : "\n");

    // Vectors are read from the members X, Y, Z and W, or from elements by position.
    FloatVec2 const size = *data.find("size");
    std::cout << "size: " << size.x << " by " << size.y << "\n";

    // Identifiers keep all 64 bits, and only convert by asId.
    Unstructured const& id = *data.find("id");
    std::cout << "id: " << id.asId() << ", as an integer " << id.asInteger() << "\n";

    Unstructured const kept = Unstructured::removeEmptyValues(*data.ifMap());
    std::cout << toJson(kept).dump(2) << "\n";
}
