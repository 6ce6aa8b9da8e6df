// The HTML report and the picture that the example program writes.

#include "support/document_road.h"

#include <cstdlib>
#include <filesystem>
#include <string>
#include <vector>

namespace {

using tests::contentsOf;

class DocumentRoadPage : public tests::DocumentRoad {};

std::string const kDocuments = TARN_DOCUMENTS_DIR "/";

}  // namespace

TEST_F(DocumentRoadPage, WritesASelfContainedPage) {
    struct Row {
        char const* arguments;
        // The parts of the document that the page shows.
        std::vector<std::string> shown;
    };
    for (Row const& row : {
             Row{"animation.json",
                 {"<h1>bouncing badge</h1>", "<p>read a document: 40 patches in 3 levels, ",
                  "id=\"level-1\"", "id=\"level-19\" hidden",
                  "data-parts=\"[&quot;input speed&quot;,&quot;Number [type: float] from 0.1 to "
                  "4, default 1&quot;,&quot;port 201, tag 1&quot;,&quot;ui: "
                  "{\\&quot;slider\\&quot;: 1, \\&quot;steps\\&quot;: [0.1, 1, "
                  "4]}&quot;,&quot;unit: "
                  "\\&quot;times\\&quot;&quot;]\"",
                  "The document&#39;s own ports, 9", "<li>output radius; Number",
                  "outline <span class=\"type\">Path</span>",
                  "dots <span class=\"type\">Positions</span>", "<span>3 in the loop</span>",
                  "Exponential In-Out", "<li>curveTo 20 11.0457, 11.0457 20, 0 20</li>",
                  "motion (patch 2), speed (port 201) {2}", "max=\"119\""}},
             Row{"small.json", {"id=\"outputs\"", "aria-valuemax=\"119\""}},
             Row{"node_graph.json", {"left out"}},
         }) {
        SCOPED_TRACE(row.arguments);
        std::string const file = (folder / "report.html").string();
        Outcome const outcome = run(kDocuments + row.arguments + " --frames 0 --report " + file);
        EXPECT_EQ(outcome.status, 0);
        EXPECT_EQ(outcome.errors.empty(), row.arguments[0] != 'n');
        EXPECT_NE(outcome.output.find("\nreport: " + file + "\n"), std::string::npos);
        std::string const page = contentsOf(file);
        EXPECT_LT(page.size(), 2000000u);
        EXPECT_EQ(page.substr(0, 15), "<!DOCTYPE html>");
        EXPECT_EQ(page.substr(page.size() - 8), "</html>\n");
        for (std::string const& text : row.shown) {
            EXPECT_NE(page.find(text), std::string::npos) << text;
        }
        for (char const* other : {" src=", "url(", "@import", "href=\"http", "{{", "}}\n"}) {
            EXPECT_EQ(page.find(other), std::string::npos) << other;
        }
        bool const draws =
            run(kDocuments + row.arguments + " --frames 120 --paths").output.find(": M ") !=
            std::string::npos;
        EXPECT_EQ(page.find("id=\"animation\"") != std::string::npos, draws);
        EXPECT_EQ(page.find("href=\"#animation\"") != std::string::npos, draws);
    }
}

TEST_F(DocumentRoadPage, EscapesNamesInThePage) {
    std::string const name = R"(</script><img src=x>\"&'{{TITLE}})";
    std::string const file =
        write("names.json", document(R"({"id":2,"kind":"text","name":")" + name +
                                     R"(","inputs":[{"id":3,"type":"string","default":")" + name +
                                     R"(","name":")" + name +
                                     R"("}],"outputs":[{"id":4,"type":"string","name":")" + name +
                                     R"("}],"attributes":{")" + name + R"(":")" + name + R"("}})"));
    Outcome const outcome = run(file + " --report " + (folder / "report.html").string());
    EXPECT_EQ(outcome.status, 0);
    std::string const page = contentsOf(folder / "report.html");
    EXPECT_EQ(page.find("<img"), std::string::npos);
    EXPECT_NE(page.find("&lt;/script&gt;&lt;img src=x&gt;&quot;&amp;&#39;{{TITLE}}"),
              std::string::npos);
    EXPECT_NE(page.find("\\u003c/script>"), std::string::npos);
}

TEST_F(DocumentRoadPage, WritesAPageForEveryRootThatHasAtMostOnePatch) {
    for (char const* contents :
         {R"({"root":{"id":1}})", R"({"root":{"id":1,"children":[{"id":2}]}})",
          R"({"root":{"id":1,"outputs":[{"id":2,"type":"float"}]}})"}) {
        SCOPED_TRACE(contents);
        std::string const file = (folder / "report.html").string();
        Outcome const outcome = run(write("root.json", contents) + " --report " + file);
        EXPECT_EQ(outcome.status, 0);
        EXPECT_EQ(outcome.errors, "");
        EXPECT_NE(contentsOf(file).find("</html>"), std::string::npos);
    }
}

TEST_F(DocumentRoadPage, ReportsWhyAPageOrPictureCannotBeWritten) {
    std::string const nowhere = (folder / "nowhere" / "file").string();
    for (char const* option : {" --report ", " --picture "}) {
        SCOPED_TRACE(option);
        Outcome const outcome = run(kDocuments + "small.json" + option + nowhere);
        EXPECT_EQ(outcome.status, 1);
        EXPECT_EQ(outcome.output, "");
        std::string const begin = "document_road: " + nowhere + " cannot be written: ";
        EXPECT_EQ(outcome.errors.substr(0, begin.size()), begin);
    }
    std::string const file = write("report.html", "as it was");
    std::string const path = std::getenv("PATH");
    ASSERT_EQ(setenv("PATH", folder.c_str(), 1), 0);
    Outcome const outcome = run(kDocuments + "small.json --report " + file);
    ASSERT_EQ(setenv("PATH", path.c_str(), 1), 0);
    EXPECT_EQ(outcome.status, 1);
    EXPECT_EQ(outcome.errors, "document_road: dot (Graphviz) cannot be run; is it installed?\n");
    EXPECT_EQ(contentsOf(file), "as it was");
}

TEST_F(DocumentRoadPage, WritesToDevicesAndNeverOverwritesTheDocument) {
    std::string const contents = document(R"({"id":2})");
    std::string const file = write("document.json", contents);
    for (char const* option : {" --report ", " --picture "}) {
        SCOPED_TRACE(option);
        Outcome const outcome = run(file + option + file);
        EXPECT_EQ(outcome.status, 1);
        EXPECT_EQ(outcome.errors, "document_road: " + file + " is the document itself\n");
        EXPECT_EQ(contentsOf(file), contents);
    }
    std::string const link = (folder / "link.html").string();
    std::filesystem::create_symlink(write("page.html", "old"), link);
    EXPECT_EQ(run(file + " --report " + link).status, 0);
    EXPECT_TRUE(std::filesystem::is_symlink(link));
    EXPECT_NE(contentsOf(folder / "page.html").find("</html>"), std::string::npos);
    EXPECT_EQ(run(file + " --report /dev/stdout --frames 0 | tail -c 400 | grep -q html").status,
              0);
}

TEST_F(DocumentRoadPage, LimitsTheSizeOfAPage) {
    // A loop of a thousand moving circles.
    std::string const file = write("loop.json", R"({"framesPerSecond":60,"root":{"id":1,
        "outputs":[{"id":2,"type":"path","name":"dots"}],"children":[
        {"id":3,"kind":"loop","inputs":[{"id":31,"type":"int","default":1000}],
         "outputs":[{"id":32,"type":"int"}]},
        {"id":4,"kind":"time","outputs":[{"id":41,"type":"float"}]},
        {"id":5,"kind":"compose","inputs":[{"id":51,"type":"float"},{"id":52,"type":"float"}],
         "outputs":[{"id":53,"type":"vec2"}]},
        {"id":6,"kind":"circle","inputs":[{"id":61,"type":"vec2"},
         {"id":62,"type":"float","default":5}],"outputs":[{"id":63,"type":"path"}]},
        {"id":7,"kind":"output","inputs":[{"id":71,"type":"path"}]}],
        "connections":[{"from":[3,32],"to":[5,51]},{"from":[4,41],"to":[5,52]},
        {"from":[5,53],"to":[6,61]},{"from":[6,63],"to":[7,71]}]}})");
    std::string const page = (folder / "page.html").string();
    Outcome const outcome = run(file + " --frames 0 --report-frames 10000 --report " + page);
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.errors, "");
    EXPECT_LT(std::filesystem::file_size(page), 60000000u);
    EXPECT_NE(contentsOf(page).find(" of 10000 frames: more would be too large, or take too long."),
              std::string::npos);
}
