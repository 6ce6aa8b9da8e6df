// Constructs values, converts, compares and prints them.
//
//     value_tour

#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>

#include <iostream>

using namespace tarn::engine;

int main() {
    // Construct: `type()` tells one of fourteen types.
    Loop const values{Value(),
                      Value(2.5),
                      Value(-7),
                      Value(true),
                      Value(FloatVec2{3.0, 4.0}),
                      Value(FloatVec4{1.0, 0.5, 0.0, 1.0}),
                      Value("12.5 apples"),
                      Value(PathBuilder().circle({0.0, 0.0}, 5.0).build()),
                      Value(Unstructured(Unstructured::Map{{"X", 30}, {"Y", 40}}))};

    // Convert: every value to every type. Conversions without a sensible result return zero, false
    // or empty values, never an error.
    for (Value const& value : values) {
        double const number = value;
        long long const integer = value;
        FloatVec2 const position = value;
        std::cout << typeToString(value.type()) << " " << value << ": number " << number
                  << ", integer " << integer << ", position " << position.x << " " << position.y
                  << (value ? ", true\n" : ", false\n");
    }

    // Access without a copy: null where the value has another type.
    if (std::string const* text = values[6].ifString()) std::cout << text->size() << " bytes\n";
    if (values[1].ifString() == nullptr) std::cout << values[1] << " is not a string\n";

    // Convert to another type, or clamp to the bounds of a port.
    std::cout << values[8] << " as a position: " << values[8].asType(Type::Vec2) << "\n";
    TypeInfo port;
    port.type = Type::Float;
    port.max = Value(2.0);
    std::cout << values[1] << " at most 2: " << castValueToType(values[1], port) << "\n";

    // Compare: values of different types differ, whatever they convert to.
    std::cout << std::boolalpha << "1 and 1.0: " << (Value(1) == Value(1.0)) << "\n"
              << "2.5 and 2.5: " << (Value(2.5) == values[1]) << "\n";
}
