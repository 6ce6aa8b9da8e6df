// python/src/enumerations.h: defines the enumerations as Python's own enum classes.
//
//     defineEnumeration<Type>(module, "Type", {{"FLOAT", Type::Float}});

#ifndef TARN_PYTHON_ENUMERATIONS_H
#define TARN_PYTHON_ENUMERATIONS_H

#include <pybind11/pybind11.h>

#include <cstddef>
#include <initializer_list>
#include <utility>
#include <vector>

namespace tarn_python {

/// The enumerators in Python by number. They live as long as the process.
template <class Enumeration>
std::vector<pybind11::handle>& enumeratorsOf() {
    static std::vector<pybind11::handle> found;
    return found;
}

template <class Enumeration>
void defineEnumeration(pybind11::module_& module, char const* name, char const* documentation,
                       std::initializer_list<std::pair<char const*, Enumeration>> enumerators) {
    pybind11::dict members;
    for (auto const& [key, enumerator] : enumerators) members[key] = static_cast<int>(enumerator);
    pybind11::object made = pybind11::module_::import("enum").attr("IntEnum")(
        name, members, pybind11::arg("module") = "tarn_engine_base");
    made.attr("__doc__") = documentation;
    module.attr(name) = made;
    for (auto const& [key, enumerator] : enumerators) {
        auto& known = enumeratorsOf<Enumeration>();
        auto const number = static_cast<std::size_t>(enumerator);
        if (known.size() <= number) known.resize(number + 1);
        known[number] = pybind11::object(made.attr(key)).release();
    }
}

/// Converts to and from that class. Undefined enumerators do not exist in Python.
template <class Enumeration>
struct EnumerationCaster {
    static constexpr auto name = pybind11::detail::const_name("enum.IntEnum");
    template <class T>
    using cast_op_type = pybind11::detail::cast_op_type<T>;

    bool load(pybind11::handle source, bool) {
        auto const& known = enumeratorsOf<Enumeration>();
        for (std::size_t i = 0; i < known.size(); ++i) {
            if (!known[i].is(source)) continue;
            value = static_cast<Enumeration>(i);
            return true;
        }
        return false;
    }
    static pybind11::handle cast(Enumeration enumerator, pybind11::return_value_policy,
                                 pybind11::handle) {
        return enumeratorsOf<Enumeration>()[static_cast<std::size_t>(enumerator)].inc_ref();
    }
    operator Enumeration*() { return &value; }
    operator Enumeration&() { return value; }

    Enumeration value = {};
};

}  // namespace tarn_python

#define TARN_PYTHON_ENUMERATION(Enumeration)                                                       \
    template <>                                                                                    \
    struct pybind11::detail::type_caster<Enumeration>                                              \
        : tarn_python::EnumerationCaster<Enumeration> {}

#endif
