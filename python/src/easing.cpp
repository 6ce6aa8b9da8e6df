// Easing of numbers, vectors, values and arrays of progress.

#include "casters.h"
#include "conversions.h"
#include "module.h"

#include <pybind11/stl.h>

#include <string>
#include <vector>

using namespace tarn::engine;

namespace tarn_python {

namespace {

using Progress = py::array_t<double, py::array::c_style | py::array::forcecast>;

// Results have the shape of the progress, plus an axis for the components of a vector.
template <class T>
py::array_t<double> easeArray(EasingFunction function, T from, T to, Progress const& progress) {
    constexpr std::size_t kComponents = sizeof(T) / sizeof(double);
    std::vector<py::ssize_t> shape(progress.shape(), progress.shape() + progress.ndim());
    if (kComponents > 1) shape.push_back(static_cast<py::ssize_t>(kComponents));
    py::array_t<double> results(shape);
    double const* const in = progress.data();
    T* const out = reinterpret_cast<T*>(results.mutable_data());
    auto const count = static_cast<std::size_t>(progress.size());
    {
        py::gil_scoped_release const released;
        easeEach(function, from, to, in, count, out);
    }
    return results;
}

// Empty for a single number.
Optional<Progress> toProgress(py::object const& t) {
    if (isNumber(t) || isValue(t)) return {};
    py::object const asArray = py::module_::import("numpy").attr("asarray");
    py::object const array = asArray(t);
    std::string const kind = toString(py::str(array.attr("dtype").attr("kind")));
    if (kind != "f" && kind != "i" && kind != "u" && kind != "b") {
        throw py::type_error("the progress must be a number or an array of numbers");
    }
    return Progress(asArray(array, "float64"));
}

template <class T>
py::object easeVector(EasingFunction function, T from, T to, py::object const& t) {
    if (Optional<Progress> const progress = toProgress(t)) {
        return easeArray(function, from, to, *progress);
    }
    if constexpr (std::is_same_v<T, double>) {
        return py::float_(ease(function, from, to, toDouble(t)));
    } else {
        return fromVector(ease(function, from, to, toDouble(t)));
    }
}

py::object easeAny(EasingFunction function, py::object const& start, py::object const& end,
                   py::object const& t) {
    if (isValue(start) || isValue(end)) {
        return py::cast(ease(function, toValue(start), toValue(end), toDouble(t)));
    }
    Optional<std::vector<double>> const starts = ifVector(start);
    Optional<std::vector<double>> const ends = ifVector(end);
    if (!starts && !ends) return easeVector(function, toDouble(start), toDouble(end), t);
    if (!starts || !ends || starts->size() != ends->size()) {
        throw py::type_error("both ends must be numbers, or vectors of the same size");
    }
    std::vector<double> const& a = *starts;
    std::vector<double> const& b = *ends;
    if (a.size() == 2) {
        return easeVector(function, FloatVec2{a[0], a[1]}, FloatVec2{b[0], b[1]}, t);
    }
    if (a.size() == 3) {
        return easeVector(function, FloatVec3{a[0], a[1], a[2]}, FloatVec3{b[0], b[1], b[2]}, t);
    }
    return easeVector(function, FloatVec4{a[0], a[1], a[2], a[3]},
                      FloatVec4{b[0], b[1], b[2], b[3]}, t);
}

}  // namespace

void defineEasing(py::module_& module) {
    using EF = EasingFunction;
    defineEnumeration<EF>(module, "EasingFunction",
                          "The curves, with the numbers that documents store.",
                          {{"LINEAR", EF::Linear},
                           {"QUADRATIC_IN", EF::QuadraticIn},
                           {"QUADRATIC_OUT", EF::QuadraticOut},
                           {"QUADRATIC_IN_OUT", EF::QuadraticInOut},
                           {"CUBIC_IN", EF::CubicIn},
                           {"CUBIC_OUT", EF::CubicOut},
                           {"CUBIC_IN_OUT", EF::CubicInOut},
                           {"EXPONENTIAL_IN", EF::ExponentialIn},
                           {"EXPONENTIAL_OUT", EF::ExponentialOut},
                           {"EXPONENTIAL_IN_OUT", EF::ExponentialInOut},
                           {"SINUSOIDAL_IN", EF::SinusoidalIn},
                           {"SINUSOIDAL_OUT", EF::SinusoidalOut},
                           {"SINUSOIDAL_IN_OUT", EF::SinusoidalInOut}});
    module.def("easing_function_names", &easingFunctionNames,
               "The names that an editor shows, indexed by enumerator.");
    module.def(
        "string_to_easing_function",
        [](std::string const& name) -> py::object {
            Optional<EF> const function = stringToEasingFunction(name);
            return function ? py::cast(*function) : py::object(py::none());
        },
        py::arg("name"), "The curve of that name, or None.");
    module.def("ease", &easeAny, py::arg("function"), py::arg("start"), py::arg("end"),
               py::arg("t"), py::pos_only(),
               "The point of the curve from `start` to `end` at the progress `t`, which is not "
               "clamped. The ends are numbers, vectors of 2, 3 or 4 numbers, or values. `t` is a "
               "number, or an array of any shape: then the result has its shape, and one more "
               "axis for vectors. The interpreter's lock is released meanwhile.");
}

}  // namespace tarn_python
