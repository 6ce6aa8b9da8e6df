#include <Engine/Base/svg_path.h>

#include <Engine/Base/detail/radix_point.h>
#include <Engine/Base/detail/shortest_number.h>
#include <Engine/Base/vector_math.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cfenv>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <string_view>

namespace tarn::engine {

namespace {

constexpr double kPi = 3.141592653589793;

// SVG cannot express non-finite numbers.
void append(std::string& text, double number) {
    constexpr double kLargest = std::numeric_limits<double>::max();
    detail::appendShortest(text,
                           std::isnan(number) ? 0.0 : std::clamp(number, -kLargest, kLargest));
}

// Parses path data into a builder, command by command.
class Reader {
public:
    explicit Reader(std::string const& text) : data(text) {}

    // Whether the whole string was valid.
    bool read() {
        skipSpace();
        char command = 0;
        while (position < data.size()) {
            char const c = data[position];
            if (std::strchr("MmLlHhVvCcSsQqTtAaZz", c) != nullptr && c != '\0') {
                if (builder.elements.empty() && c != 'M' && c != 'm') return false;
                command = c;
                ++position;
                skipSpace();
                if (!readCommand(command)) return false;
            } else {
                // More numbers repeat the command; after M they mean L.
                if (command == 0 || command == 'Z' || command == 'z') return false;
                if (command == 'M') command = 'L';
                if (command == 'm') command = 'l';
                if (!readCommand(command)) return false;
            }
            if (command == 'Z' || command == 'z') {
                skipSpace();
            } else {
                skipSpaceAndComma();
            }
        }
        return true;
    }

    Path takePath() { return std::move(builder).build(); }
    std::size_t faultPosition() const { return position; }

private:
    bool atSpace() const {
        return position < data.size() && std::strchr(" \t\n\f\r", data[position]) != nullptr &&
               data[position] != '\0';
    }
    void skipSpace() {
        while (atSpace()) ++position;
    }
    // A comma may stand between numbers only.
    void skipSpaceAndComma() {
        skipSpace();
        if (position >= data.size() || data[position] != ',') return;
        std::size_t const comma = position++;
        skipSpace();
        char const next = position < data.size() ? data[position] : '\0';
        if (next == '\0' || std::strchr("+-.0123456789", next) == nullptr) position = comma;
    }

    static bool isDigit(char c) { return c >= '0' && c <= '9'; }
    std::size_t skipDigits() {
        std::size_t const from = position;
        while (position < data.size() && isDigit(data[position])) ++position;
        return position - from;
    }

    bool readNumber(double& number) {
        std::size_t const from = position;
        if (position < data.size() && (data[position] == '+' || data[position] == '-')) ++position;
        std::size_t digits = skipDigits();
        std::size_t point = std::string::npos;
        if (position + 1 < data.size() && data[position] == '.' && isDigit(data[position + 1])) {
            point = position++ - from;
            digits += skipDigits();
        }
        if (digits == 0) {
            position = from;
            return false;
        }
        if (position < data.size() && (data[position] == 'e' || data[position] == 'E')) {
            std::size_t const beforeExponent = position++;
            if (position < data.size() && (data[position] == '+' || data[position] == '-'))
                ++position;
            if (skipDigits() == 0) position = beforeExponent;
        }
        std::string text = data.substr(from, position - from);
        if (point != std::string::npos) text.replace(point, 1, detail::RadixPoint().text);
        int const errorBefore = errno;
        number = std::strtod(text.c_str(), nullptr);
        errno = errorBefore;
        if (std::isfinite(number)) return true;
        position = from;
        return false;
    }

    template <std::size_t count>
    bool readNumbers(std::array<double, count>& numbers) {
        for (std::size_t i = 0; i < count; ++i) {
            if (i > 0) skipSpaceAndComma();
            if (!readNumber(numbers[i])) return false;
        }
        return true;
    }

    // One digit, 0 or 1; separators may be missing.
    bool readFlag(bool& flag) {
        skipSpaceAndComma();
        if (position >= data.size() || (data[position] != '0' && data[position] != '1'))
            return false;
        flag = data[position++] == '1';
        return true;
    }

    FloatVec2 current() const { return builder.currentPoint; }

    // Drawing after a close begins where the outline began.
    PathBuilder& drawing() {
        if (builder.elements.back().instruction == PathInstruction::close) builder.moveTo(start);
        return builder;
    }

    bool readCommand(char command) {
        bool const isRelative = command >= 'a';
        auto const point = [&](double x, double y) {
            FloatVec2 const p{x, y};
            return isRelative ? current() + p : p;
        };
        char const kind = isRelative ? static_cast<char>(command - 'a' + 'A') : command;
        char const before = lastKind;
        lastKind = kind;
        switch (kind) {
            case 'M': {
                std::array<double, 2> n;
                if (!readNumbers(n)) return false;
                start = point(n[0], n[1]);
                builder.moveTo(start);
                return true;
            }
            case 'L': {
                std::array<double, 2> n;
                if (!readNumbers(n)) return false;
                drawing().lineTo(point(n[0], n[1]));
                return true;
            }
            case 'H': {
                std::array<double, 1> n;
                if (!readNumbers(n)) return false;
                drawing().lineTo({isRelative ? current().x + n[0] : n[0], current().y});
                return true;
            }
            case 'V': {
                std::array<double, 1> n;
                if (!readNumbers(n)) return false;
                drawing().lineTo({current().x, isRelative ? current().y + n[0] : n[0]});
                return true;
            }
            case 'C': {
                std::array<double, 6> n;
                if (!readNumbers(n)) return false;
                return cubicTo(point(n[0], n[1]), point(n[2], n[3]), point(n[4], n[5]));
            }
            case 'S': {
                std::array<double, 4> n;
                if (!readNumbers(n)) return false;
                bool const goesOn = before == 'C' || before == 'S';
                return cubicTo(goesOn ? reflected() : current(), point(n[0], n[1]),
                               point(n[2], n[3]));
            }
            case 'Q': {
                std::array<double, 4> n;
                if (!readNumbers(n)) return false;
                return quadraticTo(point(n[0], n[1]), point(n[2], n[3]));
            }
            case 'T': {
                std::array<double, 2> n;
                if (!readNumbers(n)) return false;
                bool const goesOn = before == 'Q' || before == 'T';
                return quadraticTo(goesOn ? reflected() : current(), point(n[0], n[1]));
            }
            case 'A': {
                std::array<double, 3> shape;
                bool isLarge = false;
                bool isClockwise = false;
                std::array<double, 2> n;
                if (!readNumbers(shape) || !readFlag(isLarge) || !readFlag(isClockwise))
                    return false;
                skipSpaceAndComma();
                if (!readNumbers(n)) return false;
                arcTo({shape[0], shape[1]}, shape[2], isLarge, isClockwise, point(n[0], n[1]));
                return true;
            }
            default:
                builder.close();
                builder.currentPoint = start;
                return true;
        }
    }

    // The last control point, reflected about the current point.
    FloatVec2 reflected() const { return current() * 2.0 - lastControl; }

    bool cubicTo(FloatVec2 c1, FloatVec2 c2, FloatVec2 p) {
        drawing().curveTo(c1, c2, p);
        lastControl = c2;
        return true;
    }
    bool quadraticTo(FloatVec2 c, FloatVec2 p) {
        drawing().quadCurveTo(c, p);
        lastControl = c;
        return true;
    }

    // Converts an elliptical arc to its centre and angles, and draws it in pieces of at most a
    // quarter.
    void arcTo(FloatVec2 radii, double degrees, bool isLarge, bool isClockwise, FloatVec2 end) {
        FloatVec2 const from = current();
        double rx = std::abs(radii.x);
        double ry = std::abs(radii.y);
        if (from == end) return;
        double const phi = std::fmod(degrees, 360.0) * kPi / 180.0;
        double const cosine = std::cos(phi);
        double const sine = std::sin(phi);
        // Half of the chord, in the axes of the ellipse and in units of its radii.
        FloatVec2 const half = from / 2.0 - end / 2.0;
        double const x = (cosine * half.x + sine * half.y) / rx;
        double const y = (cosine * half.y - sine * half.x) / ry;
        double reach = std::hypot(x, y);
        // Radii that are too small are scaled up until they fit.
        if (reach > 1.0) {
            rx *= reach;
            ry *= reach;
            reach = 1.0;
        }
        if (rx == 0.0 || ry == 0.0 || !std::isfinite(reach) || !std::isfinite(rx + ry)) {
            drawing().lineTo(end);
            return;
        }
        // In these units the ellipse is a unit circle, and half of the chord is the sine of half
        // the angle.
        double const small = 2.0 * std::asin(reach);
        double const sweep = (isClockwise ? 1.0 : -1.0) * (isLarge ? 2.0 * kPi - small : small);
        double const first =
            std::atan2(y, x) + (isLarge == isClockwise ? -1.0 : 1.0) * std::acos(reach);

        auto const turned = [&](double u, double v) {
            return FloatVec2{cosine * rx * u - sine * ry * v, sine * rx * u + cosine * ry * v};
        };
        // Relative to the start and not to the centre, which may be far away.
        auto const place = [&](double angle) {
            double const middle = first + angle / 2.0;
            double const chord = 2.0 * std::sin(angle / 2.0);
            return from + turned(-std::sin(middle) * chord, std::cos(middle) * chord);
        };
        int const pieces =
            std::max(1, static_cast<int>(std::ceil(std::abs(sweep) / (kPi / 2.0) - 1e-9)));
        double const piece = sweep / pieces;
        double const k = 4.0 / 3.0 * std::tan(piece / 4.0);
        auto const handle = [&](double angle) {
            return turned(-std::sin(first + angle) * k, std::cos(first + angle) * k);
        };
        FloatVec2 begin = from;
        for (int i = 1; i <= pieces; ++i) {
            FloatVec2 const stop = i == pieces ? end : place(piece * i);
            drawing().curveTo(begin + handle(piece * (i - 1)), stop - handle(piece * i), stop);
            begin = stop;
        }
    }

    std::string const& data;
    std::size_t position = 0;
    char lastKind = 0;
    FloatVec2 start;
    FloatVec2 lastControl;
    PathBuilder builder;
};

}  // namespace

std::string svgPathData(Path const& path) {
    detail::NearestRounding const rounding;
    std::string data;
    for (PathElement const& element : path.elements) {
        char letter = 0;
        std::size_t count = 0;
        switch (element.instruction) {
            case PathInstruction::moveTo: letter = 'M', count = 1; break;
            case PathInstruction::lineTo: letter = 'L', count = 1; break;
            case PathInstruction::curveTo: letter = 'C', count = 3; break;
            case PathInstruction::quadCurveTo: letter = 'Q', count = 2; break;
            case PathInstruction::close: letter = 'Z'; break;
        }
        if (letter == 0 || element.points.size() < count) continue;
        if (data.empty() && letter != 'M') data = "M0 0";
        data += letter;
        for (std::size_t i = 0; i < count; ++i) {
            if (i > 0) data += ' ';
            append(data, element.points[i].x);
            data += ' ';
            append(data, element.points[i].y);
        }
    }
    return data;
}

Optional<Path> pathFromSvgPathData(std::string const& data, std::size_t* fault) {
    detail::NearestRounding const rounding;
    Reader reader(data);
    if (reader.read()) return reader.takePath();
    if (fault != nullptr) *fault = reader.faultPosition();
    return std::nullopt;
}

}  // namespace tarn::engine
