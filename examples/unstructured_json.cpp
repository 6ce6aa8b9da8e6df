// JSON in, questions to it, JSON out.
//
//     unstructured_json

#include "json.h"

#include <iostream>

using namespace tarn::engine;

int main() {
    Json const json = Json::parse(R"({
        "title": "Badge", "public": true, "author": null, "size": {"X": 80, "Y": 50.5},
        "tags": ["intro", "loop"], "id": 18446744073709551615, "note": ""
    })");
    Unstructured const data = toUnstructured(json);
    Unstructured::Map const& members = *data.ifMap();

    // A truth value is the integer 1 or 0: the library's data has none of its own.
    std::cout << "public: " << members.at("public").asInteger() << "\n";

    // asMap, asArray, asString copy the content; ifMap, ifArray, ifString point to it.
    std::string const title = members.at("title").asString();
    std::cout << title << ", " << members.at("title").ifString()->size() << " bytes\n";
    for (Unstructured const& tag : *members.at("tags").ifArray()) {
        std::cout << "tag " << *tag.ifString() << "\n";
    }
    // What is of another kind reads as empty, or is null.
    std::cout << members.at("title").asArray().size() << " elements, "
              << (members.at("title").ifArray() == nullptr ? "no array\n" : "an array\n");

    // Vectors are read from members or elements by position.
    FloatVec2 const size = members.at("size");
    std::cout << "size: " << size.x << " by " << size.y << "\n";

    // Identifiers keep all of their 64 bits, and read as such alone.
    std::cout << "id: " << members.at("id").asId() << ", as an integer "
              << members.at("id").asInteger() << "\n";

    Unstructured const kept = Unstructured::removeEmptyValues(members);
    std::cout << toJson(kept).dump(2) << "\n";
}
