// SVG and HTML: elements, and numbers, paths and characters as they take them.
//
//     Path const circle = PathBuilder().circle({0, 0}, 5.0).build();
//     std::cout << Element("path").set("d", pathData(circle)).markup();

#ifndef ANIMATION_MARKUP_H
#define ANIMATION_MARKUP_H

#include <Engine/Base/path.h>

#include <string>
#include <type_traits>

// Six digits, which is what viewers calculate with. SVG has no NaN and no infinity: what is not a
// number is 0, and what is too large is cut.
std::string number(double value);

std::string point(tarn::engine::FloatVec2 p);

// The text of a `d` attribute, "M 5 0 C 5 2.76 ...", with such numbers.
std::string pathData(tarn::engine::Path path);

// The text as content or as an attribute in quotes of either kind, of SVG or HTML. What may not
// stand in XML is left out: control characters, and the two last of the first plane.
std::string escaped(std::string const& text);

// An element with its attributes and its content, in the order in which they are given.
//
//     Element("a").set("href", "#b").text("A & B").markup();  // <a href="#b">A &amp; B</a>
class Element {
public:
    explicit Element(std::string const& elementName)
        : name(elementName), start("<" + elementName) {}

    // Values are escaped. Numbers have six digits, integers all of theirs.
    Element& set(std::string const& attribute, std::string const& value);
    Element& set(std::string const& attribute, char const* value);
    Element& set(std::string const& attribute, double value);
    template <class Integer, std::enable_if_t<std::is_integral_v<Integer>, int> = 0>
    Element& set(std::string const& attribute, Integer value) {
        return set(attribute, std::to_string(value));
    }
    // The four numbers of a `viewBox`.
    Element& setView(double left, double top, double width, double height);
    // Attributes that are markup already.
    Element& setMarkup(std::string const& attributes);

    // Content: a text, which is escaped, and what is markup already.
    Element& text(std::string const& content);
    Element& add(std::string const& markup);
    Element& add(Element const& element) { return add(element.markup()); }

    // With an end tag if there is content, be it empty.
    std::string markup() const;

private:
    std::string name;
    std::string start;
    std::string content;
    bool hasContent = false;
};

// A paragraph on a line of its own.
std::string paragraph(std::string const& text);

#endif
