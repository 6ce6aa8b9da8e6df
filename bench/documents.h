// bench/documents.h: the documents for benchmarks of JSON libraries, built leaves first.

#ifndef TARN_BENCH_DOCUMENTS_H
#define TARN_BENCH_DOCUMENTS_H

#include <string>
#include <utility>

namespace bench {

/// The types to build a document with, for libraries whose maps and lists move into nodes.
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

}  // namespace bench

#endif
