// Paths, their builder, their geometry and SVG path data.

#include "casters.h"
#include "conversions.h"
#include "module.h"

#include <Engine/Base/path_geometry.h>
#include <Engine/Base/svg_path.h>

#include <pybind11/stl.h>

#include <memory>
#include <string>
#include <vector>

using namespace tarn::engine;

namespace tarn_python {

namespace {

// An element of a path, which it keeps alive.
struct Element {
    std::shared_ptr<Path const> path;
    std::size_t position;

    PathElement const& operator*() const { return path->elements[position]; }
};

PathElement elementFrom(PathInstruction instruction, py::object const& points) {
    PathElement element{instruction, {}};
    for (py::handle const point : copiedTuple(points)) element.points.push_back(toVec2(point));
    return element;
}

// A read-only view of the points with shape (n, 2).
py::array pointsOf(Element const& element) {
    Points const& points = (*element).points;
    py::capsule const owner(new std::shared_ptr<Path const>(element.path), [](void* path) {
        delete static_cast<std::shared_ptr<Path const>*>(path);
    });
    py::array view(
        py::dtype::of<double>(),
        {static_cast<py::ssize_t>(points.size()), static_cast<py::ssize_t>(2)},
        {static_cast<py::ssize_t>(sizeof(FloatVec2)), static_cast<py::ssize_t>(sizeof(double))},
        &points.data()->x, owner);
    view.attr("flags").attr("writeable") = false;
    return view;
}

py::array_t<double> allPoints(Path const& path) {
    std::size_t count = 0;
    for (PathElement const& element : path.elements) count += element.points.size();
    py::array_t<double> array({static_cast<py::ssize_t>(count), static_cast<py::ssize_t>(2)});
    double* place = array.mutable_data();
    for (PathElement const& element : path.elements) {
        for (FloatVec2 const& p : element.points) {
            *place++ = p.x;
            *place++ = p.y;
        }
    }
    return array;
}

py::tuple elementsOf(std::shared_ptr<Path> const& path) {
    py::tuple elements(path->elements.size());
    for (std::size_t i = 0; i < elements.size(); ++i) elements[i] = py::cast(Element{path, i});
    return elements;
}

std::string elementRepr(Element const& element) {
    py::object const points = pointsOf(element).attr("tolist")();
    return "PathElement(PathInstruction." +
           py::cast<std::string>(py::cast((*element).instruction).attr("name")) + ", " +
           reprOf(points) + ")";
}

std::shared_ptr<Path> toPath(std::vector<Element> const& elements) {
    auto path = std::make_shared<Path>();
    path->elements.reserve(elements.size());
    for (Element const& element : elements) path->elements.push_back(*element);
    return path;
}

py::object optionalPath(Optional<Path> path) {
    if (!path) return py::none();
    return py::cast(std::make_shared<Path>(*std::move(path)));
}

void defineElements(py::module_& module) {
    using I = PathInstruction;
    defineEnumeration<I>(module, "PathInstruction", "What an element of a path draws.",
                         {{"MOVE_TO", I::moveTo},
                          {"LINE_TO", I::lineTo},
                          {"CURVE_TO", I::curveTo},
                          {"QUAD_CURVE_TO", I::quadCurveTo},
                          {"CLOSE", I::close}});
    module.def("path_instruction_to_string", &pathInstructionToString, py::arg("instruction"),
               "\"moveTo\" to \"close\".");
    module.def(
        "string_to_path_instruction",
        [](std::string const& name) {
            Optional<I> const instruction = parsePathInstruction(name);
            if (!instruction) {
                raise(PyExc_ValueError, "unknown path instruction \"" + name + "\"");
            }
            return *instruction;
        },
        py::arg("name"), "The instruction of that name. Raises ValueError for any other.");
    py::class_<Element>(module, "PathElement", "One instruction of a path. Never changes.")
        .def(py::init([](I instruction, py::object const& points) {
                 auto path = std::make_shared<Path>();
                 path->elements.push_back(elementFrom(instruction, points));
                 return Element{path, 0};
             }),
             py::arg("instruction"), py::arg("points") = py::tuple(),
             "The points are pairs of numbers, or an array of shape (n, 2). Their number is not "
             "checked against the instruction.")
        .def_property_readonly(
            "instruction", [](Element const& e) { return (*e).instruction; }, "A PathInstruction.")
        .def_property_readonly("points", &pointsOf,
                               "An array of shape (n, 2): control points, then the end. It is the "
                               "memory of the path, which it keeps alive, and cannot be written.")
        .def(
            "__eq__", [](Element const& a, Element const& b) { return *a == *b; },
            py::is_operator())
        .def("__repr__", &elementRepr)
        .def("__reduce__", [](Element const& e) {
            return py::make_tuple(py::type::of<Element>(),
                                  py::make_tuple((*e).instruction, pointsOf(e).attr("tolist")()));
        });
    requireInit<Element>();
}

void definePath(py::module_& module) {
    py::class_<Path, std::shared_ptr<Path>>(
        module, "Path", "An outline: elements in drawing order, y downwards. Never changes.")
        .def(py::init(&toPath), py::arg("elements") = std::vector<Element>())
        .def_property_readonly("elements", &elementsOf, "The elements, as a tuple.")
        .def_property_readonly("points", &allPoints,
                               "All points one after another, in a new array of shape (n, 2).")
        .def("__len__", [](Path const& path) { return path.elements.size(); })
        .def(
            "__eq__", [](Path const& a, Path const& b) { return a == b; }, py::is_operator())
        .def("__hash__",
             [](std::shared_ptr<Path> const& path) {
                 return std::hash<Value>()(Value(std::shared_ptr<Path const>(path)));
             })
        .def("__repr__",
             [](std::shared_ptr<Path> const& path) {
                 return "Path(" + reprOf(py::list(elementsOf(path))) + ")";
             })
        .def(
            "bounds",
            [](Path const& path) -> py::object {
                Optional<Bounds> const box = bounds(path);
                if (!box) return py::none();
                return py::make_tuple(fromVector(box->min), fromVector(box->max));
            },
            "The smallest box around what is drawn, ((x, y), (x, y)), or None where nothing is.")
        .def(
            "translated",
            [](Path const& path, py::object const& offset) {
                return std::make_shared<Path>(translated(path, toVec2(offset)));
            },
            py::arg("offset"), "A copy with every point moved by an offset.")
        .def(
            "scaled",
            [](Path const& path, py::object const& factors) {
                return std::make_shared<Path>(scaled(path, toVec2(factors)));
            },
            py::arg("factors"), "Larger and smaller about the origin, by a factor for x and y.")
        .def("__reduce__", [](std::shared_ptr<Path> const& path) {
            return py::make_tuple(py::type::of<Path>(), py::make_tuple(py::list(elementsOf(path))));
        });
    requireInit<Path>();
    module.def(
        "interpolate",
        [](Path const& a, Path const& b, double t) { return optionalPath(interpolate(a, b, t)); },
        py::arg("a"), py::arg("b"), py::arg("t"),
        "Interpolates from `a` (t is 0) to `b` (t is 1); None where the two have other "
        "elements.");
    module.def("svg_path_data", &svgPathData, py::arg("path"), "The `d` of an SVG path element.");
    module.def(
        "path_from_svg_path_data",
        [](std::string const& data) {
            Optional<Path> path = pathFromSvgPathData(data);
            if (!path) throw py::value_error("invalid SVG path data");
            return std::make_shared<Path>(*std::move(path));
        },
        py::arg("data"), "The path of such data. Raises ValueError for anything else.");
}

void defineBuilder(py::module_& module) {
    using Self = PathBuilder&;
    auto const self = py::return_value_policy::reference_internal;
    auto const point = [](py::object const& p) { return toVec2(p); };
    py::class_<PathBuilder>(module, "PathBuilder",
                            "Builds a path instruction by instruction. Every call but `build` "
                            "gives the builder, so that calls chain. Points are pairs of numbers.")
        .def(py::init<>())
        .def_property_readonly(
            "current_point", [](PathBuilder const& b) { return fromVector(b.currentPoint); },
            "The end of the last instruction that has one; at first (0, 0).")
        .def(
            "move_to", [=](Self b, py::object const& p) -> Self { return b.moveTo(point(p)); },
            py::arg("p"), self, "Starts an outline at p.")
        .def(
            "line_to", [=](Self b, py::object const& p) -> Self { return b.lineTo(point(p)); },
            py::arg("p"), self, "A straight line to p.")
        .def(
            "curve_to",
            [=](Self b, py::object const& c1, py::object const& c2, py::object const& p) -> Self {
                return b.curveTo(point(c1), point(c2), point(p));
            },
            py::arg("c1"), py::arg("c2"), py::arg("p"), self,
            "A cubic curve with two control points.")
        .def(
            "quad_curve_to",
            [=](Self b, py::object const& c, py::object const& p) -> Self {
                return b.quadCurveTo(point(c), point(p));
            },
            py::arg("c"), py::arg("p"), self, "A quadratic curve with a control point.")
        .def(
            "close", [](Self b) -> Self { return b.close(); }, self,
            "A line back to the start of the outline. The current point does not change.")
        .def(
            "append", [](Self b, Path const& path) -> Self { return b.append(path); },
            py::arg("path"), self, "Every element of a path. The current point stays.")
        .def(
            "arc_to",
            [=](Self b, py::object const& p, bool verticalFirst) -> Self {
                return b.arcTo(point(p), verticalFirst);
            },
            py::arg("p"), py::arg("vertical_first"), self,
            "A quarter of an ellipse, along y first or along x first.")
        .def(
            "ellipse",
            [=](Self b, py::object const& center, py::object const& radii) -> Self {
                return b.ellipse(point(center), point(radii));
            },
            py::arg("center"), py::arg("radii"), self,
            "`radii` are half the width and half the height.")
        .def(
            "circle",
            [=](Self b, py::object const& center, double radius) -> Self {
                return b.circle(point(center), radius);
            },
            py::arg("center"), py::arg("radius"), self, "An ellipse with one radius.")
        .def(
            "round_rect",
            [=](Self b, py::object const& origin, py::object const& size, double radius) -> Self {
                return b.roundRect(point(origin), point(size), radius);
            },
            py::arg("origin"), py::arg("size"), py::arg("radius"), self,
            "`origin` is the corner of smallest x and y; `radius` is at most half the width and "
            "half the height.")
        .def(
            "hexa_rect",
            [=](Self b, py::object const& origin, py::object const& size, double cut) -> Self {
                return b.hexaRect(point(origin), point(size), cut);
            },
            py::arg("origin"), py::arg("size"), py::arg("cut"), self,
            "A rectangle whose corners are cut off, `cut` along either edge.")
        .def(
            "build", [](PathBuilder const& b) { return std::make_shared<Path>(b.build()); },
            "A path of all elements so far. The builder can go on.");
    requireInit<PathBuilder>();
}

}  // namespace

void definePaths(py::module_& module) {
    defineElements(module);
    definePath(module);
    defineBuilder(module);
}

}  // namespace tarn_python
