// A JSON file as a tree of fields that know their place, and the one way in which input is refused.
//
//     Json const json = readJsonFile("document.json");
//     unsigned long long id = Field(json).at("root").at("id").identifier();

#ifndef DOCUMENT_ROAD_INPUT_H
#define DOCUMENT_ROAD_INPUT_H

#include <Engine/Base/json.h>

#include <cstddef>
#include <functional>
#include <stdexcept>
#include <string>
#include <vector>

using Json = nlohmann::json;

// Deeper input is refused: everything that reads a document afterwards may recurse over it.
constexpr std::size_t kDeepestNesting = 1000;

// Input that cannot be used. `what()` is one line: the place in the file, and what is wrong there.
struct InputError : std::runtime_error {
    InputError(std::string const& place, std::string const& problem)
        : std::runtime_error(place.empty() ? problem : place + ": " + problem) {}
};

// The bytes of the file. Throws an InputError that says why there are none.
std::string readFile(std::string const& name);

// Throws an InputError that names line and column where the text is no JSON, nests too deeply or
// has a number beyond 64 bits.
Json parseJson(std::string const& text);

// A value in the file, and how to get there from the root. A field refers to its parent: keep the
// parents while it is used.
class Field {
public:
    explicit Field(Json const& root) : json(&root) {}

    // The member `key`; refused where it is not there.
    Field at(std::string const& key) const;
    bool has(std::string const& key) const;

    // The member `key` as an array; none where it is absent or null.
    void forEach(std::string const& key, std::function<void(Field const&)> const& visit) const;
    std::vector<double> numbers(std::size_t count) const;

    // The content, refused where it has another type.
    Json const& object() const;
    Json const& array() const;
    std::string text() const;
    double number() const;
    long long integer() const;
    bool truth() const;
    // An integer from 1 to 2^64 - 1.
    unsigned long long identifier() const;
    // Refuses every member that is not among `known`.
    void onlyKeys(std::vector<std::string> const& known) const;

    Field element(std::size_t index) const;
    Json const& raw() const { return *json; }

    // The JSON pointer of this field, "/root/children/3".
    std::string pointer() const;
    [[noreturn]] void refuse(std::string const& problem) const;

private:
    Field(Field const& parentField, Json const& member, std::string name)
        : parent(&parentField), json(&member), step(std::move(name)) {}
    [[noreturn]] void refuseType(std::string const& wanted) const;

    Field const* parent = nullptr;
    Json const* json;
    std::string step;
};

// In one line. Bytes that are no UTF-8 become U+FFFD.
std::string jsonText(Json const& json);

// The text with what a terminal would act on, line ends included, written as escapes.
std::string printable(std::string const& text);

#endif
