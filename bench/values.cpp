#include "bench.h"

#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>

#include <boost/variant.hpp>

#include <QVariant>

#include <memory>
#include <new>
#include <utility>
#include <variant>
#include <vector>

using namespace tarn::engine;

namespace {

constexpr std::size_t kCount = 10000;
char const* const kText = "twenty-four bytes of it.";

// The alternatives of a value in plain variants.
template <template <class...> class Variant>
using Union = Variant<long long, double, FloatVec2, FloatVec3, FloatVec4,
                      std::shared_ptr<FloatMat4 const>, bool, Value::ImageID, Value::VideoID,
                      Value::SoundID, Value::ModelID, std::shared_ptr<Path const>,
                      std::shared_ptr<Unstructured const>, std::shared_ptr<std::string const>>;
template <class... T>
using BoostVariant = boost::variant<T...>;
template <class... T>
using StdVariant = std::variant<T...>;
using Boost = Union<BoostVariant>;
using Std = Union<StdVariant>;

template <class T>
T fromText() {
    return T(std::make_shared<std::string const>(kText));
}
template <>
Value fromText<Value>() {
    return Value(kText);
}
template <>
QVariant fromText<QVariant>() {
    return QVariant(kText);
}

template <class T>
std::vector<T> numbers() {
    std::vector<T> loop;
    for (std::size_t i = 0; i < kCount; ++i) loop.push_back(T(static_cast<double>(i) * 0.5));
    return loop;
}

// Half of them numbers, the rest integers, vectors, booleans, strings and paths.
template <class T>
std::vector<T> mixedValues() {
    std::vector<T> loop;
    auto const path =
        std::make_shared<Path const>(PathBuilder().roundRect({0, 0}, {1, 1}, 0.2).build());
    for (std::size_t i = 0; i < kCount; ++i) {
        double const d = static_cast<double>(i);
        switch (i % 12) {
            case 1: loop.push_back(T(static_cast<long long>(i))); break;
            case 3: loop.push_back(T(FloatVec2{d, d})); break;
            case 5: loop.push_back(T(FloatVec4{d, d, d, d})); break;
            case 7: loop.push_back(T(i % 2 == 0)); break;
            case 9: loop.push_back(fromText<T>()); break;
            case 11: loop.push_back(T(path)); break;
            default: loop.push_back(T(d * 0.5)); break;
        }
    }
    return loop;
}

template <>
std::vector<QVariant> mixedValues<QVariant>() {
    std::vector<QVariant> loop;
    for (std::size_t i = 0; i < kCount; ++i) {
        double const d = static_cast<double>(i);
        switch (i % 12) {
            case 1: loop.push_back(QVariant(static_cast<qlonglong>(i))); break;
            case 7: loop.push_back(QVariant(i % 2 == 0)); break;
            case 9:
            case 11: loop.push_back(QVariant(QString(kText))); break;
            default: loop.push_back(QVariant(d * 0.5)); break;
        }
    }
    return loop;
}

// Memory for many `T`, of which `made` are constructed.
template <class T>
struct Room {
    Room() : memory(static_cast<T*>(::operator new(kCount * sizeof(T)))) {}
    Room(Room&& other) noexcept
        : memory(std::exchange(other.memory, nullptr)), made(std::exchange(other.made, 0)) {}
    ~Room() {
        for (std::size_t i = 0; i < made; ++i) memory[i].~T();
        ::operator delete(memory);
    }
    T* memory;
    std::size_t made = 0;
};

template <class T, class Make>
bench::Implementation construct(Make make) {
    return bench::onEach([] { return std::make_shared<Room<T>>(); },
                         [make](std::shared_ptr<Room<T>>& room) {
                             for (std::size_t i = 0; i < kCount; ++i) {
                                 new (room->memory + i) T(make(static_cast<double>(i)));
                             }
                             room->made = kCount;
                             return room;
                         });
}

template <class T>
void copiesAndDestruction(std::string const& who) {
    auto const copy = [](std::vector<T> const& loop) { return loop; };
    bench::operation("copy 10,000 mixed values").peer(who, bench::on(mixedValues<T>, copy));
    bench::operation("copy 10,000 numbers").peer(who, bench::on(numbers<T>, copy));
    bench::operation("destroy 10,000 mixed values")
        .peer(who, bench::onEach(mixedValues<T>, [](std::vector<T>& loop) {
                  std::vector<T>().swap(loop);
                  return loop.size();
              }));
}

struct BoostDouble : boost::static_visitor<double> {
    double operator()(double d) const { return d; }
    double operator()(long long i) const { return static_cast<double>(i); }
    double operator()(bool b) const { return b ? 1.0 : 0.0; }
    double operator()(FloatVec2 const& v) const { return v.x; }
    double operator()(FloatVec4 const& v) const { return v.x; }
    double operator()(std::shared_ptr<Path const> const& p) const {
        return p->elements.empty() ? 0.0 : 1.0;
    }
    double operator()(std::shared_ptr<std::string const> const& s) const {
        return double(Value(*s));
    }
    template <class T>
    double operator()(T const&) const {
        return 0.0;
    }
};

double asDouble(Value const& v) { return v; }
double asDouble(Boost const& v) { return boost::apply_visitor(BoostDouble(), v); }
double asDouble(Std const& v) { return std::visit(BoostDouble(), v); }
double asDouble(QVariant const& v) { return v.toDouble(); }

int kindOf(Value const& v) { return static_cast<int>(v.type()); }
int kindOf(Boost const& v) { return v.which(); }
int kindOf(Std const& v) { return static_cast<int>(v.index()); }
int kindOf(QVariant const& v) { return static_cast<int>(v.type()); }

// Converting strings to numbers costs everyone the C library's parser, so these mixed values have
// none.
template <class T>
std::vector<T> mixedWithoutTexts() {
    std::vector<T> loop = mixedValues<T>();
    for (std::size_t i = 9; i < loop.size(); i += 12) loop[i] = T(1.0);
    return loop;
}

template <class T>
void readings(std::string const& who) {
    bench::operation("type() of 10,000 mixed values")
        .peer(who, bench::on(mixedValues<T>, [](std::vector<T> const& loop) {
                  int sum = 0;
                  for (T const& v : loop) sum += kindOf(v);
                  return sum;
              }));
    auto const sum = [](std::vector<T> const& loop) {
        double total = 0.0;
        for (T const& v : loop) total += asDouble(v);
        return total;
    };
    bench::operation("double(v) of 10,000 numbers").peer(who, bench::on(numbers<T>, sum));
    bench::operation("double(v) of 10,000 mixed values")
        .peer(who, bench::on(mixedWithoutTexts<T>, sum));
}

bool sameContent(Value const& a, Value const& b) { return a == b; }
template <class T>
bool sameAlternative(T const& a, T const& b) {
    return a == b;
}
template <class T>
bool sameAlternative(std::shared_ptr<T const> const& a, std::shared_ptr<T const> const& b) {
    return a == b || *a == *b;
}
bool sameAlternative(std::shared_ptr<FloatMat4 const> const& a,
                     std::shared_ptr<FloatMat4 const> const& b) {
    return a == b;
}
struct BareEqual : boost::static_visitor<bool> {
    template <class T>
    bool operator()(T const& a, T const& b) const {
        return sameAlternative(a, b);
    }
    template <class T, class U>
    bool operator()(T const&, U const&) const {
        return false;
    }
};
bool sameContent(Boost const& a, Boost const& b) { return boost::apply_visitor(BareEqual(), a, b); }
bool sameContent(Std const& a, Std const& b) { return std::visit(BareEqual(), a, b); }
bool sameContent(QVariant const& a, QVariant const& b) { return a == b; }

template <class T>
void equality(std::string const& who) {
    using Pair = std::pair<std::vector<T>, std::vector<T>>;
    auto const equal = [](Pair const& both) {
        bool result = true;
        for (std::size_t i = 0; i < both.first.size(); ++i) {
            result &= sameContent(both.first[i], both.second[i]);
        }
        bench::agree(result, "equality of mixed values");
        return result;
    };
    auto const shared = [] {
        std::vector<T> const loop = mixedValues<T>();
        return Pair(loop, loop);
    };
    auto const unshared = [] { return Pair(mixedValues<T>(), mixedValues<T>()); };
    bench::operation("== of 10,000 mixed values, shared").peer(who, bench::on(shared, equal));
    bench::operation("== of 10,000 mixed values, unshared").peer(who, bench::on(unshared, equal));
}

// Clamping as written by hand for a std::variant.
Std const& clamped(Std const& value, Std const* min, Std const* max) {
    auto const number = [](Std const& v) {
        double const* d = std::get_if<double>(&v);
        return d != nullptr ? *d : asDouble(v);
    };
    if (min != nullptr && number(*min) > number(value)) return *min;
    if (max != nullptr && number(value) > number(*max)) return *max;
    return value;
}

void castTo(std::string const& name, TypeInfo const& info, Std const* min, Std const* max) {
    auto const ours = [info](Loop const& loop) {
        std::size_t sum = 0;
        for (Value const& v : loop) sum += reinterpret_cast<std::size_t>(&castValueToType(v, info));
        return sum;
    };
    auto const theirs = [min, max](std::vector<Std> const& loop) {
        std::size_t sum = 0;
        for (Std const& v : loop) sum += reinterpret_cast<std::size_t>(&clamped(v, min, max));
        return sum;
    };
    bench::operation(name)
        .ours(bench::on(numbers<Value>, ours))
        .peer("std::variant", bench::on(numbers<Std>, theirs));
}

void casting() {
    static TypeInfo const bounded{Type::Float, 0, Value(1000.0), Value(4000.0), {}};
    static Std const low(1000.0);
    static Std const high(4000.0);
    bench::agreement([] {
        Loop const loop = numbers<Value>();
        std::vector<Std> const peer = numbers<Std>();
        for (std::size_t i = 0; i < kCount; ++i) {
            bench::agree(double(castValueToType(loop[i], bounded)) ==
                             asDouble(clamped(peer[i], &low, &high)),
                         "clamping");
        }
    });
    castTo("cast 10,000 to a float port with bounds", bounded, &low, &high);
    castTo("cast 10,000 to a float port without bounds", {Type::Float, 0, {}, {}, {}}, nullptr,
           nullptr);
    castTo("cast 10,000 to another port", {Type::Vec2, 0, Value(1000.0), Value(4000.0), {}},
           nullptr, nullptr);
    auto const ours = [](Loop const& loop) {
        std::size_t sum = 0;
        for (unsigned long long i = 0; i < 3 * kCount; ++i) {
            sum += reinterpret_cast<std::size_t>(&indexLoopCasting(loop, bounded, i));
        }
        return sum;
    };
    auto const theirs = [](std::vector<Std> const& loop) {
        std::size_t sum = 0;
        for (std::size_t i = 0; i < 3 * kCount; ++i) {
            sum += reinterpret_cast<std::size_t>(&clamped(loop[i % loop.size()], &low, &high));
        }
        return sum;
    };
    bench::operation("indexLoopCasting of 30,000")
        .ours(bench::on(numbers<Value>, ours))
        .peer("std::variant", bench::on(numbers<Std>, theirs));
    auto const oneByOne = [](Loop const& loop) {
        std::vector<Value const*> results(3 * kCount);
        for (std::size_t i = 0; i < results.size(); ++i) {
            results[i] = &indexLoopCasting(loop, bounded, i);
        }
        return results;
    };
    auto const inOneCall = [](Loop const& loop) {
        std::vector<Value const*> results(3 * kCount);
        indexLoopCasting(loop, bounded, 0, results.size(), results.data());
        return results;
    };
    bench::operation("indexLoopCasting of 30,000 in one call")
        .ours(bench::on(numbers<Value>, inOneCall))
        .peer("one by one", bench::on(numbers<Value>, oneByOne))
        .atMost(1.0);
}

template <class T>
void everything(std::string const& who) {
    bench::operation("construct 10,000 from doubles").peer(who, construct<T>([](double d) {
                                                               return T(d);
                                                           }));
    bench::operation("construct 10,000 from strings").peer(who, construct<T>([](double) {
                                                               return fromText<T>();
                                                           }));
    copiesAndDestruction<T>(who);
    readings<T>(who);
    equality<T>(who);
}

}  // namespace

void bench::values() {
    agreement([] {
        Loop const ours = mixedWithoutTexts<Value>();
        std::vector<Boost> const second = mixedWithoutTexts<Boost>();
        std::vector<Std> const third = mixedWithoutTexts<Std>();
        for (std::size_t i = 0; i < kCount; ++i) {
            agree(asDouble(ours[i]) == asDouble(second[i]) &&
                      asDouble(ours[i]) == asDouble(third[i]),
                  "values read as numbers");
        }
    });
    everything<Value>("ours");
    everything<Boost>("boost::variant");
    everything<Std>("std::variant");
    everything<QVariant>("QVariant");
    casting();
    operation("construct 10,000 from doubles").atMost(1.2);
    operation("construct 10,000 from strings").atMost(1.1);
    operation("copy 10,000 mixed values").atMost(1.25);
    operation("copy 10,000 numbers").atMost(1.25);
    operation("destroy 10,000 mixed values").atMost(1.2);
    operation("type() of 10,000 mixed values").against("std::variant").quick();
    operation("double(v) of 10,000 numbers").atMost(1.02).quick();
    operation("double(v) of 10,000 mixed values").atMost(1.0).quick();
    operation("== of 10,000 mixed values, shared").against("std::variant").quick();
    operation("== of 10,000 mixed values, unshared").against("std::variant").quick();
    operation("cast 10,000 to a float port with bounds").atMost(1.2).quick();
    operation("cast 10,000 to a float port without bounds").atMost(3.0);
    operation("cast 10,000 to another port").atMost(3.0);
    operation("indexLoopCasting of 30,000").atMost(1.5);
}
