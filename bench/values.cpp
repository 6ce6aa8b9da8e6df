#include "bench.h"

#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>

#include <boost/variant.hpp>

#include <QVariant>

#include <memory>
#include <new>
#include <variant>
#include <vector>

using namespace tarn::engine;

namespace {

constexpr std::size_t kCount = 10000;
char const* const kText = "twenty-four bytes of it.";

// The alternatives of a value, in the bare unions.
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

// Half of them numbers, the rest integers, vectors, truth values, texts and paths.
template <class T>
std::vector<T> mixed() {
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
std::vector<QVariant> mixed<QVariant>() {
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

// Room for many `T`, of which `made` are there.
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
void construct(std::string const& operation, std::string const& who, Make make) {
    bench::measure(
        operation, who, [] { return std::make_shared<Room<T>>(); },
        [make](std::shared_ptr<Room<T>>& room) {
            for (std::size_t i = 0; i < kCount; ++i) {
                new (room->memory + i) T(make(static_cast<double>(i)));
            }
            room->made = kCount;
            return room;
        });
}

template <class T>
std::vector<T> const& kept(std::vector<T> (*make)()) {
    static std::map<void*, std::vector<T>> loops;
    return loops.try_emplace(reinterpret_cast<void*>(make), make()).first->second;
}

template <class T>
void copiesAndDestruction(std::string const& who) {
    bench::measureOn("copy 10,000 mixed values", who, kept<T>(mixed<T>),
                     [](std::vector<T> const& loop) { return loop; });
    bench::measureOn("copy 10,000 numbers", who, kept<T>(numbers<T>),
                     [](std::vector<T> const& loop) { return loop; });
    bench::measure(
        "destroy 10,000 mixed values", who, [] { return mixed<T>(); },
        [](std::vector<T>& loop) {
            std::vector<T>().swap(loop);
            return loop.size();
        });
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

// The texts read as numbers cost the C library's parse for everyone: left out of the mixed ones.
template <class T>
std::vector<T> mixedWithoutTexts() {
    std::vector<T> loop = mixed<T>();
    for (std::size_t i = 9; i < loop.size(); i += 12) loop[i] = T(1.0);
    return loop;
}

template <class T>
void readings(std::string const& who) {
    bench::measureOn("type() of 10,000 mixed values", who, kept<T>(mixed<T>),
                     [](std::vector<T> const& loop) {
                         int sum = 0;
                         for (T const& v : loop) sum += kindOf(v);
                         return sum;
                     });
    auto const sum = [](std::vector<T> const& loop) {
        double total = 0.0;
        for (T const& v : loop) total += asDouble(v);
        return total;
    };
    bench::measureOn("double(v) of 10,000 numbers", who, kept<T>(numbers<T>), sum);
    bench::measureOn("double(v) of 10,000 mixed values", who, kept<T>(mixedWithoutTexts<T>), sum);
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
    static std::vector<T> const shared = kept<T>(mixed<T>);
    static std::vector<T> const unshared = mixed<T>();
    auto const against = [](std::vector<T> const& other) {
        return [&other](std::vector<T> const& loop) {
            bool equal = true;
            for (std::size_t i = 0; i < loop.size(); ++i) equal &= sameContent(loop[i], other[i]);
            bench::agree(equal, "equality of mixed values");
            return equal;
        };
    };
    bench::measureOn("== of 10,000 mixed values, shared", who, kept<T>(mixed<T>), against(shared));
    bench::measureOn("== of 10,000 mixed values, unshared", who, kept<T>(mixed<T>),
                     against(unshared));
}

// The clamp as it would be written in place over a std::variant.
Std const& clamped(Std const& value, Std const* min, Std const* max) {
    auto const number = [](Std const& v) {
        double const* d = std::get_if<double>(&v);
        return d != nullptr ? *d : asDouble(v);
    };
    if (min != nullptr && number(*min) > number(value)) return *min;
    if (max != nullptr && number(value) > number(*max)) return *max;
    return value;
}

void casting() {
    static TypeInfo const bounded{Type::Float, 0, Value(1000.0), Value(4000.0), {}};
    static TypeInfo const unbounded{Type::Float, 0, {}, {}, {}};
    static TypeInfo const other{Type::Vec2, 0, Value(1000.0), Value(4000.0), {}};
    static Std const low(1000.0);
    static Std const high(4000.0);
    auto const ours = [](TypeInfo const& info) {
        return [&info](Loop const& loop) {
            std::size_t sum = 0;
            for (Value const& v : loop) {
                sum += reinterpret_cast<std::size_t>(&castValueToType(v, info));
            }
            return sum;
        };
    };
    auto const theirs = [](Std const* min, Std const* max) {
        return [min, max](std::vector<Std> const& loop) {
            std::size_t sum = 0;
            for (Std const& v : loop) sum += reinterpret_cast<std::size_t>(&clamped(v, min, max));
            return sum;
        };
    };
    Loop const& loop = kept<Value>(numbers<Value>);
    std::vector<Std> const& peer = kept<Std>(numbers<Std>);
    for (std::size_t i = 0; i < kCount; ++i) {
        bench::agree(double(castValueToType(loop[i], bounded)) ==
                         asDouble(clamped(peer[i], &low, &high)),
                     "clamping");
    }
    bench::measureOn("cast 10,000 to a float port with bounds", "ours", loop, ours(bounded));
    bench::measureOn("cast 10,000 to a float port with bounds", "std::variant", peer,
                     theirs(&low, &high));
    bench::target("cast 10,000 to a float port with bounds", 1.0);
    bench::measureOn("cast 10,000 to a float port without", "ours", loop, ours(unbounded));
    bench::measureOn("cast 10,000 to a float port without", "std::variant", peer,
                     theirs(nullptr, nullptr));
    bench::target("cast 10,000 to a float port without", 3.0);
    bench::measureOn("cast 10,000 to another port", "ours", loop, ours(other));
    bench::measureOn("cast 10,000 to another port", "std::variant", peer, theirs(nullptr, nullptr));
    bench::target("cast 10,000 to another port", 3.0);
    bench::measureOn("indexLoopCasting of 30,000", "ours", loop, [](Loop const& l) {
        std::size_t sum = 0;
        for (unsigned long long i = 0; i < 3 * kCount; ++i) {
            sum += reinterpret_cast<std::size_t>(&indexLoopCasting(l, bounded, i));
        }
        return sum;
    });
    bench::measureOn(
        "indexLoopCasting of 30,000", "std::variant", peer, [](std::vector<Std> const& l) {
            std::size_t sum = 0;
            for (std::size_t i = 0; i < 3 * kCount; ++i) {
                sum += reinterpret_cast<std::size_t>(&clamped(l[i % l.size()], &low, &high));
            }
            return sum;
        });
    bench::target("indexLoopCasting of 30,000", 1.5);
}

template <class T>
void everything(std::string const& who) {
    construct<T>("construct 10,000 from doubles", who, [](double d) { return T(d); });
    construct<T>("construct 10,000 from texts", who, [](double) { return fromText<T>(); });
    copiesAndDestruction<T>(who);
    readings<T>(who);
    equality<T>(who);
}

}  // namespace

void bench::values() {
    Loop const& loop = kept<Value>(mixedWithoutTexts<Value>);
    std::vector<Boost> const& other = kept<Boost>(mixedWithoutTexts<Boost>);
    std::vector<Std> const& third = kept<Std>(mixedWithoutTexts<Std>);
    for (std::size_t i = 0; i < kCount; ++i) {
        agree(asDouble(loop[i]) == asDouble(other[i]) && asDouble(loop[i]) == asDouble(third[i]),
              "values read as numbers");
    }
    everything<Value>("ours");
    everything<Boost>("boost::variant");
    everything<Std>("std::variant");
    everything<QVariant>("QVariant");
    target("construct 10,000 from doubles", 1.2);
    target("construct 10,000 from texts", 1.1);
    target("copy 10,000 mixed values", 1.15);
    target("copy 10,000 numbers", 1.15);
    target("destroy 10,000 mixed values", 1.2);
    target("type() of 10,000 mixed values", 1.3);
    target("double(v) of 10,000 numbers", 1.3);
    target("double(v) of 10,000 mixed values", 1.1);
    target("== of 10,000 mixed values, shared", 1.0);
    target("== of 10,000 mixed values, unshared", 1.1);
    casting();
}
