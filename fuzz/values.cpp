// Compares random values with a simple model: construction, conversions, comparison, output, and
// conversion to unstructured data and back.

#include "model.h"

#include <Engine/Base/path.h>
#include <Engine/Base/value.h>

#include <array>
#include <sstream>
#include <vector>

using namespace fuzz;
using namespace tarn::engine;

namespace {

constexpr std::size_t kTypes = 14;

struct Model {
    Type type = Type::Float;
    long long integer = 0;
    bool truth = false;
    unsigned long long id = 0;
    std::array<double, 4> components{};  // A number uses the first one.
    std::array<double, 16> matrix{};
    std::string text;
    std::vector<PathElement> elements;
    Tree tree;

    static Model random(Input& input) {
        Model model;
        model.type = static_cast<Type>(input.below(kTypes));
        switch (model.type) {
            case Type::Float:
            case Type::Vec2:
            case Type::Vec3:
            case Type::Vec4:
                for (double& d : model.components) d = input.anyDouble();
                break;
            case Type::Mat4:
                for (double& d : model.matrix) d = input.anyDouble();
                break;
            case Type::Boolean: model.truth = input.chance(); break;
            case Type::Int: model.integer = static_cast<long long>(input.word()); break;
            case Type::Image:
            case Type::Video:
            case Type::Sound:
            case Type::Model: model.id = input.chance() ? input.word() : input.below(3); break;
            case Type::Path:
                for (std::size_t n = input.below(4); n > 0; --n) {
                    model.elements.push_back(
                        {static_cast<PathInstruction>(input.below(5)), {{input.number(), 1.0}}});
                }
                break;
            case Type::String: model.text = input.text(20); break;
            case Type::Unstructured: model.tree = Tree::random(input, 3); break;
        }
        return model;
    }

    std::size_t dimensions() const {
        switch (type) {
            case Type::Vec2: return 2;
            case Type::Vec3: return 3;
            case Type::Vec4: return 4;
            default: return 0;
        }
    }
    bool isResource() const {
        return type == Type::Image || type == Type::Video || type == Type::Sound ||
               type == Type::Model;
    }

    Value build() const {
        auto const& c = components;
        switch (type) {
            case Type::Float: return c[0];
            case Type::Vec2: return FloatVec2{c[0], c[1]};
            case Type::Vec3: return FloatVec3{c[0], c[1], c[2]};
            case Type::Vec4: return FloatVec4{c[0], c[1], c[2], c[3]};
            case Type::Mat4: {
                FloatMat4 result;
                for (std::size_t i = 0; i < 16; ++i) result.elements[i] = matrix[i];
                return result;
            }
            case Type::Boolean: return truth;
            case Type::Int: return integer;
            case Type::Image:
            case Type::Video:
            case Type::Sound:
            case Type::Model: return Value(id, type);
            case Type::Path: return Path(elements);
            case Type::String: return text;
            case Type::Unstructured: return tree.build();
        }
        return {};
    }

    double asDouble() const {
        switch (type) {
            case Type::Float:
            case Type::Vec2:
            case Type::Vec3:
            case Type::Vec4: return components[0];
            case Type::Mat4: return 0.0;
            case Type::Boolean: return truth ? 1.0 : 0.0;
            case Type::Int: return static_cast<double>(integer);
            case Type::Image:
            case Type::Video:
            case Type::Sound:
            case Type::Model: return id != 0 ? 1.0 : 0.0;
            case Type::Path: return elements.empty() ? 0.0 : 1.0;
            case Type::String: return textAsNumber(text);
            case Type::Unstructured: return tree.asFloat();
        }
        return 0.0;
    }
    long long asInteger() const {
        if (type == Type::Int) return integer;
        return type == Type::Unstructured ? tree.asInteger() : toInteger(asDouble());
    }
    bool asBool() const {
        switch (type) {
            case Type::Int: return integer != 0;
            case Type::String: return !text.empty();
            case Type::Unstructured: return tree.asBool();
            case Type::Vec2:
            case Type::Vec3:
            case Type::Vec4:
                for (std::size_t i = 0; i < dimensions(); ++i) {
                    if (!(components[i] == 0.0)) return true;
                }
                return false;
            default: return !(asDouble() == 0.0);
        }
    }
    unsigned long long asId() const {
        if (type == Type::Unstructured) return tree.asId();
        return isResource() ? id : 0;
    }
    std::array<double, 4> asVector() const {
        std::array<double, 4> result{};
        if (dimensions() > 0) {
            for (std::size_t i = 0; i < dimensions(); ++i) result[i] = components[i];
        } else if (type == Type::Float || type == Type::Int || type == Type::Boolean) {
            result.fill(asDouble());
        } else if (type == Type::Unstructured) {
            result = tree.vector();
        }
        return result;
    }
    std::string shown() const {
        std::string result;
        switch (type) {
            case Type::Float: return numberText(components[0], '.');
            case Type::Vec2:
            case Type::Vec3:
            case Type::Vec4:
                for (std::size_t i = 0; i < dimensions(); ++i) {
                    result += (i > 0 ? ", " : "") + numberText(components[i], '.');
                }
                return result;
            case Type::Mat4:
                for (std::size_t i = 0; i < 16; ++i) {
                    result += numberText(matrix[i], '.') + (i % 4 == 3 ? " \n" : " ");
                }
                return result;
            case Type::Boolean: return truth ? "1" : "0";
            case Type::Int: return std::to_string(integer);
            case Type::Image:
            case Type::Video:
            case Type::Sound:
            case Type::Model: return std::to_string(id);
            case Type::Path: return elements.empty() ? "Empty Path" : "Path";
            case Type::String: return text;
            case Type::Unstructured:
                return tree.kind == Tree::String ? tree.text : std::string("unstructured");
        }
        return result;
    }
    std::string asText() const {
        bool const unshown = type == Type::Unstructured && tree.kind != Tree::String;
        return unshown ? "??" : shown();
    }
    Tree asTree() const {
        Tree result;
        char const* const keys[] = {"X", "Y", "Z", "W"};
        switch (type) {
            case Type::Float:
                result.kind = Tree::Float;
                result.number = components[0];
                break;
            case Type::Vec2:
            case Type::Vec3:
            case Type::Vec4:
                result.kind = Tree::Map;
                for (std::size_t i = 0; i < dimensions(); ++i) {
                    Tree& entry = result.entries[keys[i]];
                    entry.kind = Tree::Float;
                    entry.number = components[i];
                }
                break;
            case Type::Boolean:
            case Type::Int:
                result.kind = Tree::Integer;
                result.integer = asInteger();
                break;
            case Type::String:
                result.kind = Tree::String;
                result.text = text;
                break;
            case Type::Unstructured: return tree;
            default: break;
        }
        return result;
    }

    bool equals(Model const& other) const {
        if (type != other.type) return false;
        switch (type) {
            case Type::Float: return components[0] == other.components[0];
            case Type::Vec2:
            case Type::Vec3:
            case Type::Vec4:
                for (std::size_t i = 0; i < dimensions(); ++i) {
                    if (!(components[i] == other.components[i])) return false;
                }
                return true;
            case Type::Mat4:
                for (std::size_t i = 0; i < 16; ++i) {
                    if (tests::bits(matrix[i]) != tests::bits(other.matrix[i])) return false;
                }
                return true;
            case Type::Boolean: return truth == other.truth;
            case Type::Int: return integer == other.integer;
            case Type::Image:
            case Type::Video:
            case Type::Sound:
            case Type::Model: return id == other.id;
            case Type::Path:
                if (elements.size() != other.elements.size()) return false;
                for (std::size_t i = 0; i < elements.size(); ++i) {
                    if (elements[i].instruction != other.elements[i].instruction ||
                        elements[i].points[0].x != other.elements[i].points[0].x) {
                        return false;
                    }
                }
                return true;
            case Type::String: return text == other.text;
            case Type::Unstructured: return tree.equals(other.tree);
        }
        return false;
    }
};

void checkReadings(Value const& value, Model const& model) {
    check(value.type() == model.type, "type");
    check(same(double(value), model.asDouble()), "double");
    check(static_cast<long long>(value) == model.asInteger(), "long long");
    check(bool(value) == model.asBool(), "bool");
    check(static_cast<unsigned long long>(value) == model.asId(), "identifier");
    auto const v = model.asVector();
    FloatVec2 const v2 = value;
    FloatVec3 const v3 = value;
    FloatVec4 const v4 = value;
    check(same(v2.x, v[0]) && same(v2.y, v[1]), "vector of 2");
    check(same(v3.x, v[0]) && same(v3.y, v[1]) && same(v3.z, v[2]), "vector of 3");
    check(same(v4.x, v[0]) && same(v4.y, v[1]) && same(v4.z, v[2]) && same(v4.w, v[3]),
          "vector of 4");
    FloatMat4 const matrix = value;
    for (std::size_t i = 0; i < 16; ++i) {
        double const identity = i % 5 == 0 ? 1.0 : 0.0;
        check(same(matrix.elements[i], model.type == Type::Mat4 ? model.matrix[i] : identity),
              "matrix");
    }
    check(Path(value) == (model.type == Type::Path ? Path(model.elements) : Path()), "path");
    check(std::string(value) == model.asText(), "string");
    check(to_string(value) == model.shown(), "text");
    std::ostringstream stream;
    stream << value;
    check(stream.str() == model.shown(), "output to a stream");
    check(holds(value.asUnstructured(), model.asTree()), "data");
    check((value.asFloatMat4() != nullptr) == (model.type == Type::Mat4) &&
              (value.ifPath() != nullptr) == (model.type == Type::Path) &&
              (value.ifString() != nullptr) == (model.type == Type::String) &&
              (value.ifUnstructured() != nullptr) == (model.type == Type::Unstructured),
          "payload");
}

void checkAsType(Value const& value, Model const& model, Type type) {
    Model expected;
    expected.type = type;
    expected.components = model.asVector();
    if (type == Type::Float) expected.components[0] = model.asDouble();
    expected.truth = model.asBool();
    expected.integer = model.asInteger();
    expected.id = model.asId();
    for (std::size_t i = 0; i < 16; ++i) expected.matrix[i] = i % 5 == 0 ? 1.0 : 0.0;
    if (model.type == Type::Mat4) expected.matrix = model.matrix;
    expected.text = model.asText();
    if (model.type == Type::Path) expected.elements = model.elements;
    expected.tree = model.asTree();
    checkReadings(value.asType(type), expected);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    Input input(data, size);
    std::vector<Model> models;
    Loop values;
    do {
        models.push_back(Model::random(input));
        values.push_back(models.back().build());
        checkReadings(values.back(), models.back());
    } while (!input.ended() && values.size() < 12);

    // Copies, moves and assignments, in any order.
    for (std::size_t n = input.below(8); n > 0; --n) {
        std::size_t const from = input.below(values.size());
        std::size_t const to = input.below(values.size());
        if (input.chance()) {
            values[to] = values[from];
        } else {
            Value copy = values[from];
            values[to] = std::move(copy);
        }
        models[to] = models[from];
    }
    for (std::size_t i = 0; i < values.size(); ++i) {
        checkReadings(values[i], models[i]);
        for (std::size_t j = 0; j < values.size(); ++j) {
            // A shared payload equals itself, whatever it contains.
            bool const shared = values[i].ifUnstructured() != nullptr &&
                                values[i].ifUnstructured() == values[j].ifUnstructured();
            bool const equal = shared || models[i].equals(models[j]);
            check((values[i] == values[j]) == equal, "equality");
            check((values[i] != values[j]) == !equal, "inequality");
        }
        Type const type = static_cast<Type>(input.below(kTypes));
        checkAsType(values[i], models[i], type);
    }
    return 0;
}
