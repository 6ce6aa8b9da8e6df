// tests/support/document_road.h: runs the example program in a folder for each test.

#ifndef TARN_TESTS_SUPPORT_DOCUMENT_ROAD_H
#define TARN_TESTS_SUPPORT_DOCUMENT_ROAD_H

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

#include <sys/wait.h>

namespace tests {

inline std::string contentsOf(std::filesystem::path const& file) {
    std::ifstream stream(file, std::ios::binary);
    return std::string((std::istreambuf_iterator<char>(stream)), {});
}

class DocumentRoad : public testing::Test {
protected:
    struct Outcome {
        int status;
        std::string output;
        std::string errors;
    };

    DocumentRoad() {
        std::string name = testing::TempDir() + "document_road_XXXXXX";
        folder = mkdtemp(name.data());
    }
    ~DocumentRoad() override { std::filesystem::remove_all(folder); }

    std::string write(std::string const& name, std::string const& contents) const {
        std::ofstream(folder / name, std::ios::binary) << contents;
        return (folder / name).string();
    }

    Outcome run(std::string const& arguments) const {
        std::string const command = TARN_DOCUMENT_ROAD " " + arguments + " > " +
                                    (folder / "out").string() + " 2> " + (folder / "err").string();
        int const status = std::system(command.c_str());
        return {WEXITSTATUS(status), contentsOf(folder / "out"), contentsOf(folder / "err")};
    }

    // A document with a root and one child; the arguments are the parts that a test varies.
    static std::string document(std::string const& child, std::string const& connections = "[]") {
        return R"({"root":{"id":1,"children":[)" + child + R"(],"connections":)" + connections +
               "}}";
    }

    std::filesystem::path folder;
};

}  // namespace tests

#endif
