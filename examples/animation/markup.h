// Texts of the pictures and of the page: numbers, paths and characters as SVG and HTML take them.
//
//     std::cout << "<path d='" << pathData(PathBuilder().circle({0, 0}, 5.0).build()) << "'/>";

#ifndef ANIMATION_MARKUP_H
#define ANIMATION_MARKUP_H

#include <Engine/Base/path.h>

#include <string>

// Six digits, which is what viewers calculate with. SVG has no NaN and no infinity: what is not a
// number is 0, and what is too large is cut.
std::string number(double value);

std::string point(tarn::engine::FloatVec2 p);

// The text of a `d` attribute, "M 5 0 C 5 2.76 ...", with such numbers.
std::string pathData(tarn::engine::Path path);

// The text as content or as an attribute in quotes of either kind, of SVG or HTML. What may not
// stand in XML is left out: control characters, and the two last of the first plane.
std::string escaped(std::string const& text);

#endif
