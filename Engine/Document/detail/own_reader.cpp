#include <Engine/Document/detail/own_reader.h>

#include <Engine/Document/detail/identifiers.h>
#include <Engine/Document/detail/kinds.h>
#include <Engine/Document/detail/lists.h>
#include <Engine/Document/detail/texts.h>

#include <array>
#include <cmath>
#include <iterator>
#include <limits>
#include <string_view>
#include <utility>

namespace tarn::engine::detail {

enum class OwnReader::Key : unsigned char {
    None,
    Schema,
    Version,
    FramesPerSecond,
    Identifiers,
    Root,
    Id,
    Kind,
    Name,
    Descriptor,
    ModelLayer,
    Inputs,
    Outputs,
    Attributes,
    Children,
    Connections,
    Tag,
    Type,
    Subtype,
    Default,
    DefaultType,
    Min,
    MinType,
    Max,
    MaxType,
    Extra,
    ExtraType,
    From,
    To,
    AdditionalLayers,
};

namespace {

// Names indexed by `Key`.
constexpr std::array<std::string_view, 30> kKeyNames{"",
                                                     "$schema",
                                                     "version",
                                                     "framesPerSecond",
                                                     "identifiers",
                                                     "root",
                                                     "id",
                                                     "kind",
                                                     "name",
                                                     "descriptor",
                                                     "modelLayer",
                                                     "inputs",
                                                     "outputs",
                                                     "attributes",
                                                     "children",
                                                     "connections",
                                                     "tag",
                                                     "type",
                                                     "subtype",
                                                     "default",
                                                     "defaultType",
                                                     "min",
                                                     "minType",
                                                     "max",
                                                     "maxType",
                                                     "extra",
                                                     "extraType",
                                                     "from",
                                                     "to",
                                                     "additionalLayers"};

template <class... Keys>
constexpr std::uint32_t setOf(Keys... keys) {
    return ((std::uint32_t(1) << static_cast<unsigned>(keys)) | ...);
}

// Destroying a graph is recursive, and browsers have small stacks.
#if defined(TARN_ENGINE_DOCUMENT_DEEPEST)
constexpr std::size_t kDeepest = TARN_ENGINE_DOCUMENT_DEEPEST;
#else
constexpr std::size_t kDeepest = 10000;
#endif
constexpr long long kVersion = 1;

std::string tooDeep() { return " nest deeper than " + std::to_string(kDeepest) + " levels"; }

bool isNumberOf(Unstructured const& data, long long& number) {
    if (data.type() == Unstructured::Type::Integer) {
        number = data.asInteger();
        return true;
    }
    return false;
}

}  // namespace

// Position

std::string OwnReader::pointer() const {
    std::string result;
    for (Level const& level : levels) {
        switch (level.place) {
            case Place::Start: break;
            case Place::Patches:
            case Place::Ports:
            case Place::Connections:
            case Place::ModelLayers:
            case Place::ConnectionEnd: result += pointerStep(level.position); break;
            case Place::Document:
            case Place::Patch:
            case Place::Port:
            case Place::Connection:
            case Place::ModelLayer:
                if (level.key != Key::None) {
                    result += pointerStep(kKeyNames[static_cast<std::size_t>(level.key)]);
                }
        }
    }
    return result;
}

bool OwnReader::has(Key key) const {
    return (levels.back().seen >> static_cast<unsigned>(key) & 1u) != 0;
}

bool OwnReader::push(Place place) {
    levels.push_back({place, Key::None, 0, 0});
    if (place == Place::Patches) patches.emplace_back();
    if (place == Place::ModelLayers) layers.emplace_back();
    return true;
}

// Parsing

char const* OwnReader::wantedFor(Key key) {
    switch (key) {
        case Key::Id:
        case Key::From:
        case Key::To: return "an identifier, an integer from 0 on";
        case Key::Tag:
        case Key::Subtype:
        case Key::Version: return "an integer";
        case Key::FramesPerSecond: return "a number";
        case Key::Kind: return "the name or the number of a kind";
        case Key::Root:
        case Key::ModelLayer:
        case Key::Attributes: return "an object";
        case Key::Inputs:
        case Key::Outputs:
        case Key::Children:
        case Key::Connections:
        case Key::AdditionalLayers: return "an array";
        case Key::None:
        case Key::Schema:
        case Key::Identifiers:
        case Key::Name:
        case Key::Descriptor:
        case Key::Type:
        case Key::Default:
        case Key::DefaultType:
        case Key::Min:
        case Key::MinType:
        case Key::Max:
        case Key::MaxType:
        case Key::Extra:
        case Key::ExtraType: break;
    }
    return "a string";
}

bool OwnReader::refuseType(Unstructured const& found) {
    char const* wanted = "an object";
    switch (levels.empty() ? Place::Start : levels.back().place) {
        case Place::ConnectionEnd: wanted = wantedFor(Key::Id); break;
        case Place::Connection: wanted = "an array"; break;
        case Place::Document:
        case Place::Patch:
        case Place::Port:
        case Place::ModelLayer: wanted = wantedFor(levels.back().key); break;
        case Place::Start:
        case Place::Patches:
        case Place::Ports:
        case Place::Connections:
        case Place::ModelLayers: break;
    }
    return refuse("expected " + std::string(wanted) + ", found " + describe(found));
}

bool OwnReader::onKey(std::string& key) {
    using K = Key;
    constexpr std::uint32_t kOfDocument =
        setOf(K::Schema, K::Version, K::FramesPerSecond, K::Identifiers, K::Root);
    constexpr std::uint32_t kOfPatch =
        setOf(K::Id, K::Kind, K::Name, K::Descriptor, K::ModelLayer, K::Inputs, K::Outputs,
              K::Attributes, K::Children, K::Connections);
    constexpr std::uint32_t kOfPort =
        setOf(K::Id, K::Tag, K::Name, K::Type, K::Subtype, K::Default, K::DefaultType, K::Min,
              K::MinType, K::Max, K::MaxType, K::Extra, K::ExtraType, K::Attributes);
    constexpr std::uint32_t kOfConnection = setOf(K::From, K::To);
    constexpr std::uint32_t kOfLayer = setOf(K::Id, K::Children, K::AdditionalLayers);
    Level& level = levels.back();
    std::uint32_t const known = level.place == Place::Document     ? kOfDocument
                                : level.place == Place::Patch      ? kOfPatch
                                : level.place == Place::Port       ? kOfPort
                                : level.place == Place::Connection ? kOfConnection
                                                                   : kOfLayer;
    for (std::size_t i = 1; i < kKeyNames.size(); ++i) {
        if ((known >> i & 1u) == 0 || kKeyNames[i] != key) continue;
        level.key = Key(i);
        if (has(level.key)) {
            std::string problem = "the key \"" + key + "\" is repeated";
            if (level.place != Place::Document || key == "root") return refuse(std::move(problem));
            defer(std::move(problem));
        }
        level.seen |= setOf(level.key);
        return true;
    }
    level.key = Key::None;
    if (level.place != Place::Document) {
        return refuseAt(pointer() + pointerStep(key), "unknown key \"" + printable(key) + "\"");
    }
    // A node graph, probably.
    if (key == "nodes") {
        isNodeGraph = true;
        return false;
    }
    if (!deferred) {
        deferred = DocumentError{"unknown key \"" + printable(key) + "\"", pointerStep(key)};
    }
    return true;
}

void OwnReader::defer(std::string problem) {
    if (!deferred) deferred = DocumentError{std::move(problem), pointer()};
}

bool OwnReader::onOpen(bool isObject) {
    Unstructured const found =
        isObject ? Unstructured(Unstructured::Map()) : Unstructured(Unstructured::Array());
    if (levels.empty()) return isObject ? push(Place::Document) : refuseType(found);
    Key const key = levels.back().key;
    switch (levels.back().place) {
        case Place::Document:
            if (key == Key::Root && isObject) return openPatch();
            if (key != Key::None) {
                defer("expected " + std::string(wantedFor(key)) + ", found " + describe(found));
            }
            return ignore();
        case Place::Patch:
            if (key == Key::Attributes && isObject) return captureMap();
            if (key == Key::ModelLayer && isObject) return openLayer();
            if (isObject) return refuseType(found);
            if (key == Key::Inputs || key == Key::Outputs) return push(Place::Ports);
            if (key == Key::Children) return push(Place::Patches);
            if (key == Key::Connections) return push(Place::Connections);
            return refuseType(found);
        case Place::Port:
            if (key == Key::Attributes) return isObject ? captureMap() : refuseType(found);
            return pendingOf(key) != nullptr ? capture(isObject) : refuseType(found);
        case Place::Connection: return isObject ? refuseType(found) : push(Place::ConnectionEnd);
        case Place::ModelLayer:
            if (key == Key::Id || isObject) return refuseType(found);
            return push(Place::ModelLayers);
        case Place::Patches: return isObject ? openPatch() : refuseType(found);
        case Place::Ports: return isObject ? push(Place::Port) : refuseType(found);
        case Place::Connections:
            connection = Connection();
            return isObject ? push(Place::Connection) : refuseType(found);
        case Place::ModelLayers: return isObject ? openLayer() : refuseType(found);
        case Place::Start:
        case Place::ConnectionEnd: break;
    }
    return refuseType(found);
}

bool OwnReader::openPatch() {
    if (openPatches.size() == kDeepest) return refuse("patches" + tooDeep());
    openPatches.emplace_back().builtin = kGroupKind;
    return push(Place::Patch);
}

bool OwnReader::openLayer() {
    if (openLayers.size() == kDeepest) return refuse("model layers" + tooDeep());
    openLayers.emplace_back();
    return push(Place::ModelLayer);
}

bool OwnReader::onString(std::string& text) {
    // Around the root it may be a string of a node graph, which has no such escapes.
    bool const isAround = !levels.empty() && isAt(Place::Document);
    if (!isAround && !decode(text)) return false;
    if (!levels.empty()) {
        Key const key = levels.back().key;
        if (isAt(Place::Patch) && key == Key::Name) {
            openPatches.back().name = std::move(text);
            return true;
        }
        if (isAt(Place::Patch) && key == Key::Descriptor) {
            openPatches.back().descriptor = std::move(text);
            return true;
        }
        if (isAt(Place::Port) && key == Key::Name) {
            port.name = std::move(text);
            return true;
        }
    }
    Scalar scalar{std::move(text), false, false};
    return onScalar(scalar);
}

bool OwnReader::onScalar(Scalar& scalar) {
    if (scalar.isBeyond64Bits && (levels.empty() || !isAt(Place::Document))) {
        return refuse("an integer beyond 64 bits");
    }
    if (levels.empty()) return refuseType(scalar.data);
    // A field that is null counts as missing, except where it is required.
    Key const key = levels.back().key;
    switch (levels.back().place) {
        case Place::Document: setDocumentField(scalar); return true;
        case Place::Patch: return setPatchField(scalar);
        case Place::Port: return setPortField(scalar);
        case Place::ModelLayer:
            if (key == Key::Id) return setIdentifier(openLayers.back().id, scalar);
            return scalar.data.isNull() || refuseType(scalar.data);
        case Place::ConnectionEnd: return setEnd(scalar);
        case Place::Start:
        case Place::Connection:
        case Place::Patches:
        case Place::Ports:
        case Place::Connections:
        case Place::ModelLayers: break;
    }
    return refuseType(scalar.data);
}

void OwnReader::setDocumentField(Scalar const& scalar) {
    Unstructured const& data = scalar.data;
    Key const key = levels.back().key;
    if (data.isNull() && key != Key::Root) return;
    bool isOfType = false;
    switch (key) {
        case Key::Version: {
            long long version = 0;
            isOfType = !scalar.isBoolean && isNumberOf(data, version);
            if (isOfType && version != kVersion) {
                defer("version " + std::to_string(version) +
                      " of the format is not supported; "
                      "the latest is " +
                      std::to_string(kVersion));
            }
            break;
        }
        case Key::FramesPerSecond:
            isOfType = !scalar.isBoolean && data.isNumber();
            framesPerSecond = data.asFloat();
            if (isOfType && !(framesPerSecond > 0.0)) defer("expected a number above 0");
            break;
        case Key::Identifiers:
            isOfType = data.isString();
            mayHaveAnyIdentifiers = data == "any";
            if (isOfType && data != "any" && data != "unique") {
                defer(R"(expected "unique" or "any", found )" + describe(data));
            }
            break;
        case Key::Schema: isOfType = data.isString(); break;
        case Key::None: isOfType = true; break;  // Unknown key.
        default: break;
    }
    if (!isOfType) {
        defer("expected " + std::string(wantedFor(key)) + ", found " + describe(data));
    }
}

bool OwnReader::setPatchField(Scalar const& scalar) {
    Key const key = levels.back().key;
    if (key == Key::Id) return setIdentifier(openPatches.back().id, scalar);
    if (scalar.data.isNull()) return true;
    if (key == Key::Kind && !scalar.isBoolean) return setKind(scalar.data);
    return refuseType(scalar.data);
}

bool OwnReader::setPortField(Scalar& scalar) {
    Unstructured const& data = scalar.data;
    Key const key = levels.back().key;
    if (key == Key::Id) return setIdentifier(port.id, scalar);
    if (Pending* const pending = pendingOf(key)) return setPending(*pending, scalar);
    if (data.isNull()) return key == Key::Type ? refuseType(data) : true;
    if (scalar.isBoolean) return refuseType(data);
    switch (key) {
        case Key::Tag: return setIdentifier(port.tag, scalar);
        case Key::Type: return setType(data);
        case Key::DefaultType: return setValueType(portFields.defaultValue, data);
        case Key::MinType: return setValueType(portFields.min, data);
        case Key::MaxType: return setValueType(portFields.max, data);
        case Key::ExtraType: return setValueType(portFields.extra, data);
        case Key::Subtype: {
            long long number = 0;
            constexpr long long kLargest = std::numeric_limits<unsigned char>::max();
            if (!isNumberOf(data, number)) return refuseType(data);
            if (number < 0 || number > kLargest) return refuse("expected an integer from 0 to 255");
            areFieldsSet = true;
            portFields.subtype = static_cast<unsigned char>(number);
            return true;
        }
        default: return refuseType(data);
    }
}

bool OwnReader::setEnd(Scalar const& scalar) {
    std::size_t const position = levels.back().position++;
    Connection& c = connection;
    bool const isFrom = levels[levels.size() - 2].key == Key::From;
    if (position > 1) return true;  // Rejected at the end.
    unsigned long long& id = position == 0 ? (isFrom ? c.fromPatchId : c.toPatchId)
                                           : (isFrom ? c.fromPortId : c.toPortId);
    --levels.back().position;
    if (!setIdentifier(id, scalar)) return false;
    ++levels.back().position;
    return true;
}

bool OwnReader::setIdentifier(unsigned long long& id, Scalar const& scalar) {
    Unstructured const& data = scalar.data;
    if (data.isIdentifier() || (!scalar.isBoolean && data.type() == Unstructured::Type::Integer &&
                                data.asInteger() >= 0)) {
        id = data.asId();
        return true;
    }
    if (data.isString()) {
        if (Optional<unsigned long long> const number = identifierOfText(*data.ifString())) {
            id = *number;
            return true;
        }
    }
    return refuse(
        "expected an identifier, an integer from 0 on, found " +
        (scalar.isBoolean ? std::string(data.asBool() ? "true" : "false") : describe(data)));
}

bool OwnReader::setKind(Unstructured const& data) {
    unsigned long long& builtin = openPatches.back().builtin;
    if (std::string const* const name = data.ifString()) {
        Optional<unsigned long long> number = stringToKind(*name);
        if (!number) number = identifierOfText(*name);
        if (!number) return refuse("unknown kind \"" + printable(*name) + "\"");
        builtin = *number;
        return true;
    }
    bool const isNumber = data.isIdentifier() ||
                          (data.type() == Unstructured::Type::Integer && data.asInteger() >= 0);
    if (!isNumber) return refuseType(data);
    builtin = data.asId();
    return true;
}

bool OwnReader::setType(Unstructured const& data) {
    TypeInfo& info = port.typeInfo;
    long long number = 0;
    if (isNumberOf(data, number)) {
        constexpr long long kLargest = std::numeric_limits<unsigned char>::max();
        if (number < 0 || number > kLargest) return refuse("expected an integer from 0 to 255");
        info.type = Type(number);
        return true;
    }
    std::string const* const name = data.ifString();
    if (name == nullptr) return refuseType(data);
    if (*name == "pulse" || *name == "layer") {
        info.type = *name == "pulse" ? Type::Boolean : Type::Unstructured;
        info.subtype = 1;
        return true;
    }
    Optional<Type> const type = stringToType(*name);
    if (!type) return refuse("unknown value type \"" + printable(*name) + "\"");
    info.type = *type;
    return true;
}

bool OwnReader::setValueType(Pending& pending, Unstructured const& data) {
    std::string const* const text = data.ifString();
    if (text == nullptr) return refuseType(data);
    areFieldsSet = true;
    constexpr std::string_view kNull = "null ";
    pending.isNullPayload = text->compare(0, kNull.size(), kNull) == 0;
    std::string const name = pending.isNullPayload ? text->substr(kNull.size()) : *text;
    pending.type = stringToType(name);
    if (pending.type && pending.isNullPayload) {
        Type const type = *pending.type;
        pending.isNullPayload = type == Type::Path || type == Type::String || type == Type::Mat4 ||
                                type == Type::Unstructured;
        if (!pending.isNullPayload) pending.type = std::nullopt;
    }
    return pending.type.hasValue() || refuse("unknown value type \"" + printable(*text) + "\"");
}

Pending* OwnReader::pendingOf(Key key) {
    return key == Key::Default ? &portFields.defaultValue
           : key == Key::Min   ? &portFields.min
           : key == Key::Max   ? &portFields.max
           : key == Key::Extra ? &portFields.extra
                               : nullptr;
}

bool OwnReader::setPending(Pending& pending, Scalar& scalar) {
    areFieldsSet = true;
    pending.isGiven = true;
    pending.content = std::move(scalar);
    return true;
}

bool OwnReader::onData(Scalar& captured) {
    return setPending(*pendingOf(levels.back().key), captured);
}

bool OwnReader::onMap(Unstructured::Map map) {
    (isAt(Place::Port) ? port.attributes : openPatches.back().attributes) = std::move(map);
    return true;
}

// Completing records

bool OwnReader::onClose() {
    Place const place = levels.back().place;
    bool const isList = place == Place::Patches || place == Place::Ports ||
                        place == Place::Connections || place == Place::ModelLayers ||
                        place == Place::ConnectionEnd;
    return isList ? closeList() : closeRecord();
}

bool OwnReader::closeList() {
    Level const list = levels.back();
    if (list.place == Place::ConnectionEnd && list.position != 2) {
        levels.pop_back();
        return refuse("expected [patch, port]");
    }
    levels.pop_back();
    Key const key = levels.back().key;
    switch (list.place) {
        case Place::Patches:
            takeInto(openPatches.back().children, patches.back());
            patches.pop_back();
            break;
        case Place::Ports: {
            Patch& patch = openPatches.back();
            // Lists are reused: lists of ports are many and short.
            if (!ports.empty()) {
                (key == Key::Inputs ? patch.inputs : patch.outputs) = arrayOf(std::vector<Port>(
                    std::make_move_iterator(ports.begin()), std::make_move_iterator(ports.end())));
                ports.clear();
            }
            break;
        }
        case Place::Connections: takeInto(openPatches.back().connections, connections); break;
        case Place::ModelLayers: {
            ModelLayer& layer = openLayers.back();
            (key == Key::Children ? layer.children : layer.additionalLayers) =
                takeAll(layers.back());
            layers.pop_back();
            break;
        }
        default: break;
    }
    return true;
}

bool OwnReader::requireField(Key key) {
    levels.back().key = Key::None;
    return has(key) ||
           refuse("\"" + std::string(kKeyNames[static_cast<std::size_t>(key)]) + "\" is missing");
}

bool OwnReader::closeRecord() {
    switch (levels.back().place) {
        case Place::Document:
            hasRoot = has(Key::Root);
            levels.pop_back();
            break;
        case Place::Patch:
            if (!requireField(Key::Id)) return false;
            levels.pop_back();
            if (isAt(Place::Document)) {
                root = std::move(openPatches.back());
            } else {
                patches.back().push_back(std::move(openPatches.back()));
                ++levels.back().position;
            }
            openPatches.pop_back();
            return true;
        case Place::Port: return closePort();
        case Place::Connection:
            if (!requireField(Key::From) || !requireField(Key::To)) return false;
            connections.push_back(connection);
            levels.pop_back();
            ++levels.back().position;
            return true;
        case Place::ModelLayer:
            if (!requireField(Key::Id)) return false;
            levels.pop_back();
            if (isAt(Place::Patch)) {
                openPatches.back().modelLayer = std::move(openLayers.back());
            } else {
                layers.back().push_back(std::move(openLayers.back()));
                ++levels.back().position;
            }
            openLayers.pop_back();
            return true;
        default: break;
    }
    return true;
}

bool OwnReader::closePort() {
    if (!requireField(Key::Id) || !requireField(Key::Type)) return false;
    TypeInfo& info = port.typeInfo;
    if (portFields.subtype) info.subtype = *portFields.subtype;
    if (!has(Key::Tag)) port.tag = ports.size() + 1;
    Optional<Value> defaultValue;
    if (!setValue(defaultValue, portFields.defaultValue, info.type, Key::Default) ||
        !setValue(info.min, portFields.min, info.type, Key::Min) ||
        !setValue(info.max, portFields.max, info.type, Key::Max) ||
        !setValue(info.extra, portFields.extra, Type::Unstructured, Key::Extra)) {
        return false;
    }
    if (defaultValue) {
        port.defaultValue = std::move(*defaultValue);
    } else if (info.type <= Type::Unstructured) {
        port.defaultValue = Value::defaultValue(info.type);
    }
    ports.push_back(std::exchange(port, Port()));
    if (areFieldsSet) portFields = PortFields();
    areFieldsSet = false;
    levels.pop_back();
    ++levels.back().position;
    return true;
}

bool OwnReader::setValue(Optional<Value>& value, Pending const& pending, Type usualType, Key key) {
    auto const place = [&] {
        return pointer() + pointerStep(kKeyNames[static_cast<std::size_t>(key)]);
    };
    bool const isNull = !pending.isGiven || pending.content.data.isNull();
    if (pending.isNullPayload && isNull) {
        value = nullValue(*pending.type);
        return true;
    }
    bool const isNullData = isNull && pending.isGiven && pending.type == Type::Unstructured;
    if (pending.isNullPayload || (isNull && !isNullData && pending.type)) {
        return refuseAt(place() + "Type", "it does not match the value");
    }
    if (isNull && !isNullData) return true;
    ValueFault wrong;
    Value read;
    if (!toValue(pending.content, pending.type.value_or(usualType), read, wrong)) {
        return refuseAt(place() + wrong.step, std::move(wrong.problem));
    }
    value = std::move(read);
    return true;
}

bool OwnReader::finish() {
    levels.clear();
    if (!hasRoot) {
        return refuse("neither a document (it has no \"root\") nor a node graph (it has no "
                      "\"nodes\")");
    }
    if (deferred) {
        fault = std::move(*deferred);
        return false;
    }
    if (mayHaveAnyIdentifiers) return true;
    Optional<DocumentError> const wrong = findWrongIdentifier(root);
    if (wrong) fault = *wrong;
    return !wrong;
}

}  // namespace tarn::engine::detail
