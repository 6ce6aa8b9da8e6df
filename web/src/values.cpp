// Values, ports and unstructured data.

#include "native.h"
#include "wire.h"

#include <Engine/Base/base.h>

#include <cstddef>
#include <cstring>
#include <string>
#include <vector>

using namespace tarn::engine;
using emscripten::val;

namespace web {

namespace {

using Bytes = std::string;

template <class Vector>
val numbersOf(Vector const& vector) {
    double numbers[sizeof vector / sizeof(double)];
    std::memcpy(numbers, &vector, sizeof numbers);
    return val(emscripten::typed_memory_view(std::size(numbers), numbers)).call<val>("slice");
}

Value valueOf(Bytes const& bytes) { return Reader(bytes).value(); }
Unstructured dataOf(Bytes const& bytes) { return Reader(bytes).data(); }

double valueNumber(Bytes const& value) { return double(valueOf(value)); }
bool valueTruth(Bytes const& value) { return bool(valueOf(value)); }
// As decimal digits, from which JavaScript makes a BigInt.
std::string valueInteger(Bytes const& value) {
    return std::to_string(static_cast<long long>(valueOf(value)));
}
std::string valueIdentifier(Bytes const& value) {
    return std::to_string(static_cast<unsigned long long>(valueOf(value)));
}
val valueVec2(Bytes const& value) { return numbersOf(FloatVec2(valueOf(value))); }
val valueVec3(Bytes const& value) { return numbersOf(FloatVec3(valueOf(value))); }
val valueVec4(Bytes const& value) { return numbersOf(FloatVec4(valueOf(value))); }
val valueMat4(Bytes const& value) { return numbersOf(FloatMat4(valueOf(value))); }
val valueString(Bytes const& value) { return bytesOf(std::string(valueOf(value))); }
val valueText(Bytes const& value) { return bytesOf(to_string(valueOf(value))); }
val valuePath(Bytes const& value) { return bytesOf(Writer().path(Path(valueOf(value))).bytes); }
val valueData(Bytes const& value) {
    return bytesOf(Writer().data(valueOf(value).asUnstructured()).bytes);
}
val valueAsType(Bytes const& value, unsigned char type) {
    return bytesOf(Writer().value(valueOf(value).asType(Type(type))).bytes);
}
val valueDefault(unsigned char type, unsigned char qualifier) {
    return bytesOf(Writer().value(Value::defaultValue(Type(type), qualifier)).bytes);
}
bool valueEquals(Bytes const& a, Bytes const& b) { return valueOf(a) == valueOf(b); }
val valueCast(Bytes const& value, Bytes const& typeInfo) {
    Value const given = valueOf(value);
    TypeInfo const port = Reader(typeInfo).typeInfo();
    return bytesOf(Writer().value(castValueToType(given, port)).bytes);
}
std::string portName(Bytes const& typeInfo, bool plural) {
    return portNameForTypeInfo(Reader(typeInfo).typeInfo(), plural);
}

std::string nameOfType(unsigned char type) { return typeToString(Type(type)); }
int typeOfName(std::string const& name) {
    Optional<Type> const type = stringToType(name);
    return type ? int(*type) : -1;
}
bool isResource(unsigned char type) { return typeIsResource(Type(type)); }
bool shouldCopy(unsigned char type) { return typeShouldCopyAcrossDeletedConnections(Type(type)); }

double dataNumber(Bytes const& data) { return dataOf(data).asFloat(); }
bool dataTruth(Bytes const& data) { return dataOf(data).asBool(); }
std::string dataInteger(Bytes const& data) { return std::to_string(dataOf(data).asInteger()); }
std::string dataIdentifier(Bytes const& data) { return std::to_string(dataOf(data).asId()); }
val dataString(Bytes const& data) { return bytesOf(dataOf(data).asString()); }
val dataText(Bytes const& data, double maxBytes, double maxDepth) {
    return bytesOf(dataOf(data).toText(static_cast<std::size_t>(maxBytes),
                                       static_cast<std::size_t>(maxDepth)));
}
bool dataEquals(Bytes const& a, Bytes const& b) { return dataOf(a) == dataOf(b); }
double dataNumberAt(Bytes const& data, double otherwise) {
    return dataOf(data).numberAt({}, otherwise);
}
std::string dataIntegerAt(Bytes const& data, unsigned low, unsigned high) {
    auto const otherwise = static_cast<long long>(idOf(low, high));
    return std::to_string(dataOf(data).integerAt({}, otherwise));
}
bool dataBoolAt(Bytes const& data, bool otherwise) { return dataOf(data).boolAt({}, otherwise); }

}  // namespace

EMSCRIPTEN_BINDINGS(values) {
    native<&valueNumber>("valueNumber");
    native<&valueTruth>("valueTruth");
    native<&valueInteger>("valueInteger");
    native<&valueIdentifier>("valueIdentifier");
    native<&valueVec2>("valueVec2");
    native<&valueVec3>("valueVec3");
    native<&valueVec4>("valueVec4");
    native<&valueMat4>("valueMat4");
    native<&valueString>("valueString");
    native<&valueText>("valueText");
    native<&valuePath>("valuePath");
    native<&valueData>("valueData");
    native<&valueAsType>("valueAsType");
    native<&valueDefault>("valueDefault");
    native<&valueEquals>("valueEquals");
    native<&valueCast>("valueCast");
    native<&portName>("portName");
    native<&nameOfType>("typeToString");
    native<&typeOfName>("stringToType");
    native<&isResource>("typeIsResource");
    native<&shouldCopy>("typeShouldCopyAcrossDeletedConnections");
    native<&dataNumber>("dataNumber");
    native<&dataTruth>("dataTruth");
    native<&dataInteger>("dataInteger");
    native<&dataIdentifier>("dataIdentifier");
    native<&dataString>("dataString");
    native<&dataText>("dataText");
    native<&dataEquals>("dataEquals");
    native<&dataNumberAt>("dataNumberAt");
    native<&dataIntegerAt>("dataIntegerAt");
    native<&dataBoolAt>("dataBoolAt");
}

}  // namespace web
