#include "bench.h"
#include "boost_json.h"
#include "documents.h"

#include <Engine/Base/unstructured.h>

#include <nlohmann/json.hpp>

#include <rapidjson/document.h>

#include <QJsonArray>
#include <QJsonObject>
#include <QJsonValue>

#include <memory>
#include <string>
#include <utility>
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

template <class Library, class Make>
void forDocument(std::string const& kind, std::string const& who, Make make) {
    using Node = typename Library::Node;
    using Pair = std::pair<Node, Node>;
    bench::operation("build " + kind).peer(who, bench::doing(make));
    bench::operation("heap memory of " + kind).inBytes().peer(who, bench::bytes([make] {
                                                                  double const before =
                                                                      bench::heapBytes();
                                                                  Node const node = make();
                                                                  return bench::heapBytes() -
                                                                         before;
                                                              }));
    bench::operation("copy " + kind).peer(who, bench::on(make, [](Node const& node) {
                                              return Node(node);
                                          }));
    // Each copy reuses the memory that the previous one freed.
    bench::operation("copy and destroy " + kind).peer(who, bench::on(make, [](Node const& node) {
                                                          Node copy = node;
                                                          benchmark::DoNotOptimize(copy);
                                                          return 0;
                                                      }));
    bench::operation("== of " + kind)
        .peer(who, bench::on([make] { return std::make_unique<Pair>(make(), make()); },
                             [](std::unique_ptr<Pair> const& both) {
                                 bool const equal = both->first == both->second;
                                 bench::agree(equal, "equality of documents");
                                 return equal;
                             }));
    bench::operation("destroy " + kind)
        .peer(who, bench::onEach([make] { return std::make_unique<Node>(make()); },
                                 [](std::unique_ptr<Node>& node) {
                                     node.reset();
                                     return 0;
                                 }));
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

// RapidJSON's values need an allocator, so they have their own short form, for reference only.
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
    bench::operation("build objects").peer("RapidJSON", bench::doing(make));
    bench::operation("destroy objects")
        .peer("RapidJSON", bench::onEach(make, [](std::unique_ptr<Document>& document) {
                  document.reset();
                  return 0;
              }));
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
    agreement([] {
        agree(readObjects<Ours>(objects<Ours>()) == readObjects<Nlohmann>(objects<Nlohmann>()),
              "lookups in documents");
    });
    operation("look up in objects, three levels deep")
        .ours(on(objects<Ours>, readObjects<Ours>))
        .peer("nlohmann", on(objects<Nlohmann>, readObjects<Nlohmann>))
        .quick();
    for (std::string const kind : {"objects", "lists of numbers", "a catalogue"}) {
        bool const flat = kind == "lists of numbers";
        operation("build " + kind).atMost(1.3, "nlohmann");
        operation("copy " + kind).atMost(1.4, "nlohmann");
        operation("copy and destroy " + kind).atMost(flat ? 0.6 : 1.0, "nlohmann");
        operation("== of " + kind).atMost(flat ? 0.9 : 1.1, "nlohmann");
        operation("destroy " + kind).atMost(1.0, "nlohmann");
        operation("heap memory of " + kind).atMost(1.05, "nlohmann");
    }
    operation("copy and destroy a catalogue").quick();
    operation("copy and destroy objects").quick();
    operation("build objects").quick();
}
