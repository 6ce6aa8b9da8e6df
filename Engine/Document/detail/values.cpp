#include <Engine/Document/detail/values.h>

#include <Engine/Base/path.h>
#include <Engine/Document/detail/texts.h>

#include <algorithm>
#include <array>
#include <limits>
#include <utility>

namespace tarn::engine::detail {

namespace {

bool isWrong(ValueFault& fault, char const* wanted, Unstructured const& found) {
    fault.problem = "expected " + std::string(wanted) + ", found " + describe(found);
    return false;
}

bool toNumber(Unstructured const& data, double& number, ValueFault& fault) {
    if (data.isNumber()) {
        number = data.asFloat();
        return true;
    }
    if (data.isIdentifier()) {
        number = static_cast<double>(data.asId());
        return true;
    }
    if (data.isString()) {
        if (Optional<double> const other = nonFiniteNumber(*data.ifString())) {
            number = *other;
            return true;
        }
    }
    return isWrong(fault, "a number", data);
}

template <std::size_t count>
bool toNumbers(Unstructured const& data, std::array<double, count>& numbers, ValueFault& fault) {
    if (!data.isArray()) return isWrong(fault, "an array", data);
    if (data.size() != count) {
        fault.problem =
            "expected " + std::to_string(count) + " numbers, found " + std::to_string(data.size());
        return false;
    }
    for (std::size_t i = 0; i < count; ++i) {
        if (toNumber(*data.find(i), numbers[i], fault)) continue;
        fault.step = pointerStep(i);
        return false;
    }
    return true;
}

bool toInteger(Unstructured const& data, Value& value, ValueFault& fault) {
    if (data.type() == Unstructured::Type::Integer) {
        value = data.asInteger();
        return true;
    }
    if (data.isIdentifier()) {
        fault.problem = "an integer beyond the signed 64 bits";
        return false;
    }
    if (data.isString()) {
        if (Optional<long long> const number = integerOfText(*data.ifString())) {
            value = *number;
            return true;
        }
    }
    return isWrong(fault, "an integer", data);
}

bool toResource(Unstructured const& data, Type type, Value& value, ValueFault& fault) {
    if (data.isIdentifier() ||
        (data.type() == Unstructured::Type::Integer && data.asInteger() >= 0)) {
        value = Value(data.asId(), type);
        return true;
    }
    if (data.isString()) {
        if (Optional<unsigned long long> const id = identifierOfText(*data.ifString())) {
            value = Value(*id, type);
            return true;
        }
    }
    return isWrong(fault, "an identifier, an integer from 0 on", data);
}

bool toInstruction(Unstructured const& name, PathInstruction& instruction, ValueFault& fault) {
    if (name.isString()) {
        Optional<PathInstruction> const known = parsePathInstruction(*name.ifString());
        if (known) {
            instruction = *known;
            return true;
        }
        fault.problem = "unknown path instruction \"" + printable(*name.ifString()) + "\"";
        return false;
    }
    constexpr long long kLargest = std::numeric_limits<unsigned char>::max();
    if (name.type() == Unstructured::Type::Integer && name.asInteger() >= 0 &&
        name.asInteger() <= kLargest) {
        instruction = PathInstruction(name.asInteger());
        return true;
    }
    return isWrong(fault, "the name of a path instruction", name);
}

std::size_t pointsOf(PathInstruction instruction) {
    switch (instruction) {
        case PathInstruction::moveTo:
        case PathInstruction::lineTo: return 1;
        case PathInstruction::quadCurveTo: return 2;
        case PathInstruction::curveTo: return 3;
        case PathInstruction::close: break;
    }
    return 0;
}

// ["lineTo", 1, 2]
bool toUsualElement(Unstructured const& data, PathElement& element, ValueFault& fault) {
    if (data.empty()) {
        fault.problem = "a path element starts with its name";
        return false;
    }
    Unstructured const& name = *data.find(0);
    if (!name.isString()) {
        fault.step = pointerStep(0);
        return isWrong(fault, "the name of a path instruction", name);
    }
    if (!toInstruction(name, element.instruction, fault)) {
        fault.step = pointerStep(0);
        return false;
    }
    std::size_t const count = 2 * pointsOf(element.instruction);
    if (data.size() != 1 + count) {
        fault.problem = *name.ifString() + " takes " + std::to_string(count) + " coordinates";
        return false;
    }
    for (std::size_t i = 1; i <= count; i += 2) {
        FloatVec2 point;
        for (auto const& [coordinate, position] :
             {std::pair{&point.x, i}, std::pair{&point.y, i + 1}}) {
            if (toNumber(*data.find(position), *coordinate, fault)) continue;
            fault.step = pointerStep(position);
            return false;
        }
        element.points.push_back(point);
    }
    return true;
}

// {"instruction": "lineTo", "points": [[1, 2], [3, 4]]}, with any number of points
bool toUnusualElement(Unstructured const& data, PathElement& element, ValueFault& fault) {
    Unstructured const* const name = data.find("instruction");
    Unstructured const* const points = data.find("points");
    if (name == nullptr || points == nullptr || data.size() != 2) {
        fault.problem = R"(a path element has an "instruction" and "points")";
        return false;
    }
    if (!toInstruction(*name, element.instruction, fault)) {
        fault.step = pointerStep("instruction");
        return false;
    }
    fault.step = pointerStep("points");
    if (!points->isArray()) return isWrong(fault, "an array", *points);
    for (std::size_t i = 0; i < points->size(); ++i) {
        std::array<double, 2> point = {};
        ValueFault inner;
        if (!toNumbers(*points->find(i), point, inner)) {
            fault.problem = std::move(inner.problem);
            fault.step += pointerStep(i) + inner.step;
            return false;
        }
        element.points.push_back({point[0], point[1]});
    }
    fault.step.clear();
    return true;
}

bool toPath(Unstructured const& data, Value& value, ValueFault& fault) {
    if (!data.isArray()) return isWrong(fault, "an array", data);
    Path path;
    path.elements.reserve(data.size());
    for (std::size_t i = 0; i < data.size(); ++i) {
        Unstructured const& part = *data.find(i);
        PathElement& element = path.elements.emplace_back();
        bool const isRight = part.isMap()     ? toUnusualElement(part, element, fault)
                             : part.isArray() ? toUsualElement(part, element, fault)
                                              : isWrong(fault, "an array", part);
        if (!isRight) {
            fault.step = pointerStep(i) + fault.step;
            return false;
        }
    }
    value = std::move(path);
    return true;
}

}  // namespace

bool toValue(Scalar const& content, Type type, Value& value, ValueFault& fault) {
    Unstructured const& data = content.data;
    if (type == Type::Boolean) {
        if (!content.isBoolean || data.isArray() || data.isMap())
            return isWrong(fault, "true or false", data);
        value = data.asInteger() != 0;
        return true;
    }
    if (type == Type::Unstructured) {
        value = data;
        return true;
    }
    if (content.isBoolean) {
        fault.problem = "true and false are for ports of type boolean";
        return false;
    }
    switch (type) {
        case Type::Float: {
            double number = 0.0;
            if (!toNumber(data, number, fault)) return false;
            value = number;
            return true;
        }
        case Type::Vec2: {
            std::array<double, 2> n = {};
            if (!toNumbers(data, n, fault)) return false;
            value = FloatVec2{n[0], n[1]};
            return true;
        }
        case Type::Vec3: {
            std::array<double, 3> n = {};
            if (!toNumbers(data, n, fault)) return false;
            value = FloatVec3{n[0], n[1], n[2]};
            return true;
        }
        case Type::Vec4: {
            std::array<double, 4> n = {};
            if (!toNumbers(data, n, fault)) return false;
            value = FloatVec4{n[0], n[1], n[2], n[3]};
            return true;
        }
        case Type::Mat4: {
            std::array<double, 16> n = {};
            if (!toNumbers(data, n, fault)) return false;
            FloatMat4 matrix;
            std::copy(n.begin(), n.end(), matrix.elements);
            value = matrix;
            return true;
        }
        case Type::Int: return toInteger(data, value, fault);
        case Type::Image:
        case Type::Video:
        case Type::Sound:
        case Type::Model: return toResource(data, type, value, fault);
        case Type::Path: return toPath(data, value, fault);
        case Type::String:
            if (!data.isString()) return isWrong(fault, "a string", data);
            value = *data.ifString();
            return true;
        case Type::Boolean:
        case Type::Unstructured: break;
    }
    fault.problem = "this type has no values";
    return false;
}

Value nullValue(Type type) {
    Value value = Value::defaultValue(type);
    Value const taken = std::move(value);
    return value;  // NOLINT(bugprone-use-after-move,clang-analyzer-cplusplus.Move)
}

}  // namespace tarn::engine::detail
