// The example program, run from the command line: its output, and its messages for invalid input.

#include "support/document_road.h"
#include "support/random.h"

#include <algorithm>
#include <string>
#include <vector>

namespace {

using tests::contentsOf;
using tests::DocumentRoad;

std::string const kDocuments = TARN_DOCUMENTS_DIR "/";

std::string graph(std::string const& nodes, std::string const& links = "[]") {
    return R"({"nodes":)" + nodes + R"(,"links":)" + links + "}";
}

}  // namespace

TEST_F(DocumentRoad, PrintsTheBundledDocuments) {
    struct Row {
        char const* arguments;
        char const* golden;
    };
    for (Row const& row : {
             Row{"small.json --frames 5", "small_frames.txt"},
             Row{"small.json --frames 0 --debug", "small_debug.txt"},
             Row{"animation.json", "animation_frames.txt"},
             Row{"animation.json --frames 25 --every 6", "animation_every_6.txt"},
             Row{"animation.json --frames 0 --debug", "animation_debug.txt"},
             Row{"animation.json --frames 0 --patch 6 --port 651", "animation_patch_6.txt"},
             Row{"animation.json --frames 0 --patch 1 --port 603", "animation_patch_1.txt"},
             Row{"animation.json --frames 25 --every 12 --paths", "animation_paths.txt"},
             Row{"node_graph.json --frames 3", "node_graph_frames.txt"},
             Row{"node_graph.json --frames 0 --patch 7 --port 13", "node_graph_patch_7.txt"},
         }) {
        SCOPED_TRACE(row.arguments);
        Outcome const outcome = run(kDocuments + row.arguments);
        EXPECT_EQ(outcome.status, 0);
        bool const isGraph = std::string(row.golden).find("node_graph") == 0;
        EXPECT_EQ(outcome.errors, isGraph ? "document_road: " + kDocuments +
                                                "node_graph.json: 3 nodes renumbered, 1 link left "
                                                "out\n"
                                          : "");
        EXPECT_EQ(outcome.output, contentsOf(std::string(TARN_TESTS_GOLDEN_DIR "/") + row.golden));
        EXPECT_NE(outcome.output, "");
    }
}

TEST_F(DocumentRoad, RejectsInvalidInputInOneLine) {
    std::string deep = R"({"root":)";
    for (int i = 0; i < 1000; ++i) deep += R"({"id":)" + std::to_string(i + 1) + R"(,"children":[)";
    deep += R"({"id":1001})";
    for (int i = 0; i < 1000; ++i) deep += "]}";
    struct Row {
        char const* what;
        std::string contents;
        std::string line;
    };
    for (Row const& row : {
             Row{"empty", "", "it is empty"},
             Row{"truncated", "{\"root\":\n {\"id\": 1,",
                 "line 2, column 11: /root/id: the JSON is incomplete"},
             Row{"another object", "{}",
                 "line 1, column 1: neither a document (it has no \"root\") nor a node graph (it "
                 "has no "
                 "\"nodes\")"},
             Row{"unknown kind", document(R"({"id":2,"kind":"blur"})"),
                 "line 1, column 44: /root/children/0/kind: unknown kind \"blur\""},
             Row{"a terminal's escape", R"({"root":{"id":1,"kind":"\u001b[31m\n"}})",
                 "line 1, column 24: /root/kind: unknown kind \"\\x1b[31m\\n\""},
             Row{"graph", graph("[5]"),
                 "line 1, column 11: /nodes/0: expected an object, found number 5"},
             Row{"deeper than is shown", deep + "}", "nested deeper than 1000 levels"},
             Row{"a port of no type", document(R"({"id":2,"inputs":[{"id":3,"type":77}]})"),
                 "port 3 has no type that is known"},
         }) {
        SCOPED_TRACE(row.what);
        std::string const file = write("bad.json", row.contents);
        Outcome const outcome = run(file + " --debug");
        EXPECT_EQ(outcome.status, 2);
        EXPECT_EQ(outcome.output, "");
        EXPECT_EQ(outcome.errors, "document_road: " + file + ": " + row.line + "\n");
    }
}

TEST_F(DocumentRoad, SavesInTheOwnFormat) {
    for (std::string const name : {"animation.json", "small.json", "node_graph.json"}) {
        SCOPED_TRACE(name);
        std::string const copy = (folder / "copy.json").string();
        Outcome const first = run(kDocuments + name + " --debug --frames 3 --write " + copy);
        EXPECT_EQ(first.status, 0);
        Outcome const second = run(copy + " --debug --frames 3 --write " + copy);
        EXPECT_EQ(second.status, 0);
        EXPECT_EQ(second.errors, "");
        // The graph without its notes, and its results.
        EXPECT_EQ(second.output.substr(second.output.find("\n\n")),
                  first.output.substr(first.output.find("\n\n")));
        std::string const saved = contentsOf(copy);
        EXPECT_EQ(run(copy + " --frames 0 --write " + copy).status, 0);
        EXPECT_EQ(contentsOf(copy), saved);
    }
    Outcome const refused =
        run(kDocuments + "small.json --write " + (folder / "none" / "copy.json").string());
    EXPECT_EQ(refused.status, 1);
    EXPECT_EQ(refused.output, "");
    EXPECT_NE(refused.errors.find("cannot be written"), std::string::npos);
}

TEST_F(DocumentRoad, RejectsFoldersAndMissingFiles) {
    struct Row {
        std::string file;
        char const* line;
    };
    for (Row const& row : {
             Row{(folder / "missing.json").string(), "there is no such file"},
             Row{folder.string(), "it is a folder"},
         }) {
        Outcome const outcome = run(row.file);
        EXPECT_EQ(outcome.status, 2);
        EXPECT_EQ(outcome.output, "");
        EXPECT_EQ(outcome.errors, "document_road: " + row.file + ": " + row.line + "\n");
    }
}

TEST_F(DocumentRoad, RejectsAHundredMegabytesOfBracketsQuickly) {
    for (std::string const bracket : {"[", "{"}) {
        std::string const file = write("brackets.json", std::string(100 << 20, bracket[0]));
        Outcome const outcome = run(file);
        EXPECT_EQ(outcome.status, 2);
        EXPECT_EQ(outcome.output, "");
        EXPECT_EQ(outcome.errors, "document_road: " + file + ": line 1, column " +
                                      (bracket == "[" ? "1: expected an object, found array\n"
                                                      : "2: this is not valid JSON\n"));
    }
}

TEST_F(DocumentRoad, RejectsUnknownIdentifiersAndOptions) {
    struct Row {
        char const* arguments;
        char const* line;
    };
    for (Row const& row : {
             Row{"--patch 99", "no patch 99"},
             Row{"--patch 0", "no patch 0"},
             Row{"--port 99", "no port 99"},
         }) {
        Outcome const outcome = run(kDocuments + "small.json " + row.arguments);
        EXPECT_EQ(outcome.status, 2);
        EXPECT_EQ(outcome.output, "");
        EXPECT_EQ(outcome.errors,
                  "document_road: " + kDocuments + "small.json: " + row.line + "\n");
    }
    for (char const* arguments :
         {"", "--frames -1 x.json", "--every 0 x.json", "--unknown x.json"}) {
        SCOPED_TRACE(arguments);
        Outcome const outcome = run(arguments);
        EXPECT_EQ(outcome.status, 2);
        EXPECT_EQ(outcome.output, "");
        EXPECT_NE(outcome.errors, "");
    }
    EXPECT_EQ(run("--help").status, 0);
}

TEST_F(DocumentRoad, ReadsNodeGraphsAndReportsWhatIsMissing) {
    std::string const file = write(
        "graph.json",
        graph(R"([{"id":5,"type":"basic/const","outputs":[{"name":"value","type":"number"}],
                   "properties":{"value":"2.5"},"widgets":[1]},
                  {"id":-3,"type":"odd","inputs":[{"type":0},{"type":-1,"shape":7}],"outputs":null},
                  {"id":6,"type":"nested","subgraph":{"nodes":[{"id":5,"type":"x"}],"extra":1}}])",
              R"([[1,5,0,-3,0,0],null,[2,5,1,-3,0,0],[3,5,0,-3,2,0],[4,8,0,5,0,0],[5,5,0,8,0,0],
                  {"id":6,"origin_id":5,"origin_slot":-1,"target_id":-3,"target_slot":0}])"));
    Outcome const outcome = run(file + " --frames 1 --patch 5 --port 3");
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.errors,
              "document_road: " + file + ": 2 nodes renumbered, 5 links left out\n");
    EXPECT_EQ(outcome.output,
              "read a node graph: 5 patches in 3 levels, 3 ports, 1 connection\n"
              "ports: 1 Number, 1 Pulse, 1 Unstructured\n"
              "kinds without an implementation (outputs are the defaults of inputs): odd x\n"
              "/links/2: link 2 left out: there is no output 1 of node 5\n"
              "/links/3: link 3 left out: there is no input 2 of node -3\n"
              "/links/4: link 4 left out: there is no node 8\n"
              "/links/5: link 5 left out: there is no node 8\n"
              "/links/6: link 6 left out: there is no output -1 of node 5\n"
              "\n"
              "patch 5 \"basic/const\", constant (basic/const)\n"
              "  in: patch 3 \"graph\", group\n"
              "  output port 1 \"value\", Number [type: float], default 2.5\n"
              "  children: 0\n"
              "  attributes: properties widgets\n"
              "  incoming:\n"
              "    none\n"
              "  outgoing:\n"
              "    [connection:1->2] from patch 5 to patch 1\n"
              "\n"
              "input port 3 \"\", Pulse [type: boolean], default 0\n"
              "  of: patch 1 \"odd\", unknown (odd)\n"
              "  tag: 2\n"
              "  attributes: shape type\n"
              "  incoming:\n"
              "    none\n"
              "\n"
              "frame\n"
              "0\n");
}

TEST_F(DocumentRoad, ReadsTheExampleInTheFormatsDocumentation) {
    std::string const page = contentsOf(kDocuments + "README.md");
    std::string const open = "```json\n";
    std::size_t const begin = page.find(open);
    ASSERT_NE(begin, std::string::npos);
    std::size_t const start = begin + open.size();
    Outcome const outcome = run(
        write("page.json", page.substr(start, page.find("```", start) - start)) + " --frames 1");
    EXPECT_EQ(outcome.errors, "");
    EXPECT_EQ(outcome.output, "read a document: 3 patches in 2 levels, 4 ports, 1 connection\n"
                              "ports: 4 Numbers\n"
                              "\n"
                              "frame  radius\n0      0\n");
}

TEST_F(DocumentRoad, DistinguishesTheOutputsOfTimeNodes) {
    Outcome const outcome = run(write("time.json", graph(R"([{"id":1,"type":"basic/time","outputs":[
        {"name":"in ms","type":"number"},{"name":"in sec","type":"number"}]}])")) +
                                " --frames 31 --every 30");
    EXPECT_EQ(outcome.errors, "");
    EXPECT_EQ(outcome.output.substr(outcome.output.find("frame")),
              "frame  1 in ms  1 in sec\n0      0        0\n30     500      0.5\n");
}

TEST_F(DocumentRoad, EvaluatesEveryKind) {
    // The outputs of each kind for constant inputs, as the table of frame 3 prints them.
    struct Row {
        char const* kind;
        char const* inputs;
        char const* outputs;
        char const* row;
    };
    for (
        Row const& row : {
            Row{"time", "",
                R"({"id":51,"type":"float"},{"id":52,"type":"int"},{"id":53,"type":"float"})",
                "3  0.5  3  500"},
            Row{"constant",
                R"({"id":3,"type":"string","default":"a"},{"id":4,"type":"int","default":7})",
                R"({"id":51,"type":"string"},{"id":52,"type":"int"})", "3  a  7"},
            Row{"ease",
                R"({"id":3,"type":"float","default":0},{"id":4,"type":"float","default":100},
                    {"id":5,"type":"float","default":0.5},{"id":6,"type":"string","default":"Cubic Out"})",
                R"({"id":51,"type":"float"})", "3  87.5"},
            Row{"ease",
                R"({"id":3,"type":"float","default":0},{"id":4,"type":"float","default":8},
                    {"id":5,"type":"float","default":0.5},{"id":6,"type":"int","default":1})",
                R"({"id":51,"type":"float"})", "3  2"},
            Row{"ease",
                R"({"id":3,"type":"float","default":0},{"id":4,"type":"float","default":8},
                    {"id":5,"type":"float","default":5,"max":0.5},{"id":6,"type":"int","default":99})",
                R"({"id":51,"type":"float"})", "3  4"},
            Row{"oscillator",
                R"({"id":3,"type":"float","default":3},{"id":4,"type":"float","default":1},
                    {"id":5,"type":"float","default":0.25},{"id":6,"type":"float","default":0})",
                R"({"id":51,"type":"float"})", "3  3"},
            Row{"add",
                R"({"id":3,"type":"vec2","default":[1,2]},{"id":4,"type":"float","default":10})",
                R"({"id":51,"type":"vec2"})", "3  11, 12"},
            Row{"multiply",
                R"({"id":3,"type":"int","default":6},{"id":4,"type":"int","default":7})",
                R"({"id":51,"type":"int"})", "3  42"},
            Row{"compose",
                R"({"id":3,"type":"float","default":1},{"id":4,"type":"float","default":2},
                    {"id":5,"type":"float","default":3})",
                R"({"id":51,"type":"vec4"})", "3  1, 2, 3, 0"},
            Row{"split", R"({"id":3,"type":"vec3","default":[1,2,3]})",
                R"({"id":51,"type":"float"},{"id":52,"type":"float"},{"id":53,"type":"float"},
                    {"id":54,"type":"float"})",
                "3  1  2  3  0"},
            Row{"loop", R"({"id":3,"type":"int","default":4})",
                R"({"id":51,"type":"int"},{"id":52,"type":"float"})",
                "3  [0 | 1 | 2 | 3]  [0 | 0.25 | 0.5 | 0.75]"},
            Row{"loop", R"({"id":3,"type":"int","default":-5})", R"({"id":51,"type":"int"})",
                "3  0"},
            Row{"loop", R"({"id":3,"type":"int","default":9000000000000})",
                R"({"id":51,"type":"int"})", "3  [0 | 1 | 2 | 3 | 4 | 5 | 6 | 7 | 8 | ..."},
            Row{"pulse", R"({"id":3,"type":"float","default":0.5})", R"({"id":51,"type":"pulse"})",
                "3  1"},
            Row{"pulse", R"({"id":3,"type":"float","default":0})", R"({"id":51,"type":"pulse"})",
                "3  0"},
            Row{"choose",
                R"({"id":3,"type":"boolean","default":true},{"id":4,"type":"string","default":"yes"},
                    {"id":5,"type":"string","default":"no"})",
                R"({"id":51,"type":"string"})", "3  yes"},
            Row{"circle", R"({"id":3,"type":"vec2"},{"id":4,"type":"float","default":1})",
                R"({"id":51,"type":"path"})", "3  Path"},
            Row{"ellipse", R"({"id":3,"type":"vec2"},{"id":4,"type":"vec2","default":[1,2]})",
                R"({"id":51,"type":"path"})", "3  Path"},
            Row{"roundRect", R"({"id":3,"type":"vec2"},{"id":4,"type":"vec2","default":[1,2]})",
                R"({"id":51,"type":"path"})", "3  Path"},
            Row{"hexaRect", R"({"id":3,"type":"vec2"},{"id":4,"type":"vec2","default":[1,2]})",
                R"({"id":51,"type":"path"})", "3  Path"},
            Row{"arc", R"({"id":3,"type":"vec2"},{"id":4,"type":"vec2","default":[1,2]})",
                R"({"id":51,"type":"path"})", "3  Path"},
            Row{"joinPaths", R"({"id":3,"type":"path"},{"id":4,"type":"path"})",
                R"({"id":51,"type":"path"})", "3  Empty Path"},
            Row{"layer", R"({"id":3,"type":"path"})", R"({"id":51,"type":"layer"})",
                "3  unstructured"},
            Row{"text",
                R"({"id":3,"type":"string","default":"n = "},{"id":4,"type":"float","default":2.5})",
                R"({"id":51,"type":"string"})", "3  n = 2.5"},
            Row{"unknown", R"({"id":3,"type":"float","default":2.5})",
                R"({"id":51,"type":"int"},{"id":52,"type":"int","default":9})", "3  2  9"},
        }) {
        SCOPED_TRACE(std::string(row.kind) + " " + row.inputs);
        std::string const file = write(
            "kind.json", R"({"framesPerSecond":6,"root":{"id":1,"children":[{"id":2,"kind":")" +
                             std::string(row.kind) + R"(","inputs":[)" + row.inputs +
                             R"(],"outputs":[)" + row.outputs + "]}]}}");
        Outcome const outcome = run(file + " --frames 4 --every 3");
        EXPECT_EQ(outcome.errors, "");
        std::string last = outcome.output.substr(0, outcome.output.size() - 1);
        last = last.substr(last.rfind('\n') + 1);
        std::string squeezed;  // Columns are as wide as their headings.
        for (std::size_t i = 0; i < last.size(); ++i) {
            if (last.substr(i, 3) != "   ") squeezed += last[i];
        }
        EXPECT_EQ(squeezed, row.row);
    }
}

TEST_F(DocumentRoad, EvaluatesCyclesWithThePreviousFrame) {
    std::string const counter = document(
        R"({"id":2,"kind":"add","inputs":[{"id":21,"type":"int"},{"id":22,"type":"int","default":1}],
            "outputs":[{"id":23,"type":"int"},{"id":24,"type":"int","tag":1}]})",
        R"([{"from":[2,23],"to":[2,21]}])");
    Outcome const outcome = run(write("circle.json", counter) + " --frames 4");
    EXPECT_EQ(outcome.errors, "");
    EXPECT_EQ(outcome.output, "read a document: 2 patches in 2 levels, 4 ports, 1 connection\n"
                              "ports: 4 Numbers\n"
                              "\n"
                              "frame  2\n0      1\n1      2\n2      3\n3      4\n");
}

TEST_F(DocumentRoad, EvaluatesGraphsWithDanglingConnections) {
    std::string const file =
        write("nowhere.json", R"({"identifiers":"any","root":{"id":1,"children":[
            {"id":2,"kind":"add","inputs":[{"id":21,"type":"int","default":3}],
             "outputs":[{"id":23,"type":"int"}]}],
            "connections":[{"from":[5,6],"to":[2,21]},{"from":[2,23],"to":[7,8]}]}})");
    Outcome const outcome = run(file + " --frames 1");
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.errors, "");
    EXPECT_NE(outcome.output.find("2 connections\n"), std::string::npos) << outcome.output;
}

// For any file the result is a document or an error of one line.
TEST_F(DocumentRoad, SurvivesCorruptedDocuments) {
    tests::Random random(77);
    std::string const original = contentsOf(kDocuments + "node_graph.json");
    std::string const own = contentsOf(kDocuments + "small.json");
    int refused = 0;
    for (int i = 0; i < 150; ++i) {
        std::string text = random.chance() ? original : own;
        for (std::size_t n = random.below(3) + 1; n > 0; --n) {
            std::size_t const at = random.below(text.size());
            switch (random.below(4)) {
                case 0: text.erase(at, random.below(20) + 1); break;
                case 1: text.insert(at, 1, "[]{}\",:0-9e"[random.below(11)]); break;
                case 2: text[at] = static_cast<char>(random.below(256)); break;
                default: text.resize(at + 1); break;
            }
        }
        Outcome const outcome = run(write("damaged.json", text) + " --frames 2 --debug");
        ASSERT_TRUE(outcome.status == 0 || outcome.status == 2) << outcome.status << "\n" << text;
        ASSERT_TRUE(outcome.status == 0 || !outcome.errors.empty());
        ASSERT_EQ(outcome.status == 2, outcome.output.empty());
        ASSERT_LE(std::count(outcome.errors.begin(), outcome.errors.end(), '\n'), 1);
        refused += outcome.status == 2;
    }
    EXPECT_GT(refused, 50);
}

TEST_F(DocumentRoad, ComparesTwoDocuments) {
    std::string const first = write("first.json", document(R"({"id":2,"name":"a"},{"id":3})"));
    std::string const second = write(
        "second.json",
        R"({"framesPerSecond":24,"root":{"id":1,"children":[{"id":2,"name":"b"},{"id":4}]}})");
    std::string const foreign = write("foreign.json", graph(R"([{"id":5,"type":"x"}])"));
    std::string const wrong = write("wrong.json", "{");
    struct Row {
        char const* what;
        std::string arguments;
        int status;
        std::string output;
        std::string errors;
    };
    for (Row const& row : {
             Row{"the same", first + " --compare " + first, 0, "", ""},
             Row{"changed", first + " --compare " + second, 1,
                 "changed patch 2 \"a\": name \"a\" -> \"b\"\nadded patch 4 to patch 1\nremoved "
                 "patch 3 from patch 1\nchanged frames per second 60.0 -> 24.0\n",
                 ""},
             Row{"the other way round", second + " --compare " + first, 1,
                 "changed patch 2 \"b\": name \"b\" -> \"a\"\nadded patch 3 to patch 1\nremoved "
                 "patch 4 from patch 1\nchanged frames per second 24.0 -> 60.0\n",
                 ""},
             Row{"a foreign one", foreign + " --compare " + foreign, 0, "", ""},
             Row{"a wrong one", first + " --compare " + wrong, 2, "",
                 "document_road: " + wrong + ": line 1, column 2: the JSON is incomplete\n"},
             Row{"a wrong first one", wrong + " --compare " + first, 2, "",
                 "document_road: " + wrong + ": line 1, column 2: the JSON is incomplete\n"},
             Row{"none", first + " --compare " + first + "x", 2, "",
                 "document_road: " + first + "x: there is no such file\n"},
             Row{"a page over it", first + " --compare " + second + " --report " + second, 2, "",
                 "document_road: " + second + " is the document itself\n"},
         }) {
        SCOPED_TRACE(row.what);
        Outcome const outcome = run(row.arguments);
        EXPECT_EQ(outcome.status, row.status);
        EXPECT_EQ(outcome.output, row.output);
        EXPECT_EQ(outcome.errors, row.errors);
    }
    EXPECT_EQ(
        run(first + " --compare " + second + " --report " + (folder / "page.html").string()).status,
        1);
    std::string const page = contentsOf(folder / "page.html");
    for (char const* part :
         {"<g class=\"patch changed\"", "<g class=\"patch added\"", "<g class=\"patch removed\"",
          "<a href=\"#patch-3\">patch 3 from patch 1</a>", "id=\"patch-3\"", "id=\"changes\""}) {
        EXPECT_NE(page.find(part), std::string::npos) << part;
    }
    // A page without animation, plots and attributes.
    for (char const* part : {"id=\"animation\"", "id=\"outputs\"", "id=\"attributes\"", "{{"}) {
        EXPECT_EQ(page.find(part), std::string::npos) << part;
    }
}
