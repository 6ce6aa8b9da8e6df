// Types of ports: names, clamping and loops.

#include <Engine/Base/value.h>

#include <Engine/Base/detail/immortal.h>
#include <Engine/Base/detail/unreachable.h>

#include <algorithm>
#include <cstddef>
#include <limits>
#include <ostream>
#include <string>

namespace tarn::engine {

namespace {

// The element of an empty loop.
Value const& nullValue() {
    static detail::Immortal<Value> const null;
    return null.value;
}

}  // namespace

bool TypeInfo::operator==(TypeInfo const& other) const {
    return type == other.type && subtype == other.subtype && min == other.min && max == other.max &&
           extra == other.extra;
}
bool TypeInfo::operator!=(TypeInfo const& other) const { return !(*this == other); }

std::string portNameForTypeInfo(TypeInfo typeInfo, bool plural) {
    switch (typeInfo.type) {
        case Type::Float:
        case Type::Int: return plural ? "Numbers" : "Number";
        case Type::Vec2: return plural ? "Positions" : "Position";
        case Type::Vec3: return plural ? "3D Points" : "Point 3D";
        case Type::Vec4: return plural ? "Colors" : "Color";
        case Type::Mat4: return plural ? "Matrices" : "Matrix";
        case Type::Boolean:
            if (typeInfo.subtype == 1) return plural ? "Pulses" : "Pulse";
            return plural ? "Booleans" : "Boolean";
        case Type::Image: return plural ? "Images" : "Image";
        case Type::Video: return plural ? "Videos" : "Video";
        case Type::Sound: return plural ? "Sounds" : "Sound";
        case Type::Path: return plural ? "Paths" : "Path";
        case Type::String: return plural ? "Strings" : "String";
        case Type::Model: return plural ? "Models" : "Model";
        case Type::Unstructured:
            if (typeInfo.subtype == 1) return plural ? "Layers" : "Layer";
            return "Unstructured";
    }
    TARN_ENGINE_BASE_UNREACHABLE("Engine/Base/value");
}

// Deliberate: the value is copied, not moved.
Value castValueToType(Value&& value, TypeInfo const& typeInfo) {
    Value const& named = value;
    return castValueToType(named, typeInfo);
}

void indexLoopCasting(Loop const& loop, TypeInfo const& typeInfo, unsigned long long first,
                      std::size_t count, Value const** results) noexcept {
    for (std::size_t done = 0; done < count;) {
        // Up to the end of the loop, or to where the index wraps around.
        unsigned long long const index = first + done;
        unsigned long long const left = std::numeric_limits<unsigned long long>::max() - index;
        std::size_t const size = std::max<std::size_t>(loop.size(), 1);
        std::size_t const start = static_cast<std::size_t>(index % size);
        std::size_t length = std::min(count - done, size - start);
        if (left < length) length = static_cast<std::size_t>(left) + 1;
        for (std::size_t i = 0; i < length; ++i) {
            results[done + i] = loop.empty() ? &detail::castNullValue(typeInfo)
                                             : &castValueToType(loop[start + i], typeInfo);
        }
        done += length;
    }
}

Value const& detail::castNullValue(TypeInfo const& typeInfo) noexcept {
    return castValueToType(nullValue(), typeInfo);
}

Loop const& nullLoop() {
    static detail::Immortal<Loop> const loop;
    return loop.value;
}

std::ostream& operator<<(std::ostream& stream, TypeInfo const& typeInfo) {
    return stream << "[type: " << typeToString(typeInfo.type) << "]";
}

}  // namespace tarn::engine
