#include "boost_json.h"

#include "documents.h"

#include <boost/json/src.hpp>

#include <new>

namespace bench {

namespace {

using Library = ByMove<boost::json::value, boost::json::object, boost::json::array>;

}  // namespace

struct BoostJson::Node::Content {
    boost::json::value value;
};

BoostJson::Node::Node(Content&& content) noexcept {
    static_assert(sizeof memory == sizeof(Content) && alignof(Node) == alignof(Content));
    new (memory) Content(std::move(content));
}
BoostJson::Node::Node(Node const& other) { new (memory) Content(other.content()); }
BoostJson::Node::Node(Node&& other) noexcept { new (memory) Content(std::move(other.content())); }
BoostJson::Node::~Node() { content().~Content(); }

bool BoostJson::Node::operator==(Node const& other) const {
    return content().value == other.content().value;
}

BoostJson::Node::Content& BoostJson::Node::content() {
    return *std::launder(reinterpret_cast<Content*>(memory));
}
BoostJson::Node::Content const& BoostJson::Node::content() const {
    return *std::launder(reinterpret_cast<Content const*>(memory));
}

BoostJson::Node BoostJson::objects() { return Node({bench::objects<Library>()}); }
BoostJson::Node BoostJson::numbers() { return Node({bench::numbers<Library>()}); }
BoostJson::Node BoostJson::catalogue() { return Node({bench::catalogue<Library>()}); }

}  // namespace bench
