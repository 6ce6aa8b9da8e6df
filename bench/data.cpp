#include "bench.h"

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

// What a document is built with, for each library: leaves first.
template <class NodeType, class MapType, class ListType>
struct ByMove {
    using Node = NodeType;
    using Map = MapType;
    using List = ListType;
    static Node number(double d) { return d; }
    static Node text(std::string s) { return Node(std::move(s)); }
    static Node integer(long long i) { return i; }
    static void put(Map& map, std::string const& key, Node node) {
        map.emplace(key, std::move(node));
    }
    static void add(List& list, Node node) { list.push_back(std::move(node)); }
    static Node map(Map&& m) { return Node(std::move(m)); }
    static Node list(List&& l) { return Node(std::move(l)); }
    static Node const* in(Map const* map, char const* key) {
        if (map == nullptr) return nullptr;
        auto const found = map->find(key);
        return found == map->end() ? nullptr : &found->second;
    }
};

struct Ours : ByMove<Unstructured, Unstructured::Map, Unstructured::Array> {
    static Node const* at(Node const& node, char const* key) { return in(node.ifMap(), key); }
    static List const* elements(Node const& node) { return node.ifArray(); }
    static double numberOf(Node const& node) { return node.asFloat(); }
};

struct Nlohmann : ByMove<nlohmann::json, nlohmann::json::object_t, nlohmann::json::array_t> {
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

template <class Library>
typename Library::Node objects() {
    typename Library::List list;
    for (int i = 0; i < 3000; ++i) {
        typename Library::Map point;
        Library::put(point, "X", Library::number(i * 0.5));
        Library::put(point, "Y", Library::number(i * 0.25));
        typename Library::Map item;
        Library::put(item, "name", Library::text("item " + std::to_string(i)));
        Library::put(item, "position", Library::map(std::move(point)));
        Library::put(item, "visible", Library::integer(i % 2));
        Library::add(list, Library::map(std::move(item)));
    }
    return Library::list(std::move(list));
}

template <class Library>
typename Library::Node numbers() {
    typename Library::List rows;
    for (int i = 0; i < 100; ++i) {
        typename Library::List row;
        for (int j = 0; j < 1000; ++j) Library::add(row, Library::number(i * 1000.0 + j));
        Library::add(rows, Library::list(std::move(row)));
    }
    return Library::list(std::move(rows));
}

template <class Library>
typename Library::Node catalogue() {
    typename Library::List products;
    for (int i = 0; i < 500; ++i) {
        typename Library::Map product;
        for (int k = 0; k < 12; ++k) {
            Library::put(product, "attribute " + std::to_string(k),
                         Library::text("the value of attribute " + std::to_string(k * i)));
        }
        typename Library::List sizes;
        for (int s = 0; s < 6; ++s) Library::add(sizes, Library::integer(s * i));
        Library::put(product, "sizes", Library::list(std::move(sizes)));
        typename Library::Map price;
        Library::put(price, "amount", Library::number(i * 1.1));
        Library::put(price, "currency", Library::text("EUR"));
        Library::put(product, "price", Library::map(std::move(price)));
        Library::add(products, Library::map(std::move(product)));
    }
    return Library::list(std::move(products));
}

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
    forDocument<Library>("objects", who, objects<Library>);
    forDocument<Library>("lists of numbers", who, numbers<Library>);
    forDocument<Library>("a catalogue", who, catalogue<Library>);
}

}  // namespace

void bench::data() {
    forLibrary<Ours>("ours");
    forLibrary<Nlohmann>("nlohmann");
    forLibrary<QtJson>("QJsonValue");
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
