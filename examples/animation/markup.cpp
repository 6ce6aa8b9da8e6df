#include "animation/markup.h"

#include <Engine/Base/svg_path.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>

using namespace tarn::engine;

std::string number(double value) {
    constexpr double kLargest = 1e9;
    char text[32];
    double const shown = std::isnan(value) ? 0.0 : std::clamp(value, -kLargest, kLargest);
    std::snprintf(text, sizeof text, "%.6g", shown);
    return text;
}

std::string point(FloatVec2 p) { return number(p.x) + " " + number(p.y); }

std::string pathData(Path path) {
    auto const shown = [](double value) { return std::strtod(number(value).c_str(), nullptr); };
    for (PathElement& element : path.elements) {
        for (FloatVec2& p : element.points) p = {shown(p.x), shown(p.y)};
    }
    std::string text;
    for (char c : svgPathData(path)) {
        bool const isLetter = c >= 'A' && c <= 'Z';
        if (isLetter && !text.empty()) text += ' ';
        text += c;
        if (isLetter && c != 'Z') text += ' ';
    }
    return text;
}

std::string escaped(std::string const& text) {
    std::string result;
    for (std::size_t i = 0; i < text.size(); ++i) {
        char const c = text[i];
        if (text.compare(i, 3, "\xef\xbf\xbe") == 0 || text.compare(i, 3, "\xef\xbf\xbf") == 0) {
            i += 2;
            continue;
        }
        switch (c) {
            case '&': result += "&amp;"; break;
            case '<': result += "&lt;"; break;
            case '>': result += "&gt;"; break;
            case '"': result += "&quot;"; break;
            case '\'': result += "&#39;"; break;
            default:
                if (static_cast<unsigned char>(c) >= 0x20 || c == '\n') result += c;
        }
    }
    return result;
}

Element& Element::set(std::string const& attribute, std::string const& value) {
    return setMarkup(attribute + "=\"" + escaped(value) + "\"");
}
Element& Element::set(std::string const& attribute, char const* value) {
    return set(attribute, std::string(value));
}
Element& Element::set(std::string const& attribute, double value) {
    return set(attribute, number(value));
}
Element& Element::setView(double left, double top, double width, double height) {
    return set("viewBox",
               number(left) + " " + number(top) + " " + number(width) + " " + number(height));
}
Element& Element::setMarkup(std::string const& attributes) {
    start += " " + attributes;
    return *this;
}

Element& Element::text(std::string const& shown) { return add(escaped(shown)); }
Element& Element::add(std::string const& markup) {
    content += markup;
    hasContent = true;
    return *this;
}

std::string Element::markup() const {
    if (!hasContent) return start + "/>";
    return start + ">" + content + "</" + name + ">";
}

std::string paragraph(std::string const& text) { return Element("p").text(text).markup() + "\n"; }
