#include <Engine/Document/document.h>

#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>

#include "support/allocations.h"
#include "support/print.h"
#include "support/random.h"
#include "support/stack.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <sstream>
#include <string>
#include <vector>

using namespace tarn::engine;

namespace {

using Map = Unstructured::Map;
using List = Unstructured::Array;

std::string errorOf(std::string_view text) {
    DocumentError error;
    if (readDocument(text, &error)) return "it is read";
    std::ostringstream stream;
    stream << error;
    return stream.str();
}

// A document with a root and one child; the arguments are the parts that a test varies.
std::string document(std::string const& child, std::string const& connections = "[]") {
    return R"({"root":{"id":1,"children":[)" + child + R"(],"connections":)" + connections + "}}";
}

std::string port(std::string const& members) {
    return document(R"({"id":2,"inputs":[{"id":3,)" + members + "}]}");
}

std::string graph(std::string const& nodes, std::string const& links = "[]") {
    return R"({"nodes":)" + nodes + R"(,"links":)" + links + "}";
}

// Equal to the last bit: a NaN equals itself, and 0.0 differs from -0.0.
bool same(double a, double b) { return tests::bits(a) == tests::bits(b); }

bool same(Unstructured const& a, Unstructured const& b) {
    if (a.type() != b.type() || a.size() != b.size()) return false;
    if (a.type() == Unstructured::Type::Float) return same(a.asFloat(), b.asFloat());
    if (Map const* map = a.ifMap()) {
        auto other = b.ifMap()->begin();
        for (auto const& [key, element] : *map) {
            if (key != other->first || !same(element, other->second)) return false;
            ++other;
        }
        return true;
    }
    for (std::size_t i = 0; i < a.size(); ++i) {
        if (!same(*a.find(i), *b.find(i))) return false;
    }
    return a.isArray() || a == b;
}

bool same(Value const& a, Value const& b) {
    if (a.type() != b.type()) return false;
    switch (a.type()) {
        case Type::Float:
        case Type::Vec2:
        case Type::Vec3:
        case Type::Vec4: {
            FloatVec4 const v = a;
            FloatVec4 const w = b;
            return same(v.x, w.x) && same(v.y, w.y) && same(v.z, w.z) && same(v.w, w.w);
        }
        case Type::Path: {
            if (!a.ifPath() || !b.ifPath()) return a.ifPath() == b.ifPath();
            auto const& elements = a.ifPath()->elements;
            auto const& others = b.ifPath()->elements;
            if (elements.size() != others.size()) return false;
            for (std::size_t i = 0; i < elements.size(); ++i) {
                Points const& p = elements[i].points;
                Points const& q = others[i].points;
                if (elements[i].instruction != others[i].instruction || p.size() != q.size() ||
                    (!p.empty() && std::memcmp(p.data(), q.data(), p.size() * sizeof p[0]) != 0)) {
                    return false;
                }
            }
            return true;
        }
        case Type::Unstructured:
            if (!a.ifUnstructured() || !b.ifUnstructured()) {
                return a.ifUnstructured() == b.ifUnstructured();
            }
            return same(*a.ifUnstructured(), *b.ifUnstructured());
        default: return a == b;
    }
}

bool same(Optional<Value> const& a, Optional<Value> const& b) {
    return a.hasValue() == b.hasValue() && (!a || same(*a, *b));
}

bool same(std::map<std::string, Unstructured> const& a,
          std::map<std::string, Unstructured> const& b) {
    return same(Unstructured(a), Unstructured(b));
}

bool same(std::vector<Port> const& a, std::vector<Port> const& b) {
    if (a.size() != b.size()) return false;
    for (std::size_t i = 0; i < a.size(); ++i) {
        TypeInfo const& info = a[i].typeInfo;
        TypeInfo const& other = b[i].typeInfo;
        if (a[i].id != b[i].id || a[i].tag != b[i].tag || a[i].name != b[i].name ||
            info.type != other.type || info.subtype != other.subtype ||
            !same(info.min, other.min) || !same(info.max, other.max) ||
            !same(info.extra, other.extra) || !same(a[i].defaultValue, b[i].defaultValue) ||
            !same(a[i].attributes, b[i].attributes)) {
            return false;
        }
    }
    return true;
}

bool same(Patch const& a, Patch const& b) {
    if (a.id != b.id || a.builtin != b.builtin || a.descriptor != b.descriptor ||
        a.name != b.name || a.modelLayer != b.modelLayer || *a.connections != *b.connections ||
        a.children->size() != b.children->size() || !same(*a.inputs, *b.inputs) ||
        !same(*a.outputs, *b.outputs) || !same(a.attributes, b.attributes)) {
        return false;
    }
    for (std::size_t i = 0; i < a.children->size(); ++i) {
        if (!same((*a.children)[i], (*b.children)[i])) return false;
    }
    return true;
}

// Random records with every kind of content.
class AnyRecords {
public:
    explicit AnyRecords(std::uint64_t seed) : random(seed) {}

    unsigned long long id() {
        switch (random.below(6)) {
            case 0: return 0;
            case 1: return random.below(4);
            case 2: return ULLONG_MAX - random.below(3);
            case 3: return (1ull << 53) - 1 + random.below(3);
            default: return ++last;
        }
    }

    std::string text() {
        switch (random.below(5)) {
            case 0: return "";
            case 1: return random.text(4);
            case 2: return "$float";
            case 3: return "caf\xc3\xa9 \xed\xa0\x80 \xff \x1a";
            default: return std::string(1, static_cast<char>(random.below(256)));
        }
    }

    long long integer() {
        switch (random.below(4)) {
            case 0: return static_cast<long long>(random.below(9)) - 4;
            case 1: return (1ll << 53) - 1 + static_cast<long long>(random.below(3));
            case 2: return -(1ll << 53) - 1 + static_cast<long long>(random.below(3));
            default: return static_cast<long long>(random.word());
        }
    }

    FloatVec2 point() { return {random.anyDouble(), random.anyDouble()}; }

    Unstructured data(std::size_t depth) {
        switch (random.below(depth == 0 ? 5 : 7)) {
            case 0: return {};
            case 1: return random.anyDouble();
            case 2: return integer();
            case 3: return id();
            case 4: return text();
            case 5: {
                List list;
                for (std::size_t n = random.below(4); n > 0; --n) list.push_back(data(depth - 1));
                return list;
            }
            default: return map(depth - 1);
        }
    }

    Map map(std::size_t depth) {
        Map result;
        for (std::size_t n = random.below(3); n > 0; --n) result[text()] = data(depth);
        return result;
    }

    Path path() {
        Path result;
        for (std::size_t n = random.below(4); n > 0; --n) {
            PathElement element;
            element.instruction =
                PathInstruction(random.chance() ? random.below(5) : random.below(256));
            for (std::size_t m = random.below(5); m > 0; --m) element.points.push_back(point());
            result.elements.push_back(element);
        }
        return result;
    }

    Value value() {
        Value result = someValue();
        if (random.below(8) == 0) {
            Value const taken = std::move(result);
        }
        return result;  // NOLINT(bugprone-use-after-move)
    }

    Optional<Value> maybe() {
        if (random.chance()) return std::nullopt;
        return value();
    }

    std::map<std::string, Unstructured> attributes() { return random.chance() ? Map() : map(2); }

    Port port() {
        Port result;
        result.id = id();
        result.tag = random.chance() ? id() : random.below(3);
        result.name = text();
        result.typeInfo.type = Type(random.below(10) == 0 ? random.below(256) : random.below(14));
        result.typeInfo.subtype = static_cast<unsigned char>(
            random.chance() ? 0 : random.below(256) % (1 + random.below(255)));
        result.typeInfo.min = maybe();
        result.typeInfo.max = maybe();
        result.typeInfo.extra = maybe();
        bool const isUsual = random.chance() && result.typeInfo.type <= Type::Unstructured;
        result.defaultValue = isUsual ? Value::defaultValue(result.typeInfo.type) : value();
        result.attributes = attributes();
        return result;
    }

    ModelLayer layer(std::size_t depth) {
        ModelLayer result;
        result.id = id();
        for (std::size_t n = depth == 0 ? 0 : random.below(3); n > 0; --n) {
            result.children.push_back(layer(depth - 1));
        }
        for (std::size_t n = depth == 0 ? 0 : random.below(3); n > 0; --n) {
            result.additionalLayers.push_back(layer(depth - 1));
        }
        return result;
    }

    Patch patch(std::size_t depth) {
        Patch result;
        result.id = id();
        result.builtin = random.chance() ? random.below(24) : id();
        result.descriptor = text();
        result.name = text();
        if (random.chance()) result.modelLayer = layer(2);
        result.attributes = attributes();
        result.inputs = ports();
        result.outputs = ports();
        std::vector<Patch> children;
        for (std::size_t n = depth == 0 ? 0 : random.below(4); n > 0; --n) {
            children.push_back(patch(depth - 1));
        }
        std::vector<Connection> connections;
        for (std::size_t n = random.below(3); n > 0; --n) {
            connections.push_back({id(), id(), id(), id()});
        }
        result.children = arrayOf(std::move(children));
        result.connections = arrayOf(std::move(connections));
        return result;
    }

private:
    Value someValue() {
        switch (random.below(14)) {
            case 0: return random.anyDouble();
            case 1: return point();
            case 2: return FloatVec3{random.anyDouble(), -0.0, random.anyDouble()};
            case 3: return FloatVec4{random.anyDouble(), 0.0, -0.0, random.anyDouble()};
            case 4: {
                FloatMat4 matrix;
                for (double& element : matrix.elements) element = random.anyDouble();
                return matrix;
            }
            case 5: return random.chance();
            case 6: return integer();
            case 7: return Value::Image(id());
            case 8: return Value::Video(id());
            case 9: return Value::Sound(id());
            case 10: return Value::Model(id());
            case 11: return path();
            case 12: return text();
            default: return data(3);
        }
    }

    Array<Port> ports() {
        std::vector<Port> result;
        for (std::size_t n = random.below(3); n > 0; --n) result.push_back(port());
        return arrayOf(std::move(result));
    }

    tests::Random random;
    unsigned long long last = 10;
};

}  // namespace

TEST(WriteDocument, RoundTripsToTheLastBit) {
    // tests/schema validates these documents.
    char const* const folder = std::getenv("TARN_WRITTEN_DOCUMENTS");
    AnyRecords any(40);
    for (int i = 0; i < 3000; ++i) {
        Patch const root = any.patch(3);
        std::string const text = writeDocument(root);
        if (folder != nullptr && i < 200) {
            std::string const file = folder + ("/" + std::to_string(i) + ".json");
            ASSERT_TRUE(saveDocument(file, root));
        }
        DocumentError error;
        Optional<Patch> const back = readDocument(text, &error);
        ASSERT_TRUE(back.hasValue()) << error << "\n" << text;
        ASSERT_TRUE(same(*back, root)) << text;
        ASSERT_EQ(writeDocument(*back), text);
    }
}

TEST(WriteDocument, WritesOneLinePerRecord) {
    Patch root;
    root.id = 1;
    root.builtin = 1;
    root.name = "root";
    Patch child;
    child.id = 2;
    child.builtin = 8;
    child.inputs = arrayOf<Port>({Port{1, 1, "a", {Type::Float, 0, Value(0.0), Value(1.0)}, 0.5},
                                  Port{2, 7, "b", {Type::Boolean, 1}, false}});
    child.outputs = arrayOf<Port>({Port{3, 1, "sum", {Type::Vec2}, FloatVec2{1, -0.0}}});
    child.attributes = {{"pos", List{1, 2.5, 3u, {}}}, {"$", "\n\x01\""}};
    root.children = arrayOf<Patch>({child});
    root.connections = arrayOf<Connection>({{2, 3, 2, 1}});
    root.modelLayer = ModelLayer{5, {ModelLayer{6}}};
    EXPECT_EQ(writeDocument(root),
              R"({"version":1,"root":
{"id":1,"name":"root","modelLayer":{"id":5,"children":[{"id":6}]},"children":[
 {"id":2,"kind":"add","attributes":{"$$":"\n\u0001\"","pos":[1,2.5,{"$unsigned":3},null]},"inputs":[
  {"id":1,"name":"a","type":"float","default":0.5,"min":0.0,"max":1.0},
  {"id":2,"tag":7,"name":"b","type":"pulse"}],"outputs":[
  {"id":3,"name":"sum","type":"vec2","default":[1.0,-0.0]}]}],"connections":[
 {"from":[2,3],"to":[2,1]}]}}
)");
    EXPECT_EQ(writeDocument(Patch{1, 1}, 12.5),
              "{\"version\":1,\"framesPerSecond\":12.5,\"root\":\n{\"id\":1}}\n");
    for (double rate : {60.0, 0.0, -1.0, double(NAN), double(INFINITY)}) {
        EXPECT_EQ(writeDocument(Patch{1, 1}, rate), "{\"version\":1,\"root\":\n{\"id\":1}}\n")
            << rate;
    }
    EXPECT_EQ(
        writeDocument(Patch()),
        "{\"version\":1,\"identifiers\":\"any\",\"root\":\n{\"id\":0,\"kind\":\"unknown\"}}\n");
}

TEST(WriteDocument, EncodesWhatJsonCannotExpress) {
    struct Row {
        char const* what;
        Value value;
        char const* text;
    };
    double const otherNaN = tests::fromBits(0xfff0000000000001);
    for (Row const& row : {
             Row{"large double", 1e300, R"("default":1e300)"},
             Row{"whole double", 1e20, R"("default":100000000000000000000.0)"},
             Row{"infinity", double(INFINITY), R"("default":"inf")"},
             Row{"negative infinity", -double(INFINITY), R"("default":"-inf")"},
             Row{"NaN", tests::fromBits(0x7ff8000000000000), R"("default":"nan")"},
             Row{"another NaN", otherNaN, R"("default":"nan:fff0000000000001")"},
             Row{"largest integer that readers keep", 9007199254740992,
                 R"("default":9007199254740992,"defaultType":"int")"},
             Row{"larger integer", 9007199254740993,
                 R"("default":"9007199254740993","defaultType":"int")"},
             Row{"smallest integer", LLONG_MIN,
                 R"("default":"-9223372036854775808","defaultType":"int")"},
             Row{"identifier", Value::Image(ULLONG_MAX),
                 R"("default":"18446744073709551615","defaultType":"image")"},
             Row{"bytes", "a\xff\x1a", R"("default":"a\u001aff\u001a1a","defaultType":"string")"},
             Row{"data", Unstructured(List{double(NAN), LLONG_MAX, ULLONG_MAX}),
                 R"("default":[{"$float":"nan"},{"$integer":"9223372036854775807"},)"
                 R"({"$unsigned":"18446744073709551615"}],"defaultType":"unstructured")"},
             Row{"null data", Unstructured(), R"("default":null,"defaultType":"unstructured")"},
             Row{"path",
                 Path({PathElement{PathInstruction::lineTo, {}},
                       PathElement{PathInstruction(9), {{1, 2}}}}),
                 R"("default":[{"instruction":"lineTo","points":[]},)"
                 R"({"instruction":9,"points":[[1.0,2.0]]}],"defaultType":"path")"},
         }) {
        SCOPED_TRACE(row.what);
        Patch root;
        root.id = 1;
        root.builtin = 1;
        root.inputs = arrayOf<Port>({Port{1, 1, "", {Type::Float}, row.value}});
        EXPECT_EQ(writeDocument(root), "{\"version\":1,\"root\":\n{\"id\":1,\"inputs\":[\n "
                                       "{\"id\":1,\"type\":\"float\"," +
                                           std::string(row.text) + "}]}}\n");
    }
}

TEST(ReadDocument, RejectsInvalidDocuments) {
    std::string const float2 = R"({"id":2,"outputs":[{"id":3,"type":"float"}]})";
    struct Row {
        char const* what;
        std::string text;
        char const* error;
    };
    for (
        Row const& row : {
            Row{"empty", "", "it is empty"},
            Row{"blank", " \n\t\n", "it is empty"},
            Row{"truncated", "{\"root\":\n {\"id\": 1,",
                "line 2, column 11: /root/id: the JSON is incomplete"},
            Row{"truncated string", "{\"root", "line 1, column 7: the JSON is incomplete"},
            Row{"no JSON", "{\"root\": nonsense}",
                "line 1, column 11: /root: this is not valid JSON"},
            Row{"two documents", "{}{}", "line 1, column 3: this is not valid JSON"},
            Row{"bytes", std::string("\x80\xff\0", 3), "line 1, column 1: this is not valid JSON"},
            Row{"invalid bytes in a string", "{\"root\":{\"id\":1,\"name\":\"\xff\"}}",
                "line 1, column 25: /root/name: this is not valid JSON"},
            Row{"an array", "[]", "line 1, column 1: expected an object, found array"},
            Row{"a number", " 5", "line 1, column 2: expected an object, found number 5"},
            Row{"another object", "{}",
                "line 1, column 1: neither a document (it has no \"root\") nor a node graph (it "
                "has "
                "no \"nodes\")"},
            Row{"huge integer", "{\"root\":\n  18446744073709551616}",
                "line 2, column 3: /root: expected an object, found number 18446744073709552000.0"},
            Row{"huge integer in data",
                R"({"root":{"id":1,"attributes":{"a":[0,-9223372036854775809]}}})",
                "line 1, column 38: /root/attributes/a/1: an integer beyond 64 bits"},
            Row{"huge double", "{\"root\":{\"id\":1,\n\"attributes\":{\"a\":[1, 1e400]}}}",
                "line 2, column 23: /root/attributes/a/1: a number beyond the range of a double"},
            Row{"root is a string", R"({"root":"x"})",
                "line 1, column 9: /root: expected an object, found string \"x\""},
            Row{"root is a list", R"({"root":[[1],2]})",
                "line 1, column 9: /root: expected an object, found array"},
            Row{"another version", R"({"version":2,"root":{"id":1}})",
                "line 1, column 12: /version: version 2 of the format is not supported; the latest "
                "is "
                "1"},
            Row{"version is a string", R"({"root":{"id":1},"version":"1"})",
                "line 1, column 28: /version: expected an integer, found string \"1\""},
            Row{"identifiers", R"({"identifiers":"all","root":{"id":1}})",
                "line 1, column 16: /identifiers: expected \"unique\" or \"any\", found string "
                "\"all\""},
            Row{"schema", R"({"$schema":1,"root":{"id":1}})",
                "line 1, column 12: /$schema: expected a string, found number 1"},
            Row{"unknown key beside the root", R"({"extra":{"a":[{}]},"root":{"id":1}})",
                "line 1, column 10: /extra: unknown key \"extra\""},
            Row{"frame rate", R"({"framesPerSecond":0,"root":{"id":1}})",
                "line 1, column 20: /framesPerSecond: expected a number above 0"},
            Row{"key twice", R"({"root":{"id":1,"id":1}})",
                "line 1, column 15: /root/id: the key \"id\" is repeated"},
            Row{"no identifier", R"({"root":{}})", "line 1, column 9: /root: \"id\" is missing"},
            Row{"identifier 0", R"({"root":{"id":0}})",
                "line 1, column 15: /root/id: identifier 0 is reserved; identifiers start at 1"},
            Row{"negative identifier", R"({"root":{"id":-1}})",
                "line 1, column 15: /root/id: expected an identifier, an integer from 0 on, found "
                "number -1"},
            Row{"identifier is a double", R"({"root":{"id":1.5}})",
                "line 1, column 15: /root/id: expected an identifier, an integer from 0 on, found "
                "number 1.5"},
            Row{"identifier is null", R"({"root":{"id":null}})",
                "line 1, column 15: /root/id: expected an identifier, an integer from 0 on, found "
                "null"},
            Row{"identifier is true", R"({"root":{"id":true}})",
                "line 1, column 15: /root/id: expected an identifier, an integer from 0 on, found "
                "true"},
            Row{"identifier is a string", R"({"root":{"id":"01"}})",
                "line 1, column 15: /root/id: expected an identifier, an integer from 0 on, found "
                "string \"01\""},
            Row{"identifier is a list", R"({"root":{"id":[1]}})",
                "line 1, column 15: /root/id: expected an identifier, an integer from 0 on, found "
                "array"},
            Row{"duplicate patch", document(R"({"id":1})"),
                "line 1, column 35: /root/children/0/id: the patch identifier 1 is used twice"},
            Row{"duplicate port",
                document(R"({"id":2,"inputs":[{"id":3,"type":"int"},{"id":3,"type":"int"}]})"),
                "line 1, column 75: /root/children/0/inputs/1/id: the port identifier 3 is used "
                "twice"},
            Row{"port 0", port(R"("type":"int"},{"id":0,"type":"int")"),
                "line 1, column 75: /root/children/0/inputs/1/id: identifier 0 is reserved; "
                "identifiers start at 1"},
            Row{"unknown key", document(R"({"id":2,"a/b~c":1})"),
                "line 1, column 45: /root/children/0/a~1b~0c: unknown key \"a/b~c\""},
            Row{"child is a number", document("5"),
                "line 1, column 29: /root/children/0: expected an object, found number 5"},
            Row{"child is a list", document("[]"),
                "line 1, column 29: /root/children/0: expected an object, found array"},
            Row{"unknown kind", document(R"({"id":2,"kind":"blur"})"),
                "line 1, column 44: /root/children/0/kind: unknown kind \"blur\""},
            Row{"kind is a list", document(R"({"id":2,"kind":[]})"),
                "line 1, column 44: /root/children/0/kind: expected the name or the number of a "
                "kind, found array"},
            Row{"negative kind", document(R"({"id":2,"kind":-1})"),
                "line 1, column 44: /root/children/0/kind: expected the name or the number of a "
                "kind, found number -1"},
            Row{"unknown value type", port(R"("type":"Float")"),
                "line 1, column 62: /root/children/0/inputs/0/type: unknown value type \"Float\""},
            Row{"value type beyond a byte", port(R"("type":256)"),
                "line 1, column 62: /root/children/0/inputs/0/type: expected an integer from 0 to "
                "255"},
            Row{"value type is null", port(R"("type":null)"),
                "line 1, column 62: /root/children/0/inputs/0/type: expected a string, found null"},
            Row{"no value type", port(R"("name":"x")"),
                "line 1, column 47: /root/children/0/inputs/0: \"type\" is missing"},
            Row{"subtype beyond a byte", port(R"("type":"int","subtype":-1)"),
                "line 1, column 78: /root/children/0/inputs/0/subtype: expected an integer from 0 "
                "to 255"},
            Row{"tag is a string", port(R"("type":"int","tag":"x")"),
                "line 1, column 74: /root/children/0/inputs/0/tag: expected an identifier, an "
                "integer from 0 on, found string \"x\""},
            Row{"name is a number", port(R"("type":"int","name":5)"),
                "line 1, column 75: /root/children/0/inputs/0/name: expected a string, found "
                "number "
                "5"},
            Row{"name has half an escape", R"({"root":{"id":1,"name":"\u001af"}})",
                "line 1, column 24: /root/name: U+001A must be followed by two hexadecimal digits"},
            Row{"key has half an escape", R"({"root":{"id":1,"attributes":{"\u001a":0}}})",
                "line 1, column 30: /root/attributes: U+001A must be followed by two hexadecimal "
                "digits"},
            Row{"children is a string", R"({"root":{"id":1,"children":"x"}})",
                "line 1, column 28: /root/children: expected an array, found string \"x\""},
            Row{"children is an object", R"({"root":{"id":1,"children":{}}})",
                "line 1, column 28: /root/children: expected an array, found object"},
            Row{"float default", port(R"("type":"float","default":"5")"),
                "line 1, column 80: /root/children/0/inputs/0/default: expected a number, found "
                "string \"5\""},
            Row{"float default is true", port(R"("type":"float","default":true)"),
                "line 1, column 80: /root/children/0/inputs/0/default: true and false are for "
                "ports "
                "of type boolean"},
            Row{"int default", port(R"("type":"int","default":5.5)"),
                "line 1, column 78: /root/children/0/inputs/0/default: expected an integer, found "
                "number 5.5"},
            Row{"int default too large", port(R"("type":"int","default":9223372036854775808)"),
                "line 1, column 78: /root/children/0/inputs/0/default: an integer beyond the "
                "signed "
                "64 bits"},
            Row{"boolean default", port(R"("type":"boolean","default":1)"),
                "line 1, column 82: /root/children/0/inputs/0/default: expected true or false, "
                "found number 1"},
            Row{"boolean default in a list", port(R"("type":"boolean","default":[true])"),
                "line 1, column 82: /root/children/0/inputs/0/default: expected true or false, "
                "found array"},
            Row{"vector default", port(R"("type":"vec2","default":[1,2,3])"),
                "line 1, column 79: /root/children/0/inputs/0/default: expected 2 numbers, found "
                "3"},
            Row{"vector element", port(R"("type":"vec2","default":[1,"2"])"),
                "line 1, column 82: /root/children/0/inputs/0/default/1: expected a number, found "
                "string \"2\""},
            Row{"vector of booleans", port(R"("type":"vec2","default":[1,true])"),
                "line 1, column 79: /root/children/0/inputs/0/default: true and false are for "
                "ports "
                "of type boolean"},
            Row{"image default", port(R"("type":"image","default":-1)"),
                "line 1, column 80: /root/children/0/inputs/0/default: expected an identifier, an "
                "integer from 0 on, found number -1"},
            Row{"default of no type", port(R"("type":77,"default":5)"),
                "line 1, column 75: /root/children/0/inputs/0/default: this type has no values"},
            Row{"path instruction", port(R"("type":"path","default":[["jumpTo",1,2]])"),
                "line 1, column 81: /root/children/0/inputs/0/default/0/0: unknown path "
                "instruction "
                "\"jumpTo\""},
            Row{"path coordinates", port(R"("type":"path","default":[["moveTo",1]])"),
                "line 1, column 80: /root/children/0/inputs/0/default/0: moveTo takes 2 "
                "coordinates"},
            Row{"path coordinate", port(R"("type":"path","default":[["moveTo",1,null]])"),
                "line 1, column 92: /root/children/0/inputs/0/default/0/2: expected a number, "
                "found "
                "null"},
            Row{"path element", port(R"("type":"path","default":[[]])"),
                "line 1, column 80: /root/children/0/inputs/0/default/0: a path element starts "
                "with its name"},
            Row{"path element by number", port(R"("type":"path","default":[[1]])"),
                "line 1, column 81: /root/children/0/inputs/0/default/0/0: expected the name of a "
                "path instruction, found number 1"},
            Row{"unusual path element", port(R"("type":"path","default":[{"points":[]}])"),
                "line 1, column 80: /root/children/0/inputs/0/default/0: a path element has an "
                "\"instruction\" and \"points\""},
            Row{"unusual path instruction",
                port(R"("type":"path","default":[{"instruction":256,"points":[]}])"),
                "line 1, column 95: /root/children/0/inputs/0/default/0/instruction: expected the "
                "name of a path instruction, found number 256"},
            Row{"unusual path point",
                port(R"("type":"path","default":[{"instruction":9,"points":[[1,2],[1]]}])"),
                "line 1, column 113: /root/children/0/inputs/0/default/0/points/1: expected 2 "
                "numbers, found 1"},
            Row{"min", port(R"("type":"float","min":null,"max":[])"),
                "line 1, column 87: /root/children/0/inputs/0/max: expected a number, found array"},
            Row{"type of no value", port(R"("type":"float","minType":"int")"),
                "line 1, column 80: /root/children/0/inputs/0/minType: it does not match the "
                "value"},
            Row{"null payload and a value", port(R"("type":"float","min":1,"minType":"null path")"),
                "line 1, column 88: /root/children/0/inputs/0/minType: it does not match the "
                "value"},
            Row{"null payload of a number", port(R"("type":"float","minType":"null int")"),
                "line 1, column 80: /root/children/0/inputs/0/minType: unknown value type \"null "
                "int\""},
            Row{"attributes", document(R"({"id":2,"attributes":[]})"),
                "line 1, column 50: /root/children/0/attributes: expected an object, found array"},
            Row{"attribute twice", document(R"({"id":2,"attributes":{"a":{"b":1,"b":2}}})"),
                "line 1, column 55: /root/children/0/attributes/a: the key \"b\" is repeated"},
            Row{"attribute with a mark", document(R"({"id":2,"attributes":{"a":{"$x":1}}})"),
                "line 1, column 55: /root/children/0/attributes/a: the key \"$x\" is unknown; a "
                "key that begins with $ is written with $$"},
            Row{"no such number", document(R"({"id":2,"attributes":{"a":{"$float":1}}})"),
                "line 1, column 55: /root/children/0/attributes/a: \"$float\" has no such value"},
            Row{"model layer", R"({"root":{"id":1,"modelLayer":{"id":1,"children":[{}]}}})",
                "line 1, column 50: /root/modelLayer/children/0: \"id\" is missing"},
            Row{"connection from no patch", document(float2, R"([{"from":[9,3],"to":[2,3]}])"),
                "line 1, column 98: /root/connections/0/from: there is no patch 9 beside the "
                "connection"},
            Row{"connection from no port", document(float2, R"([{"from":[2,9],"to":[2,3]}])"),
                "line 1, column 98: /root/connections/0/from: patch 2 has no output port 9"},
            Row{"connection to no port", document(float2, R"([{"from":[2,3],"to":[2,3]}])"),
                "line 1, column 109: /root/connections/0/to: patch 2 has no input port 3"},
            Row{"connection's end", document(float2, R"([{"from":[2],"to":[2,3]}])"),
                "line 1, column 98: /root/connections/0/from: expected [patch, port]"},
            Row{"connection's long end", document(float2, R"([{"from":[2,3,4],"to":[2,3]}])"),
                "line 1, column 98: /root/connections/0/from: expected [patch, port]"},
            Row{"connection's end is no identifier", document(float2, R"([{"from":[2,"x"]}])"),
                "line 1, column 101: /root/connections/0/from/1: expected an identifier, an "
                "integer "
                "from 0 on, found string \"x\""},
            Row{"connection without an end", document(float2, R"([{"from":[2,3]}])"),
                "line 1, column 90: /root/connections/0: \"to\" is missing"},
            Row{"a terminal's escape", R"({"root":{"id":1,"kind":"\u001b[31m\n"}})",
                "line 1, column 24: /root/kind: unknown kind \"\\x1b[31m\\n\""},
        }) {
        EXPECT_EQ(errorOf(row.text), row.error) << row.what;
    }
}

TEST(ReadDocument, AcceptsFieldsInAnyOrderAndNullForMissing) {
    Optional<Patch> const plain = readDocument(
        R"({"root":{"children":[{"inputs":[{"default":[1,2],"type":"vec2","id":3}],"kind":"add",
        "id":2}],"id":1},"version":1,"$schema":"document.schema.json","framesPerSecond":null})");
    ASSERT_TRUE(plain.hasValue());
    EXPECT_EQ((*plain->children)[0].builtin, 8u);
    EXPECT_EQ((*(*plain->children)[0].inputs)[0].defaultValue, Value(FloatVec2{1, 2}));
    EXPECT_EQ((*(*plain->children)[0].inputs)[0].tag, 1u);
    EXPECT_EQ(plain->builtin, 1u);
    EXPECT_EQ(readDocument(R"({"root":{"id":1,"name":null,"kind":null,"children":null,"inputs":null,
        "attributes":null,"modelLayer":null,"connections":null,"descriptor":null}})"),
              readDocument(R"({"root":{"id":1}})"));
}

TEST(ReadDocument, AcceptsRepeatedIdentifiersWhereDeclared) {
    Optional<Patch> const root = readDocument(R"({"identifiers":"any","root":{"id":0,"children":[
        {"id":0}],"connections":[{"from":[1,2],"to":[3,4]}]}})");
    ASSERT_TRUE(root.hasValue());
    EXPECT_EQ(*root->connections, (std::vector<Connection>{{1, 2, 3, 4}}));
}

TEST(ReadDocument, ReportsFormatAndFrameRate) {
    DocumentInfo info;
    ASSERT_TRUE(readDocument(R"({"framesPerSecond":12,"root":{"id":1}})", nullptr, &info));
    EXPECT_EQ(info.form, DocumentInfo::Form::Own);
    EXPECT_EQ(info.framesPerSecond, 12.0);
    EXPECT_EQ(info.summary(), "");
    for (char const* before :
         {R"("version":0.4,"root":5)", R"("a":[99999999999999999999,{"$b":1}])",
          R"("version":1,"version":99999999999999999999)", R"("title":"\u001a")",
          R"("framesPerSecond":[])"}) {
        std::string const text = "{" + std::string(before) + R"(,"nodes":[{"id":2,"type":"x"}]})";
        EXPECT_EQ(errorOf(text), "it is read");
    }
    ASSERT_TRUE(readDocument(R"({"version":0.4,"root":5,"nodes":[]})", nullptr, &info));
    EXPECT_EQ(info.form, DocumentInfo::Form::NodeGraph);
    EXPECT_EQ(info.framesPerSecond, 60.0);
    DocumentError error;
    error.message = "kept";
    ASSERT_TRUE(readDocument(R"({"root":{"id":1}})", &error));
    EXPECT_EQ(error.message, "kept");
    EXPECT_FALSE(readDocument("[]"));
}

TEST(ReadDocument, RejectsInvalidNodeGraphs) {
    struct Row {
        char const* what;
        std::string text;
        char const* error;
    };
    for (Row const& row : {
             Row{"nodes", R"({"nodes":{}})",
                 "line 1, column 10: /nodes: expected an array, found object"},
             Row{"node", graph("[5]"),
                 "line 1, column 11: /nodes/0: expected an object, found number 5"},
             Row{"no type", graph(R"([{"id":1}])"),
                 "line 1, column 11: /nodes/0: \"type\" is missing"},
             Row{"no identifier", graph(R"([{"type":"x"}])"),
                 "line 1, column 11: /nodes/0: \"id\" is missing"},
             Row{"identifier", graph(R"([{"id":[],"type":"x"}])"),
                 "line 1, column 17: /nodes/0/id: expected a number or a string, found array"},
             Row{"properties", graph(R"([{"id":1,"type":"x","properties":[]}])"),
                 "line 1, column 43: /nodes/0/properties: expected an object, found array"},
             Row{"inputs", graph(R"([{"id":1,"type":"x","inputs":5}])"),
                 "line 1, column 39: /nodes/0/inputs: expected an array, found number 5"},
             Row{"port", graph(R"([{"id":1,"type":"x","inputs":[[]]}])"),
                 "line 1, column 40: /nodes/0/inputs/0: expected an object, found array"},
             Row{"port type", graph(R"([{"id":1,"type":"x","inputs":[{"type":{}}]}])"),
                 "line 1, column 48: /nodes/0/inputs/0/type: expected a string, a number or a "
                 "list"},
             Row{"port name", graph(R"([{"id":1,"type":"x","inputs":[{"name":5}]}])"),
                 "line 1, column 48: /nodes/0/inputs/0/name: expected a string, found number 5"},
             Row{"title", graph(R"([{"id":1,"type":"x","title":5}])"),
                 "line 1, column 38: /nodes/0/title: expected a string, found number 5"},
             Row{"links", R"({"nodes":[],"links":{}})",
                 "line 1, column 21: /links: expected an array, found object"},
             Row{"link", graph("[]", "[[1,2]]"),
                 "line 1, column 22: /links/0: expected [id, from node, from slot, to node, to "
                 "slot, "
                 "type]"},
             Row{"link's slot", graph("[]", R"([null,[1,2,"a",3,0,"x"]])"),
                 "line 1, column 32: /links/1/2: expected an integer, found string \"a\""},
             Row{"link's member", graph("[]", R"([{"id":1,"origin_id":1}])"),
                 "line 1, column 22: /links/0: \"origin_slot\" is missing"},
             Row{"subgraph", graph(R"([{"id":1,"type":"x","subgraph":{"nodes":[{"id":5}]}}])"),
                 "line 1, column 51: /nodes/0/subgraph/nodes/0: \"type\" is missing"},
             Row{"number", graph("[1e999]"),
                 "line 1, column 11: /nodes/0: a number beyond the range of a double"},
             Row{"cut", R"({"nodes":[{"id":1,)",
                 "line 1, column 19: /nodes/0/id: the JSON is incomplete"},
         }) {
        EXPECT_EQ(errorOf(row.text), row.error) << row.what;
    }
}

TEST(ReadDocument, KeepsEveryNode) {
    DocumentInfo info;
    Optional<Patch> const root = readDocument(
        graph(R"([{"id":0,"type":"a","outputs":[{"name":"o","type":"number","links":[1]}]},
                  {"id":7,"type":"math/Add","inputs":[{"name":"A","type":"NUMBER","link":1}],
                   "properties":{"A":"2.5"},"title":"Sum","pos":[1,2.5],"big":18446744073709552000},
                  {"id":7,"type":"b","inputs":[{"type":-1,"shape":3},{"name":"x","type":["A","B"]}]},
                  {"id":"nine","type":"c","outputs":[{"name":"v","type":"vec2"}],"widgets_values":[true]},
                  {"id":-3,"type":"d"},{"id":"12","type":"e","inputs":[{"name":"i"}]}])",
              R"([[1,0,0,7,0,"number"],{"id":2,"origin_id":"nine","origin_slot":0,"target_id":12,
                  "target_slot":0},[3,99,0,7,0,"x"],[4,0,0,7,5,"x"],null,[5,"ten",0,7,0,"x"]])"),
        nullptr, &info);
    ASSERT_TRUE(root.hasValue());
    std::ostringstream text;
    text << writeDocument(*root);
    EXPECT_EQ(text.str(), R"({"version":1,"root":
{"id":5,"name":"graph","children":[
 {"id":1,"kind":"unknown","name":"a","descriptor":"a","attributes":{"id":0},"outputs":[
  {"id":1,"name":"o","type":"float","attributes":{"type":"number"}}]},
 {"id":7,"kind":"add","name":"Sum","descriptor":"math/Add","attributes":{"big":18446744073709552000.0,"pos":[1,2.5],"properties":{"A":"2.5"}},"inputs":[
  {"id":2,"name":"A","type":"float","default":2.5,"attributes":{"type":"NUMBER"}}]},
 {"id":2,"kind":"unknown","name":"b","descriptor":"b","attributes":{"id":7},"inputs":[
  {"id":3,"type":"pulse","attributes":{"shape":3,"type":-1}},
  {"id":4,"name":"x","type":"unstructured","attributes":{"type":["A","B"]}}]},
 {"id":3,"kind":"unknown","name":"c","descriptor":"c","attributes":{"id":"nine","widgets_values":[1]},"outputs":[
  {"id":5,"name":"v","type":"vec2","attributes":{"type":"vec2"}}]},
 {"id":4,"kind":"unknown","name":"d","descriptor":"d","attributes":{"id":-3}},
 {"id":12,"kind":"unknown","name":"e","descriptor":"e","inputs":[
  {"id":6,"name":"i","type":"unstructured"}]}],"connections":[
 {"from":[1,1],"to":[7,2]},
 {"from":[3,5],"to":[12,6]}]}}
)");
    EXPECT_EQ(info.summary(), "4 nodes renumbered, 3 links left out");
    EXPECT_EQ(info.notes, (std::vector<std::string>{
                              "/links/2: link 3 left out: there is no node 99",
                              "/links/3: link 4 left out: there is no input 5 of node 7",
                              "/links/5: link 5 left out: there is no node \"ten\"",
                          }));
}

namespace {

std::string const kPair =
    R"({"id":"PAIR","name":"Pair","inputs":[{"id":"u1","name":"a","type":"number",
    "linkIds":[1]},{"id":"u2","name":"b","type":"number"}],"outputs":[{"name":"sum","type":"number"}],
    "inputNode":{"id":-10,"bounding":[0,1]},"outputNode":{"id":-20},"groups":[],
    "nodes":[{"id":5,"type":"add","inputs":[{"name":"x","type":"number"},{"name":"y","type":"number"}],
              "outputs":[{"name":"z","type":"number"}]}],
    "links":[{"id":1,"origin_id":-10,"origin_slot":0,"target_id":5,"target_slot":0,"type":"number"},
             {"id":2,"origin_id":-10,"origin_slot":1,"target_id":5,"target_slot":1,"type":"number"},
             {"id":3,"origin_id":5,"origin_slot":0,"target_id":-20,"target_slot":0,"type":"number"}]})";

std::string withDefinitions(std::string const& nodes, std::string const& definitions) {
    return R"({"definitions":{"subgraphs":[)" + definitions + R"(],"more":1},"nodes":)" + nodes +
           R"(,"links":[]})";
}

}  // namespace

TEST(ReadDocument, KeepsExistingIdentifiersBeforeAssigningNewOnes) {
    DocumentInfo info;
    Optional<Patch> const root = readDocument(
        graph(R"([{"id":"a","type":"x"},{"id":1,"type":"y","subgraph":{"nodes":[{"id":0,"type":"z"},
                  {"id":3,"type":"z"}]}},{"id":2,"type":"y"}])"),
        nullptr, &info);
    ASSERT_TRUE(root.hasValue());
    std::vector<Patch> const& children = *root->children;
    EXPECT_EQ(children[0].id, 4u);
    EXPECT_EQ(children[1].id, 1u);
    EXPECT_EQ((*children[1].children)[0].id, 5u);
    EXPECT_EQ((*children[1].children)[1].id, 3u);
    EXPECT_EQ(children[2].id, 2u);
    EXPECT_EQ(info.renumberedNodes, 2u);
    // Nothing can use a definition without a name.
    EXPECT_TRUE(readDocument(
                    withDefinitions(R"([{"id":1,"type":""}])", R"({"nodes":[{"id":1,"type":""}]})"))
                    .hasValue());
    // Nodes with repeated members are kept.
    EXPECT_EQ(
        (*readDocument(graph(R"([{"id":1,"type":"g","subgraph":{"nodes":[{"id":2,"type":"x"}]},
                  "subgraph":{"nodes":[{"id":3,"type":"x"}]}}])"))
              ->children)[0]
            .children->size(),
        2u);
}

TEST(ReadDocument, ExpandsSharedDefinitions) {
    DocumentInfo info;
    Optional<Patch> const root = readDocument(
        withDefinitions(R"([{"id":5,"type":"PAIR","inputs":[{"name":"b","type":"number"},
                             {"name":"other","type":"number"}],"outputs":[{"name":"sum"}]},
                            {"id":6,"type":"PAIR","title":"Second"}])",
                        kPair + R"(,{"id":"UNUSED","nodes":[]})"),
        nullptr, &info);
    ASSERT_TRUE(root.hasValue());
    EXPECT_EQ(writeDocument(*root), R"({"version":1,"root":
{"id":9,"name":"graph","attributes":{"definitions":{"more":1}},"children":[
 {"id":5,"name":"Pair","descriptor":"PAIR","attributes":{"definition":{"groups":[],"id":"PAIR","name":"Pair"}},"inputs":[
  {"id":1,"tag":2,"name":"b","type":"float","attributes":{"type":"number"}},
  {"id":2,"tag":3,"name":"other","type":"float","attributes":{"type":"number"}}],"outputs":[
  {"id":3,"name":"sum","type":"unstructured"}],"children":[
  {"id":1,"kind":"add","name":"add","descriptor":"add","attributes":{"id":5},"inputs":[
   {"id":4,"name":"x","type":"float","attributes":{"type":"number"}},
   {"id":5,"name":"y","type":"float","attributes":{"type":"number"}}],"outputs":[
   {"id":6,"name":"z","type":"float","attributes":{"type":"number"}}]},
  {"id":2,"kind":"input","name":"input","attributes":{"bounding":[0,1]},"outputs":[
   {"id":7,"name":"a","type":"float","attributes":{"id":"u1","type":"number"}},
   {"id":8,"name":"b","type":"float","attributes":{"id":"u2","type":"number"}}]},
  {"id":3,"kind":"output","name":"output","inputs":[
   {"id":9,"name":"sum","type":"float","attributes":{"type":"number"}}]}],"connections":[
  {"from":[2,7],"to":[1,4]},
  {"from":[2,8],"to":[1,5]},
  {"from":[1,6],"to":[3,9]}]},
 {"id":6,"name":"Second","descriptor":"PAIR","attributes":{"definition":{"groups":[],"id":"PAIR","name":"Pair"}},"children":[
  {"id":4,"kind":"add","name":"add","descriptor":"add","attributes":{"id":5},"inputs":[
   {"id":10,"name":"x","type":"float","attributes":{"type":"number"}},
   {"id":11,"name":"y","type":"float","attributes":{"type":"number"}}],"outputs":[
   {"id":12,"name":"z","type":"float","attributes":{"type":"number"}}]},
  {"id":7,"kind":"input","name":"input","attributes":{"bounding":[0,1]},"outputs":[
   {"id":13,"name":"a","type":"float","attributes":{"id":"u1","type":"number"}},
   {"id":14,"name":"b","type":"float","attributes":{"id":"u2","type":"number"}}]},
  {"id":8,"kind":"output","name":"output","inputs":[
   {"id":15,"name":"sum","type":"float","attributes":{"type":"number"}}]}],"connections":[
  {"from":[7,13],"to":[4,10]},
  {"from":[7,14],"to":[4,11]},
  {"from":[4,12],"to":[8,15]}]}]}}
)");
    EXPECT_EQ(info.summary(), "2 nodes renumbered, 1 definition not used");
}

TEST(ReadDocument, KeepsAmbiguousAndUnknownMembersAsAttributes) {
    struct Row {
        char const* what;
        std::string text;
        char const* patch;  // The complete first child, as written.
    };
    for (
        Row const& row : {
            Row{"a property of two ports' name",
                graph(R"([{"id":1,"type":"x","inputs":[{"name":"a","type":"number"},
                        {"name":"a","type":"number"}],"properties":{"a":5}}])"),
                R"({"id":1,"kind":"unknown","name":"x","descriptor":"x","attributes":{"properties":{"a":5}},"inputs":[
  {"id":1,"name":"a","type":"float","default":5.0,"attributes":{"type":"number"}},
  {"id":2,"name":"a","type":"float","attributes":{"type":"number"}}]})"},
            Row{"members of a subgraph and of its node",
                graph(R"([{"id":1,"type":"x","pos":1,"subgraph":{"id":9,"pos":2,"size":3}}])"),
                R"({"id":1,"name":"x","descriptor":"x","attributes":{"pos":1,"size":3,"subgraph":{"id":9,"pos":2}}})"},
            Row{"a node's own definition",
                withDefinitions(R"([{"id":1,"type":"D","definition":5}])", R"({"id":"D"})"),
                R"({"id":1,"name":"D","descriptor":"D","attributes":{"definition":5,"definition_":{"id":"D","name":""}}})"},
            Row{"ends without ports",
                withDefinitions(R"([{"id":1,"type":"D"}])",
                                R"({"id":"D","inputNode":{"id":-10,"pos":1},"outputNode":5})"),
                R"({"id":1,"name":"D","descriptor":"D","attributes":{"definition":{"id":"D","inputNode":{"id":-10,"pos":1},"name":"","outputNode":5}}})"},
            Row{"an end of another number",
                withDefinitions(
                    R"([{"id":1,"type":"D"}])",
                    R"({"id":"D","inputNode":{"id":-5},"inputs":[{"name":"i","type":"number"}],
                         "outputs":[{"name":"o","type":"number"}],
                         "links":[{"id":1,"origin_id":-5,"origin_slot":0,"target_id":-20,"target_slot":0}]})"),
                R"({"id":1,"name":"D","descriptor":"D","attributes":{"definition":{"id":"D","name":""}},"children":[
  {"id":2,"kind":"input","name":"input","outputs":[
   {"id":1,"name":"i","type":"float","attributes":{"type":"number"}}]},
  {"id":3,"kind":"output","name":"output","inputs":[
   {"id":2,"name":"o","type":"float","attributes":{"type":"number"}}]}],"connections":[
  {"from":[2,1],"to":[3,2]}]})"},
            Row{"members of links",
                graph(
                    R"([{"id":1,"type":"x","subgraph":{"links":[{"id":7,"origin_id":null,"origin_slot":0,
                        "target_id":1,"target_slot":0,"type":"x","parentId":3}]}}])"),
                R"({"id":1,"name":"x","descriptor":"x","attributes":{"linkMembers":[{"id":7,"parentId":3}]}})"},
            Row{"a number that no identifier can be",
                graph(R"([{"id":18446744073709552000,"type":"x"}])"),
                R"({"id":1,"kind":"unknown","name":"x","descriptor":"x","attributes":{"id":18446744073709552000.0}})"},
            Row{"the largest identifier", graph(R"([{"id":18446744073709551615,"type":"x"}])"),
                R"({"id":1,"kind":"unknown","name":"x","descriptor":"x","attributes":{"id":{"$unsigned":"18446744073709551615"}}})"},
            Row{"a fraction", graph(R"([{"id":1.5,"type":"x"}])"),
                R"({"id":1,"kind":"unknown","name":"x","descriptor":"x","attributes":{"id":1.5}})"},
        }) {
        DocumentError error;
        Optional<Patch> const root = readDocument(row.text, &error);
        ASSERT_TRUE(root.hasValue()) << row.what << ": " << error.message;
        Patch alone{100, 1};
        alone.children = arrayOf<Patch>({(*root->children)[0]});
        EXPECT_EQ(writeDocument(alone), "{\"version\":1,\"root\":\n{\"id\":100,\"children\":[\n " +
                                            std::string(row.patch) + "]}}\n")
            << row.what;
    }
    DocumentInfo info;
    ASSERT_TRUE(readDocument(graph(R"([{"id":1,"type":"x","inputs":[{"name":"i"}]}])",
                                   R"([[4,null,0,1,0,"x"]])"),
                             nullptr, &info)
                    .hasValue());
    EXPECT_EQ(info.notes, std::vector<std::string>{
                              "/links/0: link 4 left out: there is no node at one of its ends"});
}

TEST(ReadDocument, ConnectsNodesWithAnyNumberAsIdentifier) {
    Optional<Patch> const root =
        readDocument(graph(R"([{"id":18446744073709552000,"type":"x","outputs":[{"name":"o"}]},
                  {"id":18446744073709551615,"type":"x","inputs":[{"name":"i"}]},
                  {"id":1.5,"type":"x","inputs":[{"name":"i"}]}])",
                           R"([[1,18446744073709552000,0,18446744073709551615,0,"x"],
                  [2,18446744073709552000,0,1.5,0,"x"]])"));
    ASSERT_TRUE(root.hasValue());
    EXPECT_EQ(*root->connections, (std::vector<Connection>{{1, 1, 2, 2}, {1, 1, 3, 3}}));
}

TEST(ReadDocument, ExpandsNestedDefinitions) {
    std::string const outer = R"({"id":"OUTER","name":"Outer","nodes":[{"id":1,"type":"PAIR"},
        {"id":2,"type":"PAIR"},{"id":3,"type":"inline","subgraph":{"nodes":[{"id":4,"type":"PAIR"}]}}]})";
    Optional<Patch> const root = readDocument(withDefinitions(
        R"([{"id":1,"type":"OUTER"},{"id":2,"type":"OUTER"}])", outer + "," + kPair));
    ASSERT_TRUE(root.hasValue());
    std::function<std::size_t(Patch const&)> const count = [&](Patch const& patch) {
        std::size_t result = 1;
        for (Patch const& child : *patch.children) result += count(child);
        return result;
    };
    // In each of two uses: the node itself, three pairs with three patches inside, and the inline
    // group.
    EXPECT_EQ(count(*root), 1u + 2 * (1 + 3 * 4 + 1));
    EXPECT_EQ(readDocument(writeDocument(*root)), root);
}

TEST(ReadDocument, RejectsRecursiveAndHugeDefinitions) {
    auto const definition = [](std::string const& id, std::string const& nodes) {
        return R"({"id":")" + id + R"(","name":"N)" + id + R"(","nodes":[)" + nodes + "]}";
    };
    auto const use = [](std::string const& type) { return R"({"id":1,"type":")" + type + R"("})"; };
    EXPECT_EQ(errorOf(withDefinitions("[" + use("A") + "]", definition("A", use("A")))),
              "line 1, column 61: /definitions/subgraphs/0/nodes/0: the shared definition \"NA\" "
              "contains itself: \"NA\" > \"NA\"");
    EXPECT_EQ(
        errorOf(withDefinitions(
            "[]",
            definition("A", use("x") + "," + use("B")) + "," + definition("B", use("C")) + "," +
                definition("C", R"({"id":1,"type":"y","subgraph":{"nodes":[)" + use("B") + "]}}"))),
        "line 1, column 227: /definitions/subgraphs/2/nodes/0/subgraph/nodes/0: the shared "
        "definition \"NB\" contains itself: \"NB\" > \"NC\" > \"NB\"");
    // Each definition uses the next one twice: a million million nodes.
    std::string many = definition("D0", use("x"));
    for (int i = 1; i <= 40; ++i) {
        std::string const inner = use("D" + std::to_string(i - 1));
        many += "," + definition("D" + std::to_string(i), inner + "," + inner);
    }
    EXPECT_EQ(
        errorOf(withDefinitions("[" + use("D40") + "]", many)),
        "line 1, column 1: with its shared definitions the graph has more than 1000000 nodes");
    // A thousand copies of 300 KB.
    std::string uses = use("D");
    for (int i = 1; i < 1000; ++i) uses += "," + use("D");
    for (std::string const& large :
         {std::string(R"("a":")"), std::string(R"("nodes":[{"id":1,"type":")")}) {
        std::string text = R"({"id":"D",)" + large + std::string(300000, 'x') + '"';
        if (large.back() == '"' && large.find('[') != std::string::npos) text += "}]";
        EXPECT_EQ(errorOf(withDefinitions("[" + uses + "]", text + "}")),
                  "line 1, column 1: the copies of its shared definitions take more than 256 MiB");
    }
    std::string deep = definition("D0", use("x"));
    for (int i = 1; i <= 1000; ++i) {
        deep += "," + definition("D" + std::to_string(i), use("D" + std::to_string(i - 1)));
    }
    EXPECT_EQ(errorOf(withDefinitions("[" + use("D1000") + "]", deep)),
              "line 1, column 1: groups nest deeper than 1000 levels");
}

TEST(ReadDocument, SurvivesTruncatedDocuments) {
    AnyRecords any(41);
    std::vector<std::string> texts{writeDocument(any.patch(2)), writeDocument(any.patch(2)),
                                   withDefinitions(R"([{"id":5,"type":"PAIR"}])", kPair)};
    for (std::string const& text : texts) {
        // Without the line end after the last bracket.
        std::string const whole = text.substr(0, text.find_last_of('}') + 1);
        ASSERT_TRUE(readDocument(whole).hasValue());
        for (std::size_t length = 0; length < whole.size(); ++length) {
            DocumentError error;
            ASSERT_FALSE(readDocument(whole.substr(0, length), &error).hasValue()) << length;
            ASSERT_FALSE(error.message.empty());
            ASSERT_EQ(error.line == 0, length == 0);
        }
    }
}

TEST(ReadDocument, SurvivesCorruptedBytes) {
    AnyRecords any(42);
    tests::Random random(43);
    for (int i = 0; i < 3000; ++i) {
        std::string text = i % 3 == 0 ? withDefinitions(R"([{"id":5,"type":"PAIR"}])", kPair)
                                      : writeDocument(any.patch(1));
        for (std::size_t n = 1 + random.below(3); n > 0; --n) {
            constexpr char kBytes[] = "{}[]\",:0123456789-e.tfn$\\ \x1a\xff";
            text[random.below(text.size())] = kBytes[random.below(sizeof kBytes - 1)];
        }
        DocumentError error;
        if (Optional<Patch> const root = readDocument(text, &error)) {
            ASSERT_TRUE(readDocument(writeDocument(*root)).hasValue());
        } else {
            ASSERT_FALSE(error.message.empty());
        }
    }
}

TEST(ReadDocument, NestsTenThousandLevels) {
    std::size_t const deepest = tests::kDeepest;
    auto const nested = [](std::size_t levels) {
        std::string text = R"({"identifiers":"any","root":)";
        for (std::size_t i = 1; i < levels; ++i) text += R"({"id":1,"children":[)";
        text += R"({"id":1})";
        for (std::size_t i = 1; i < levels; ++i) text += "]}";
        return text + "}";
    };
    tests::onStackOf(tests::kStack, [&] {
        Optional<Patch> const root = readDocument(nested(deepest));
        ASSERT_TRUE(root.hasValue());
        EXPECT_EQ(readDocument(writeDocument(*root)), root);
    });
    EXPECT_EQ(errorOf(nested(10001)).substr(0, 13), "line 1, colum");
    EXPECT_NE(errorOf(nested(10001)).find(": patches nest deeper than 10000 levels"),
              std::string::npos);
    std::string layers = R"({"root":{"id":1,"modelLayer":)";
    for (int i = 0; i < 10001; ++i) layers += R"({"id":1,"children":[)";
    EXPECT_NE(errorOf(layers).find(": model layers nest deeper than 10000 levels"),
              std::string::npos);
    std::string groups = "";
    for (int i = 0; i < 1001; ++i) groups += R"({"nodes":[{"subgraph":)";
    EXPECT_NE(errorOf(groups).find(": groups nest deeper than 1000 levels"), std::string::npos);
}

TEST(ReadDocument, ReadsDataOfAnyDepth) {
    constexpr std::size_t kLevels = 300000;
    tests::onStackOf(512 * 1024, [] {
        for (char const* brackets : {"[]", "{}"}) {
            std::string data;
            for (std::size_t i = 0; i < kLevels; ++i) data += brackets[0] == '[' ? "[" : "{\"\":";
            data += "7" + std::string(kLevels, brackets[1]);
            Optional<Patch> const root =
                readDocument(R"({"root":{"id":1,"attributes":{"a":)" + data + "}}}");
            ASSERT_TRUE(root.hasValue());
            EXPECT_EQ(readDocument(writeDocument(*root)), root);
            EXPECT_TRUE(readDocument(R"({"nodes":[],"a":)" + data + "}").hasValue());
        }
    });
}

TEST(ReadDocument, RejectsHugeInputsWithLittleMemory) {
    constexpr std::size_t kSize = 2 << 20;
    auto const repeated = [](std::string const& begin, std::string const& part) {
        std::string text = begin;
        while (text.size() < kSize) text += part;
        return text;
    };
    struct Row {
        char const* what;
        std::string text;
    };
    for (std::string const& begin : {std::string(R"({"root":{"id":1,"attributes":{"a":)"),
                                     std::string(R"({"nodes":[],"a":)")}) {
        for (Row const& row : {
                 Row{"brackets", repeated(begin, "[")},
                 Row{"braces", repeated(begin, "{\"\":")},
                 Row{"numbers", repeated(begin + "[", "0,")},
                 Row{"members", repeated(begin + "{\"", "a\":0,\"")},
                 Row{"digits", repeated(begin, "9")},
                 Row{"text", repeated(begin + "\"", "x")},
                 Row{"escapes", repeated(begin + "\"", "\\u00e9")},
                 Row{"spaces", repeated(begin, " ")},
                 Row{"commas", repeated(begin + "[", ",")},
             }) {
            SCOPED_TRACE(row.what);
            tests::AllocationCounter counter;
            DocumentError error;
            EXPECT_FALSE(readDocument(row.text, &error).hasValue());
            EXPECT_FALSE(error.message.empty());
            EXPECT_LT(counter.peakBytes(), 12 * row.text.size());
        }
    }
}

TEST(ReadDocument, NeedsLittleMoreMemoryThanTheGraph) {
    for (std::size_t groupSize : {100u, 20000u}) {
        Patch root{1, 1};
        unsigned long long id = 1;
        std::vector<Patch> groups;
        while (id < 20000) {
            std::vector<Patch> children;
            for (std::size_t i = 0; i < groupSize; ++i) {
                Patch patch{++id, 8};
                patch.name = "patch " + std::to_string(id);
                patch.inputs = arrayOf<Port>({Port{id * 2, 1, "in", {Type::Float}, 0.5}});
                patch.outputs = arrayOf<Port>({Port{id * 2 + 1, 1, "out", {Type::Float}, 0.0}});
                patch.attributes["position"] = List{1, 2};
                children.push_back(std::move(patch));
            }
            Patch group{++id, 1};
            group.children = arrayOf(std::move(children));
            groups.push_back(std::move(group));
        }
        root.children = arrayOf(std::move(groups));
        std::string const text = writeDocument(root);
        tests::AllocationCounter counter;
        Optional<Patch> const read = readDocument(text);
        ASSERT_TRUE(read.hasValue());
        // At most the list of all patches exists twice, for a moment.
        double const further =
            static_cast<double>(counter.peakBytes()) - static_cast<double>(counter.heldBytes());
        EXPECT_LT(further, 1.2 * 20000 * sizeof(Patch)) << groupSize;
    }
}

TEST(ReadDocument, SurvivesFailingAllocations) {
    AnyRecords any(44);
    Patch const root = any.patch(2);
    std::string const own = writeDocument(root);
    std::string const foreign = withDefinitions(R"([{"id":5,"type":"PAIR"}])", kPair);
    for (std::string const& text : {own, foreign}) {
        Optional<Patch> read;
        std::size_t const failures = tests::failEachAllocation(
            [&] { read = readDocument(text); }, [&] { EXPECT_FALSE(read.hasValue()); });
        EXPECT_GT(failures, 30u);
        EXPECT_TRUE(read.hasValue());
    }
    std::string text;
    EXPECT_GT(tests::failEachAllocation([&] { text = writeDocument(root); },
                                        [&] { EXPECT_EQ(text, ""); }),
              3u);
    EXPECT_EQ(text, own);
}

TEST(Kind, MapsBetweenNamesAndNumbers) {
    char const* const names[] = {"unknown",   "group",   "input",      "output",   "time",
                                 "constant",  "ease",    "oscillator", "add",      "multiply",
                                 "compose",   "split",   "loop",       "pulse",    "choose",
                                 "circle",    "ellipse", "roundRect",  "hexaRect", "arc",
                                 "joinPaths", "layer",   "text"};
    unsigned long long number = 0;
    for (char const* name : names) {
        EXPECT_EQ(kindToString(number), name);
        EXPECT_EQ(stringToKind(name), number);
        ++number;
    }
    EXPECT_EQ(kindToString(number), "");
    EXPECT_EQ(kindToString(ULLONG_MAX), "");
    for (char const* name : {"", "Add", "add "})
        EXPECT_FALSE(stringToKind(name).hasValue()) << name;
}
