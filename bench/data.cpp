#include "bench.h"
#include "boost_json.h"
#include "documents.h"

#include <Engine/Base/unstructured.h>

#include <nlohmann/json.hpp>

#include <rapidjson/document.h>

#include <QJsonArray>
#include <QJsonObject>
#include <QJsonValue>

#include <malloc.h>

#include <string>
#include <vector>

using namespace tarn::engine;

namespace {

struct Ours : bench::ByMove<Unstructured, Unstructured::Map, Unstructured::Array> {
    static Node const* at(Node const& node, char const* key) { return in(node.ifMap(), key); }
    static List const* elements(Node const& node) { return node.ifArray(); }
    static double numberOf(Node const& node) { return node.asFloat(); }
};

struct Nlohmann : bench::ByMove<nlohmann::json, nlohmann::json::object_t, nlohmann::json::array_t> {
    static Node const* at(Node const& node, char const* key) {
        return in(node.get_ptr<Map const*>(), key);
    }
    static List const* elements(Node const& node) { return node.get_ptr<List const*>(); }
    static double numberOf(Node const& node) { return node.get<double>(); }
};

struct QtJson {
    using Node = QJsonValue;
    using Map = QJsonObject;
    using List = QJsonArray;
    static Node number(double d) { return d; }
    static Node text(std::string s) { return QString::fromStdString(s); }
    static Node integer(long long i) { return static_cast<qint64>(i); }
    static void put(Map& map, std::string const& key, Node node) {
        map.insert(QString::fromStdString(key), node);
    }
    static void add(List& list, Node node) { list.push_back(node); }
    static Node map(Map&& m) { return m; }
    static Node list(List&& l) { return l; }
};

double heapBytes(double before) {
    auto const info = mallinfo2();
    return static_cast<double>(info.uordblks + info.hblkhd) - before;
}

template <class Library, class Make>
void forDocument(std::string const& kind, std::string const& who, Make make) {
    using Node = typename Library::Node;
    bench::measure(
        "build " + kind, who, [] { return 0; }, [make](int) { return make(); });
    static std::map<std::string, Node> nodes;
    double const before = heapBytes(0);
    Node const& node = nodes.emplace(kind, make()).first->second;
    bench::record("heap bytes of " + kind, who, heapBytes(before));
    bench::measureOn("copy " + kind, who, node, [](Node const& n) {
        Node copy = n;
        return copy;
    });
    static std::map<std::string, Node> twins;
    Node const& twin = twins.emplace(kind, make()).first->second;
    bench::measureOn("== of " + kind, who, node, [&twin](Node const& n) {
        bool const equal = n == twin;
        bench::agree(equal, "equality of documents");
        return equal;
    });
    bench::measure(
        "destroy " + kind, who, [make] { return std::make_unique<Node>(make()); },
        [](std::unique_ptr<Node>& n) {
            n.reset();
            return 0;
        });
}

template <class Library>
double readObjects(typename Library::Node const& node) {
    double sum = 0.0;
    for (auto const& item : *Library::elements(node)) {
        auto const* position = Library::at(item, "position");
        auto const* x = position == nullptr ? nullptr : Library::at(*position, "X");
        sum += x == nullptr ? 0.0 : Library::numberOf(*x);
    }
    return sum;
}

// RapidJSON's values need its allocator, so they have their own short form, for the record.
void rapid() {
    using Document = rapidjson::Document;
    auto const make = [] {
        auto document = std::make_unique<Document>();
        auto& allocator = document->GetAllocator();
        document->SetArray();
        for (int i = 0; i < 3000; ++i) {
            rapidjson::Value point(rapidjson::kObjectType);
            point.AddMember("X", i * 0.5, allocator);
            point.AddMember("Y", i * 0.25, allocator);
            rapidjson::Value item(rapidjson::kObjectType);
            std::string const name = "item " + std::to_string(i);
            item.AddMember("name", rapidjson::Value(name.c_str(), allocator), allocator);
            item.AddMember("position", point, allocator);
            item.AddMember("visible", i % 2, allocator);
            document->PushBack(item, allocator);
        }
        return document;
    };
    bench::measure(
        "build objects", "RapidJSON", [] { return 0; }, [make](int) { return make(); });
    bench::measure("destroy objects", "RapidJSON", make, [](std::unique_ptr<Document>& d) {
        d.reset();
        return 0;
    });
}

template <class Library>
void forLibrary(std::string const& who) {
    forDocument<Library>("objects", who, bench::objects<Library>);
    forDocument<Library>("lists of numbers", who, bench::numbers<Library>);
    forDocument<Library>("a catalogue", who, bench::catalogue<Library>);
}

}  // namespace

void bench::data() {
    forLibrary<Ours>("ours");
    forLibrary<Nlohmann>("nlohmann");
    forLibrary<QtJson>("QJsonValue");
#if defined(TARN_BENCH_BOOST_JSON)
    using Boosted = bench::BoostJson;
    forDocument<Boosted>("objects", "Boost.JSON", Boosted::objects);
    forDocument<Boosted>("lists of numbers", "Boost.JSON", Boosted::numbers);
    forDocument<Boosted>("a catalogue", "Boost.JSON", Boosted::catalogue);
#endif
    rapid();
    static auto const ours = objects<Ours>();
    static auto const theirs = objects<Nlohmann>();
    agree(readObjects<Ours>(ours) == readObjects<Nlohmann>(theirs), "readings of documents");
    measureOn("read objects, three levels down", "ours", ours, readObjects<Ours>);
    measureOn("read objects, three levels down", "nlohmann", theirs, readObjects<Nlohmann>);
    target("read objects, three levels down", 0.9, "nlohmann");
    for (std::string const kind : {"objects", "lists of numbers", "a catalogue"}) {
        bool const flat = kind == "lists of numbers";
        target("build " + kind, 1.0, "nlohmann");
        target("copy " + kind, 0.9, "nlohmann");
        target("== of " + kind, flat ? 1.5 : 1.0, "nlohmann");
        target("destroy " + kind, 0.6, "nlohmann");
        target("heap bytes of " + kind, flat ? 1.5 : 1.05, "nlohmann");
    }
}
