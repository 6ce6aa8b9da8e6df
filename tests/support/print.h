// tests/support/print.h: prints types, values, data and paths exactly in failing tests.
//
// GoogleTest finds these functions wherever this is included. A value is printed with its type: 1
// and 1.0 differ.

#ifndef TARN_TESTS_SUPPORT_PRINT_H
#define TARN_TESTS_SUPPORT_PRINT_H

#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>

#include <gtest/gtest.h>

#include <cstddef>
#include <cstdio>
#include <iterator>
#include <ostream>
#include <string>

namespace tests {

/// As many digits as needed to be exact, always with a point or an exponent.
inline std::string exactly(double number) {
    char text[32];
    for (int digits = 1; digits <= 17; ++digits) {
        std::snprintf(text, sizeof text, "%.*g", digits, number);
        double read = 0.0;
        if (std::sscanf(text, "%lf", &read) == 1 && read == number) break;
    }
    std::string result = text;
    if (result.find_first_not_of("-0123456789") == std::string::npos) result += ".0";
    return result;
}

template <std::size_t count>
void printNumbers(double const (&numbers)[count], std::ostream* stream) {
    for (std::size_t i = 0; i < count; ++i) *stream << (i == 0 ? "(" : ", ") << exactly(numbers[i]);
    *stream << ")";
}

}  // namespace tests

namespace tarn::engine {

inline void PrintTo(FloatVec2 const& v, std::ostream* stream) {
    tests::printNumbers({v.x, v.y}, stream);
}
inline void PrintTo(FloatVec3 const& v, std::ostream* stream) {
    tests::printNumbers({v.x, v.y, v.z}, stream);
}
inline void PrintTo(FloatVec4 const& v, std::ostream* stream) {
    tests::printNumbers({v.x, v.y, v.z, v.w}, stream);
}
inline void PrintTo(FloatMat4 const& matrix, std::ostream* stream) {
    tests::printNumbers(matrix.elements, stream);
}

inline void PrintTo(PathElement const& element, std::ostream* stream) {
    *stream << element.instruction;
    for (FloatVec2 const& point : element.points) {
        *stream << " ";
        PrintTo(point, stream);
    }
}

inline void PrintTo(Path const& path, std::ostream* stream) {
    *stream << "path {";
    for (PathElement const& element : path.elements) {
        *stream << (&element == path.elements.data() ? "" : "; ");
        PrintTo(element, stream);
    }
    *stream << "}";
}

inline void PrintTo(Unstructured const& data, std::ostream* stream) {
    *stream << "data " << data.toText(std::size_t(1) << 20, 1000);
}

}  // namespace tarn::engine

namespace tests {

/// Prints the content of a value.
struct ContentPrinter {
    std::ostream* stream;

    void operator()(double number) const { *stream << exactly(number); }
    void operator()(long long integer) const { *stream << integer; }
    void operator()(bool flag) const { *stream << (flag ? "true" : "false"); }
    void operator()(std::string const& text) const { testing::internal::PrintTo(text, stream); }
    void operator()(tarn::engine::FloatVec2 const& v) const { PrintTo(v, stream); }
    void operator()(tarn::engine::FloatVec3 const& v) const { PrintTo(v, stream); }
    void operator()(tarn::engine::FloatVec4 const& v) const { PrintTo(v, stream); }
    void operator()(tarn::engine::FloatMat4 const& matrix) const { PrintTo(matrix, stream); }
    void operator()(tarn::engine::Value::ImageID image) const { *stream << image.id; }
    void operator()(tarn::engine::Value::VideoID video) const { *stream << video.id; }
    void operator()(tarn::engine::Value::SoundID sound) const { *stream << sound.id; }
    void operator()(tarn::engine::Value::ModelID model) const { *stream << model.id; }
    void operator()(tarn::engine::Path const& path) const { PrintTo(path, stream); }
    void operator()(tarn::engine::Unstructured const& data) const { PrintTo(data, stream); }
    template <class Other>
    void operator()(Other const&) const = delete;
};

}  // namespace tests

namespace tarn::engine {

inline void PrintTo(Value const& value, std::ostream* stream) {
    *stream << value.type() << " ";
    value.visit(tests::ContentPrinter{stream});
}

template <class T>
void PrintTo(Optional<T> const& value, std::ostream* stream) {
    *stream << (value ? testing::PrintToString(*value) : "nothing");
}

inline void PrintTo(TypeInfo const& info, std::ostream* stream) {
    *stream << info.type << ", subtype " << int(info.subtype);
    for (Optional<Value> const* bound : {&info.min, &info.max, &info.extra}) {
        *stream << ", ";
        PrintTo(*bound, stream);
    }
}

}  // namespace tarn::engine

#endif
