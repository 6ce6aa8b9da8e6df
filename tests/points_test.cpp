#include <Engine/Base/points.h>

#include "support/allocations.h"
#include "support/death.h"
#include "support/print.h"
#include "support/random.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <iterator>
#include <list>
#include <stdexcept>
#include <vector>

using tarn::engine::FloatVec2;
using tarn::engine::Points;

namespace {

std::vector<FloatVec2> counted(std::size_t count) {
    std::vector<FloatVec2> list;
    for (std::size_t i = 0; i < count; ++i) {
        list.push_back({static_cast<double>(i), static_cast<double>(i) / 2});
    }
    return list;
}

void expectSame(Points const& points, std::vector<FloatVec2> const& expected) {
    ASSERT_EQ(points.size(), expected.size());
    ASSERT_EQ(points.empty(), expected.empty());
    ASSERT_GE(points.capacity(), points.size());
    ASSERT_TRUE(std::equal(points.begin(), points.end(), expected.begin(), expected.end()));
    ASSERT_TRUE(std::equal(points.rbegin(), points.rend(), expected.rbegin(), expected.rend()));
    ASSERT_EQ(std::vector<FloatVec2>(points), expected);
    ASSERT_EQ(points, Points(expected));
    for (std::size_t i = 0; i < expected.size(); ++i) {
        ASSERT_EQ(points[i], expected[i]);
        ASSERT_EQ(points.at(i), expected[i]);
    }
}

// The points of `counted` through an input iterator, such as that of a stream.
struct ReadOnce {
    using iterator_category = std::input_iterator_tag;
    using value_type = FloatVec2;
    using difference_type = std::ptrdiff_t;
    using pointer = FloatVec2 const*;
    using reference = FloatVec2;

    int position;

    FloatVec2 operator*() const { return {static_cast<double>(position), position / 2.0}; }
    ReadOnce& operator++() {
        ++position;
        return *this;
    }
    bool operator!=(ReadOnce const& other) const { return position != other.position; }
};

// Arguments whose values do not matter; `counted` makes the longer list.
constexpr FloatVec2 kPoint{1, 2};
constexpr std::initializer_list<FloatVec2> kPair{{1, 2}, {3, 4}};
constexpr std::initializer_list<FloatVec2> kList{{0, 0}, {1, 0.5}, {2, 1}, {3, 1.5}};

}  // namespace

TEST(Points, AreConstructedLikeAVector) {
    expectSame(Points(), {});
    expectSame(Points(2), {{0, 0}, {0, 0}});
    expectSame(Points(2, {1, 2}), {{1, 2}, {1, 2}});
    expectSame({{1, 2}}, {{1, 2}});
    expectSame({{1, 2}, {3, 4}, {5, 6}, {7, 8}}, {{1, 2}, {3, 4}, {5, 6}, {7, 8}});
    for (std::size_t size = 0; size < 9; ++size) {
        std::vector<FloatVec2> const list = counted(size);
        expectSame(list, list);
        expectSame(Points(list.begin(), list.end()), list);
        Points points = list;
        Points copy = points;
        expectSame(copy, list);
        Points moved = std::move(copy);
        expectSame(moved, list);
        expectSame(copy, {});  // NOLINT(bugprone-use-after-move)
        copy = moved;
        expectSame(copy, list);
        moved = std::move(copy);
        expectSame(moved, list);
        moved = *&moved;
        expectSame(moved, list);
        Points other{{9, 9}};
        swap(moved, other);
        expectSame(moved, {{9, 9}});
        expectSame(other, list);
    }
}

TEST(Points, AllocateNothingForUpToThree) {
    tests::AllocationCounter counter;
    Points points{{1, 2}, {3, 4}, {5, 6}};
    Points copy = points;
    Points const moved = std::move(copy);
    points = {{7, 8}};
    points.push_back({9, 10});
    points.insert(points.begin(), {11, 12});
    EXPECT_EQ(counter.count(), 0u);
    EXPECT_EQ(moved.size(), 3u);
    points.push_back({13, 14});
    EXPECT_EQ(counter.count(), 1u);
    static_assert(sizeof(Points) <= 72);
}

TEST(Points, EmplaceFromNumbersOfAnyType) {
    Points points;
    FloatVec2& made = points.emplace_back(1, 2);
    EXPECT_EQ(made, (FloatVec2{1, 2}));
    points.emplace_back(2.5f, 3LL);
    points.emplace_back(7);
    points.emplace_back();
    points.emplace(points.begin(), 9, 8u);
    points.emplace_back(FloatVec2{5, 6});
    points.emplace(points.begin(), FloatVec2{3, 4});
    EXPECT_EQ(points, (Points{{3, 4}, {9, 8}, {1, 2}, {2.5, 3}, {7, 0}, {0, 0}, {5, 6}}));
}

TEST(Points, AreErasedByValueAndByPredicate) {
    Points points{{1, 2}, {3, 4}, {1, 2}, {0.0, 5}, {-0.0, 5}, {NAN, 0}};
    EXPECT_EQ(erase(points, FloatVec2{1, 2}), 2u);
    EXPECT_EQ(erase(points, FloatVec2{-0.0, 5}), 2u);
    EXPECT_EQ(erase(points, FloatVec2{NAN, 0}), 0u);
    EXPECT_EQ(points.size(), 2u);
    EXPECT_EQ(erase(points, points.front()), 1u);
    EXPECT_EQ(erase_if(points, [](FloatVec2 const& p) { return p.y == 0; }), 1u);
    EXPECT_TRUE(points.empty());
    EXPECT_EQ(erase_if(points, [](FloatVec2 const&) { return true; }), 0u);
}

TEST(Points, ThrowOnlyWhereAVectorThrows) {
    Points points;
    static_assert(
        noexcept(points.begin(), points.end(), points.cbegin(), points.rbegin(), points.crend()));
    static_assert(noexcept(points.size(), points.empty(), points.capacity(), points.max_size()));
    static_assert(noexcept(points.data(), points.clear(), points.swap(points)));
    static_assert(std::is_nothrow_default_constructible_v<Points>);
    static_assert(std::is_nothrow_move_assignable_v<Points>);
}

#if defined(_GLIBCXX_ASSERTIONS)
TEST(PointsDeathTest, CheckIndicesWhereAVectorDoes) {
    Points points{{1, 2}, {3, 4}};
    Points const constant;
    Points empty;
    auto const said = [](char const* condition, char const* function) {
        return tests::failedAssertion(condition, function, "Engine/Base/points");
    };
    EXPECT_ENDS(points[2] = FloatVec2(), said("i < size()", "operator[]"));
    EXPECT_ENDS(static_cast<void>(constant[0]), said("i < size()", "operator[]"));
    EXPECT_ENDS(static_cast<void>(empty.front()), said("!empty()", "front"));
    EXPECT_ENDS(static_cast<void>(constant.back()), said("!empty()", "back"));
    EXPECT_ENDS(empty.pop_back(), said("!empty()", "pop_back"));
    EXPECT_ENDS(points.erase(points.end()), said("last <= end()", "erase"));
}
#endif

TEST(Points, KeepTheirCapacityUntilTheyShrink) {
    EXPECT_EQ(Points().max_size(), sizeof(std::size_t) == 8 ? 4294967295u : 134217727u);
    try {
        Points().reserve(Points().max_size() + 1);
        FAIL();
    } catch (std::length_error const& error) {
        EXPECT_STREQ(error.what(), "Points");
    }
    Points points{{1, 2}, {3, 4}, {5, 6}, {7, 8}, {9, 10}};
    points.reserve(100);
    FloatVec2 const* const before = points.data();
    EXPECT_EQ(points.capacity(), 100u);
    points.resize(5);
    EXPECT_EQ(points.data(), before);
    points.shrink_to_fit();
    EXPECT_EQ(points.capacity(), 5u);
    EXPECT_EQ(points, (Points{{1, 2}, {3, 4}, {5, 6}, {7, 8}, {9, 10}}));
    FloatVec2 const* const shrunk = points.data();
    points.shrink_to_fit();
    EXPECT_EQ(points.data(), shrunk);
    points.resize(2);
    points.shrink_to_fit();
    EXPECT_EQ(points.capacity(), 3u);
    EXPECT_EQ(points, (Points{{1, 2}, {3, 4}}));
}

TEST(Points, GrowGeometricallyHoweverTheyAreAppended) {
    struct Row {
        char const* label;
        std::function<void(Points&)> append;
    };
    std::vector<FloatVec2> const two = counted(2);
    Row const rows[] = {
        {"push_back", [](Points& points) { points.push_back(kPoint); }},
        {"emplace_back", [](Points& points) { points.emplace_back(1.0, 2.0); }},
        {"insert of one", [](Points& points) { points.insert(points.end(), kPoint); }},
        {"insert of copies", [](Points& points) { points.insert(points.end(), 2, kPoint); }},
        {"insert of a range",
         [&](Points& points) { points.insert(points.end(), two.begin(), two.end()); }},
        {"insert of a list", [](Points& points) { points.insert(points.end(), kPair); }},
        {"emplace", [](Points& points) { points.emplace(points.end(), 1.0, 2.0); }},
        {"resize", [](Points& points) { points.resize(points.size() + 1); }},
    };
    for (Row const& row : rows) {
        SCOPED_TRACE(row.label);
        Points points;
        tests::AllocationCounter counter;
        for (int i = 0; i < 1000; ++i) row.append(points);
        EXPECT_LE(counter.count(), 10u);
    }
}

TEST(Points, ReuseTheirCapacityInAssignments) {
    struct Row {
        char const* label;
        std::function<void(Points&)> assign;
        std::size_t size;
    };
    Points const few = counted(2);
    Points const many = counted(10);
    Points const full = counted(20);
    Row const rows[] = {
        {"copy of few", [&](Points& points) { points = few; }, 2},
        {"copy of many", [&](Points& points) { points = many; }, 10},
        {"copy of as many as there is room for", [&](Points& points) { points = full; }, 20},
        {"list", [](Points& points) { points = kList; }, 4},
        {"assign a list", [](Points& points) { points.assign(kList); }, 4},
        {"assign equal points", [](Points& points) { points.assign(1, FloatVec2()); }, 1},
        {"itself", [](Points& points) { points = *&points; }, 20},
        {"assign as many equal points as there is room for",
         [&](Points& points) {
             points.assign(20, {0, 0});
             points = full;
         },
         20},
    };
    for (Row const& row : rows) {
        SCOPED_TRACE(row.label);
        Points points = counted(20);
        FloatVec2 const* const before = points.data();
        tests::AllocationCounter counter;
        row.assign(points);
        EXPECT_EQ(counter.count(), 0u);
        EXPECT_EQ(points.data(), before);
        EXPECT_EQ(points.capacity(), 20u);
        expectSame(points, counted(row.size));
    }
    Points points = counted(20);
    points.assign(points.begin() + 5, points.end());
    points.assign(points.begin(), points.begin() + 3);
    EXPECT_EQ(points, (Points{{5, 2.5}, {6, 3}, {7, 3.5}}));
    EXPECT_EQ(points.capacity(), 20u);
}

TEST(Points, AllocateOnceForAForwardRange) {
    std::list<FloatVec2> const list(1000, {1, 2});
    tests::AllocationCounter counter;
    Points const points(list.begin(), list.end());
    EXPECT_EQ(counter.count(), 1u);
    EXPECT_EQ(points.capacity(), 1000u);
}

TEST(Points, FreeARangeThatThrows) {
    tests::AllocationCounter counter;
    EXPECT_EQ(tests::failEachAllocation([] { Points(ReadOnce{0}, ReadOnce{20}); },
                                        [&] { EXPECT_EQ(counter.held(), 0u); }),
              3u);
    expectSame(Points(ReadOnce{0}, ReadOnce{20}), counted(20));
}

TEST(Points, HaveConstFrontAndBack) {
    Points const few{{1, 2}, {3, 4}};
    Points const many{{1, 2}, {3, 4}, {5, 6}, {7, 8}};
    EXPECT_EQ(few.front(), (FloatVec2{1, 2}));
    EXPECT_EQ(few.back(), (FloatVec2{3, 4}));
    EXPECT_EQ(many.front(), (FloatVec2{1, 2}));
    EXPECT_EQ(many.back(), (FloatVec2{7, 8}));
}

TEST(Points, CompareAsFloatingPointNumbers) {
    EXPECT_TRUE((Points{{0.0, 1}} == Points{{-0.0, 1}}));
    EXPECT_TRUE((Points{{NAN, 1}} != Points{{NAN, 1}}));
    EXPECT_TRUE((Points{{1, 1}} != Points{{1, 1}, {1, 1}}));
}

TEST(Points, ReturnThePositionOfAnInsertion) {
    Points points{{1, 1}, {2, 2}, {3, 3}};
    EXPECT_EQ(points.insert(points.begin() + 2, FloatVec2{9, 9}) - points.begin(), 2);
    EXPECT_EQ(points.insert(points.end(), 2, FloatVec2{8, 8}) - points.begin(), 4);
    EXPECT_EQ(points.insert(points.begin() + 1, {{7, 7}, {6, 6}}) - points.begin(), 1);
    EXPECT_EQ(points, (Points{{1, 1}, {7, 7}, {6, 6}, {2, 2}, {9, 9}, {3, 3}, {8, 8}, {8, 8}}));
}

TEST(Points, RejectAnIndexOutOfRange) {
    Points points{{1, 2}};
    Points const& constant = points;
    EXPECT_THROW(points.at(1), std::out_of_range);
    EXPECT_THROW(constant.at(static_cast<std::size_t>(-1)), std::out_of_range);
    try {
        points.at(1);
    } catch (std::out_of_range const& error) {
        EXPECT_STREQ(error.what(), "Points::at");
    }
}

TEST(Points, StayUnchangedWhenAllocationFails) {
    Points points = counted(3);
    auto const untouched = [&] { expectSame(points, counted(3)); };
    EXPECT_EQ(tests::failEachAllocation([&] { points.push_back({9, 9}); }, untouched), 1u);
    points = counted(3);
    EXPECT_EQ(tests::failEachAllocation([&] { points.reserve(100); }, untouched), 1u);
    EXPECT_EQ(points.capacity(), 100u);
    points.shrink_to_fit();
    Points const more = counted(50);
    EXPECT_EQ(tests::failEachAllocation([&] { points = more; }, untouched), 1u);
    expectSame(points, counted(50));
    points = counted(3);
    points.shrink_to_fit();
    EXPECT_EQ(tests::failEachAllocation([&] { points.assign(50, {9, 9}); }, untouched), 1u);
    expectSame(points, std::vector<FloatVec2>(50, {9, 9}));
}

TEST(Points, BehaveLikeAVector) {
    tests::Random random(42);
    for (int round = 0; round < 300; ++round) {
        Points points;
        std::vector<FloatVec2> model;
        for (int step = 0; step < 60; ++step) {
            FloatVec2 const p{random.number(), random.number()};
            std::size_t const at = random.below(model.size() + 1);
            auto const offset = static_cast<std::ptrdiff_t>(at);
            switch (random.below(16)) {
                case 0:
                    points.emplace_back(p.x, p.y);
                    model.push_back(p);
                    break;
                case 1:
                    points.insert(points.begin() + offset, p);
                    model.insert(model.begin() + offset, p);
                    break;
                case 2:
                    points.insert(points.begin() + offset, at, p);
                    model.insert(model.begin() + offset, at, p);
                    break;
                case 3:
                    points.insert(points.begin() + offset, {p, p});
                    model.insert(model.begin() + offset, {p, p});
                    break;
                case 4:
                    if (at == model.size()) break;
                    points.erase(points.begin() + offset);
                    model.erase(model.begin() + offset);
                    break;
                case 5:
                    points.erase(points.cbegin() + offset, points.cend());
                    model.erase(model.begin() + offset, model.end());
                    break;
                case 6:
                    points.resize(at, p);
                    model.resize(at, p);
                    break;
                case 7:
                    points.resize(model.size() + 2, p);
                    model.resize(model.size() + 2, p);
                    break;
                case 8:
                    points.assign(3, p);
                    model.assign(3, p);
                    break;
                case 9:
                    points.assign({p, p});
                    model.assign({p, p});
                    break;
                case 10: points.shrink_to_fit(); break;
                case 11:
                    if (model.empty()) break;
                    points.pop_back();
                    model.pop_back();
                    break;
                case 12:
                    if (model.empty()) break;
                    points.front() = p;
                    model.front() = p;
                    ASSERT_EQ(points.back(), model.back());
                    break;
                case 13: {  // Inserts a range of its own points.
                    std::vector<FloatVec2> const own = model;
                    points.insert(points.begin() + offset, points.begin(), points.end());
                    model.insert(model.begin() + offset, own.begin(), own.end());
                    if (model.size() > 40) {
                        points.clear();
                        model.clear();
                    }
                    break;
                }
                case 14:
                    points.emplace(points.begin() + offset, p.x, p.y);
                    model.insert(model.begin() + offset, p);
                    break;
                default:
                    points.push_back(p);
                    model.push_back(p);
                    break;
            }
            expectSame(points, model);
            if (HasFatalFailure()) return;
        }
    }
}
