#include <Engine/Base/patch.h>

#include <Engine/Base/path.h>

#include "support/graphs.h"
#include "support/print.h"
#include "support/streams.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <iomanip>
#include <iterator>
#include <sstream>

using namespace tarn::engine;
using namespace tests;

TEST(GraphOutput, PrintsPortsAndConnections) {
    Port p = port(12, 34);
    p.typeInfo.type = Type::Vec2;
    p.defaultValue = FloatVec2{1, 2.5};
    EXPECT_EQ(written(p), "[p12:12 tag: 34 typeInfo: [type: vec2] defaultValue: 1, 2.5]");
    p.name = "";
    EXPECT_EQ(written(p), "[:12 tag: 34 typeInfo: [type: vec2] defaultValue: 1, 2.5]");
    EXPECT_EQ(written(Connection{1, 2, 3, 4}), "[connection:2->4]");
    std::ostringstream hex;
    hex << std::hex << Connection{1, 255, 3, 16} << p;
    EXPECT_EQ(hex.str(),
              "[connection:ff->10][:c tag: 22 typeInfo: [type: vec2] defaultValue: 1, 2.5]");
}

TEST(GraphOutput, PrintsPatches) {
    std::string const in = "[p11:11 tag: 0 typeInfo: [type: float] defaultValue: 0]";
    std::string const out = "[p12:12 tag: 0 typeInfo: [type: float] defaultValue: 0]";
    struct Row {
        char const* what;
        Patch patch;
        std::string text;
    };
    for (Row const& row : {
             Row{"nothing", patch(1), "[patch:1 name: n1 builtin: 0]"},
             Row{"one input", withPorts(patch(1), {port(11)}, {}),
                 "[patch:1 name: n1 builtin: 0  " + in + "\n"},
             Row{"one output", withPorts(patch(1), {}, {port(12)}),
                 "[patch:1 name: n1 builtin: 0  " + out + "\n"},
             Row{"both", withPorts(patch(1), {port(11)}, {port(12)}),
                 "[patch:1 name: n1 builtin: 0  " + in + "\n  " + out + "\n"},
             Row{"one child", patch(1, {patch(2)}),
                 "[patch:1 name: n1 builtin: 0][patch:2 name: n2 builtin: 0]\n"},
             Row{"child with a port", patch(1, {withPorts(patch(2), {port(11)}, {})}),
                 "[patch:1 name: n1 builtin: 0][patch:2 name: n2 builtin: 0  " + in + "\n\n"},
             Row{"connections after children",
                 patch(1, {patch(2, {}, {{0, 3, 0, 4}})}, {{0, 1, 0, 2}}),
                 "[patch:1 name: n1 builtin: 0][patch:2 name: n2 builtin: 0][connection:3->4]\n"
                 "\n[connection:1->2]\n"},
         }) {
        SCOPED_TRACE(row.what);
        EXPECT_EQ(written(row.patch), row.text);
    }
}

TEST(GraphOutput, FollowsStreamFlagsAndNewline) {
    Patch source = withPorts(patch(255), {port(16)}, {});
    source.builtin = 17;
    std::ostringstream stream;
    stream.imbue(tests::barForNewline());
    stream << std::hex << source;
    EXPECT_EQ(stream.str(), "[patch:ff name: n255 builtin: 11  [p16:10 tag: 0 typeInfo: [type: "
                            "float] defaultValue: 0]|");
}

TEST(GraphOutput, MatchesTheGoldenFile) {
    std::ifstream file(TARN_TESTS_GOLDEN_DIR "/document.txt", std::ios::binary);
    ASSERT_TRUE(file);
    std::string const golden((std::istreambuf_iterator<char>(file)), {});
    EXPECT_EQ(written(sampleDocument()), golden);
}

TEST(GraphOutput, FlushesEveryLine) {
    tests::FlushCounter buffer;
    std::ostream stream(&buffer);
    EXPECT_EQ(&(stream << sampleDocument()), &stream);
    std::string const text = buffer.str();
    EXPECT_EQ(buffer.flushes, std::count(text.begin(), text.end(), '\n'));
    EXPECT_EQ(&(stream << port(1)), &stream);
    EXPECT_EQ(&(stream << Connection()), &stream);
}
