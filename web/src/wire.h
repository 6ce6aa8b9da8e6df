// web/src/wire.h: the binary format in which values, data, paths and records pass between
// JavaScript and the library.
//
//     Value value = Reader(bytes).value();
//     std::string answer = Writer().value(value.asType(Type::Vec2)).bytes;
//
// Numbers have eight bytes, counts four, little-endian. engine_base.js uses the same format.

#ifndef WEB_WIRE_H
#define WEB_WIRE_H

#include <Engine/Base/base.h>

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace web {

class Writer {
public:
    Writer& byte(unsigned char b);
    Writer& count(std::size_t n);
    Writer& number(double d);
    Writer& integer(unsigned long long i);
    Writer& text(std::string_view s);
    // Of any depth.
    Writer& data(tarn::engine::Unstructured const& tree);
    Writer& data(tarn::engine::Unstructured::Map const& map);
    Writer& path(tarn::engine::Path const& path);
    Writer& value(tarn::engine::Value const& value);
    Writer& typeInfo(tarn::engine::TypeInfo const& info);
    Writer& port(tarn::engine::Port const& port);
    Writer& ports(std::vector<tarn::engine::Port> const& list);
    Writer& connection(tarn::engine::Connection const& connection);
    Writer& modelLayer(tarn::engine::ModelLayer const& layer);

    std::string bytes;
};

// Aborts where the bytes were not written by a Writer.
class Reader {
public:
    explicit Reader(std::string_view bytes) : rest(bytes) {}

    unsigned char byte();
    std::size_t count();
    double number();
    unsigned long long integer();
    std::string text();
    tarn::engine::Unstructured data();
    tarn::engine::Unstructured::Map map();
    tarn::engine::Path path();
    tarn::engine::Value value();
    tarn::engine::TypeInfo typeInfo();
    tarn::engine::Port port();
    std::vector<tarn::engine::Port> ports();
    tarn::engine::Connection connection();
    std::vector<tarn::engine::Connection> connections();
    tarn::engine::ModelLayer modelLayer();
    tarn::engine::Patch patch();

private:
    void patch(tarn::engine::Patch& patch);
    void patchFields(tarn::engine::Patch& patch);
    tarn::engine::Unstructured scalarData(tarn::engine::Unstructured::Type kind);
    std::string_view take(std::size_t bytes);
    std::size_t countOf(std::size_t bytesOfEach);

    std::string_view rest;
};

}  // namespace web

#endif
