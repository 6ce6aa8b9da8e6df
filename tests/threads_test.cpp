// Values, data and indexes shared among threads, and lazily initialised statics. To be run with
// ThreadSanitizer too.

#include <Engine/Base/easing.h>
#include <Engine/Base/media.h>
#include <Engine/Base/patch_index.h>
#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>

#include "support/graphs.h"
#include "support/print.h"

#include <gtest/gtest.h>

#include <atomic>
#include <functional>
#include <sstream>
#include <thread>
#include <vector>

using namespace tarn::engine;
using namespace tests;

namespace {

constexpr int kThreads = 8;

// Runs `work` on all threads, starting them together.
void onManyThreads(std::function<void(int thread)> const& work) {
    std::atomic<int> waiting{kThreads};
    std::vector<std::thread> threads;
    for (int i = 0; i < kThreads; ++i) {
        threads.emplace_back([&, i] {
            for (--waiting; waiting > 0;) std::this_thread::yield();
            work(i);
        });
    }
    for (std::thread& thread : threads) thread.join();
}

Loop sharedValues() {
    Unstructured::Map map{{"X", 1.5}, {"list", Unstructured::Array{1, "two", 3u}}};
    return {2.5,
            -0.0,
            7,
            true,
            FloatVec2{1, 2},
            FloatVec4{1, 2, 3, 4},
            FloatMat4(),
            Value::Image(5),
            "text",
            Unstructured(map),
            PathBuilder().circle({0, 0}, 1).build()};
}

}  // namespace

// The first test of the program, so that all threads initialise the statics at once.
TEST(Threads, InitialiseStaticsConcurrently) {
    TypeInfo const bounded{Type::Float, 0, Value(1.0), Value(2.0), {}};
    std::vector<Path const*> paths(kThreads);
    std::vector<Loop const*> loops(kThreads);
    std::vector<std::string> texts(kThreads);
    std::vector<std::vector<std::string> const*> types(kThreads);
    std::vector<Value const*> nulls(kThreads);
    onManyThreads([&](int i) {
        auto const n = static_cast<std::size_t>(i);
        texts[n] = to_string(Value(-0.001)) + " " + to_string(Value(-1234.56));
        paths[n] = Path::EmptyPath().get();
        loops[n] = &nullLoop();
        types[n] = &keyboardTypes();
        nulls[n] = &indexLoopCasting({}, TypeInfo(), 3);
        EXPECT_EQ(double(indexLoopCasting({}, bounded, 3)), 1.0);
        EXPECT_EQ(easingFunctionNames().size(), 13u);
    });
    for (std::size_t n = 0; n < kThreads; ++n) {
        EXPECT_EQ(texts[n], "0 -1234.6");
        EXPECT_EQ(paths[n], Path::EmptyPath().get());
        EXPECT_EQ(loops[n], &nullLoop());
        EXPECT_EQ(types[n], &keyboardTypes());
        EXPECT_EQ(nulls[n], nulls[0]);
    }
}

TEST(Threads, CopyReadComparePrintAndDestroySharedValues) {
    Loop const values = sharedValues();
    Loop const twins = sharedValues();
    onManyThreads([&](int) {
        for (int round = 0; round < 200; ++round) {
            Loop copies = values;
            EXPECT_EQ(copies, values);
            EXPECT_EQ(copies, twins);
            std::ostringstream stream;
            double sum = 0.0;
            for (Value const& value : copies) {
                stream << value;
                sum += double(value) + FloatVec4(value).x + FloatMat4(value).elements[0];
                sum += double(Path(value).elements.size()) + double(std::string(value).size());
                EXPECT_EQ(value.asType(value.type()), value);
                EXPECT_EQ(Unstructured(value), value.asUnstructured());
            }
            EXPECT_GT(sum, 0.0);
            EXPECT_FALSE(stream.str().empty());
            copies.erase(copies.begin(), copies.begin() + 6);
        }
    });
}

TEST(Threads, MayReleaseTheLastReference) {
    for (int round = 0; round < 50; ++round) {
        std::vector<Loop> loops(kThreads, sharedValues());
        for (Loop& loop : loops) loop = loops.front();
        onManyThreads([&](int i) {
            Loop& own = loops[static_cast<std::size_t>(i)];
            EXPECT_EQ(std::string(own[8]), "text");
            own.clear();
        });
    }
}

TEST(Threads, ShareGraphsAndConvertThem) {
    Patch const root = withPorts(
        patch(1, {withPorts(patch(2), {port(21)}, {port(22)}), patch(3)}, {{2, 22, 2, 21}}),
        {port(11)}, {port(12)});
    onManyThreads([&](int) {
        for (int round = 0; round < 200; ++round) {
            Patch const copy = root;
            EXPECT_EQ(copy, root);
            EXPECT_EQ(findPatchRecursive(copy, 2)->id, 2u);
            EXPECT_EQ(findOutgoingConnectionsFromPort(copy, 22).size(), 1u);
            EvalPatch evaluated(copy);
            evaluated.inputs->at(0).values[0] = 5.0;
            EXPECT_NE(evaluated, EvalPatch(root));
        }
    });
}

TEST(Threads, QueryOneIndex) {
    PatchIndex const index(withPorts(
        patch(1, {withPorts(patch(2), {port(21)}, {port(22)}), patch(3)}, {{2, 22, 2, 21}}),
        {port(11)}, {port(12)}));
    onManyThreads([&](int) {
        for (int round = 0; round < 500; ++round) {
            PatchIndex const copy = index;
            EXPECT_EQ(copy.findPatch(2), index.findPatch(2));
            EXPECT_EQ(copy.parentOf(2), &index.root());
            EXPECT_EQ(index.ownerOfPort(22)->id, 2u);
            EXPECT_EQ(index.outgoingConnections(22).size(), 1u);
            EXPECT_EQ(index.incomingConnection(21)->fromPortId, 22u);
            EXPECT_EQ(index.findInputPort(99), nullptr);
        }
    });
}
