// Generates SVG and HTML: elements, numbers, paths and escaped strings.
//
//     Path const circle = PathBuilder().circle({0, 0}, 5.0).build();
//     std::cout << Element("path").set("d", pathData(circle)).markup();

#ifndef ANIMATION_MARKUP_H
#define ANIMATION_MARKUP_H

#include <Engine/Base/path.h>

#include <string>
#include <type_traits>

// Six digits, which is what viewers compute with. SVG has no NaN and no infinity: a NaN is 0, and
// large numbers are clamped.
std::string number(double value);

std::string point(tarn::engine::FloatVec2 p);

// The value of a `d` attribute, "M 5 0 C 5 2.76 ...", with such numbers.
std::string pathData(tarn::engine::Path path);

// Escapes a string for content and for quoted attributes of SVG or HTML. Characters that XML does
// not allow are removed: control characters, U+FFFE and U+FFFF.
std::string escaped(std::string const& text);

// An element with its attributes and content, in the order in which they are added.
//
//     Element("a").set("href", "#b").text("A & B").markup();  // <a href="#b">A &amp; B</a>
class Element {
public:
    explicit Element(std::string const& elementName)
        : name(elementName), start("<" + elementName) {}

    // Values are escaped. Numbers have six digits, integers all of them.
    Element& set(std::string const& attribute, std::string const& value);
    Element& set(std::string const& attribute, char const* value);
    Element& set(std::string const& attribute, double value);
    template <class Integer, std::enable_if_t<std::is_integral_v<Integer>, int> = 0>
    Element& set(std::string const& attribute, Integer value) {
        return set(attribute, std::to_string(value));
    }
    // Sets `viewBox`.
    Element& setView(double left, double top, double width, double height);
    // Attributes that are already markup.
    Element& setMarkup(std::string const& attributes);

    // Content: a string, which is escaped, or markup.
    Element& text(std::string const& content);
    Element& add(std::string const& markup);
    Element& add(Element const& element) { return add(element.markup()); }

    // Has an end tag if there is content, even empty content.
    std::string markup() const;

private:
    std::string name;
    std::string start;
    std::string content;
    bool hasContent = false;
};

// A paragraph and a line end.
std::string paragraph(std::string const& text);

#endif
