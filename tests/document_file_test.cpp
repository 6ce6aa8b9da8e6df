// Saving documents to files: the content of the file after each way in which saving can end.

#include <Engine/Document/document.h>

#include "support/random.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <thread>

#if !defined(_WIN32) && !defined(__EMSCRIPTEN__)
#include <csignal>
#include <sys/mount.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>
#endif

using namespace tarn::engine;
namespace fs = std::filesystem;

namespace {

std::string contentsOf(fs::path const& file) {
    std::ifstream stream(file, std::ios::binary);
    return std::string((std::istreambuf_iterator<char>(stream)), {});
}

class ReplaceFile : public testing::Test {
protected:
    ReplaceFile() {
        static int count = 0;
        folder = fs::path(testing::TempDir()) /
                 ("replace_file_" +
                  std::to_string(std::chrono::steady_clock::now().time_since_epoch().count()) +
                  "_" + std::to_string(++count));
        fs::create_directory(folder);
        file = folder / "document.json";
    }
    ~ReplaceFile() override {
        std::error_code ignored;
        fs::remove_all(folder, ignored);
    }

    std::size_t files() const {
        return static_cast<std::size_t>(
            std::distance(fs::directory_iterator(folder), fs::directory_iterator()));
    }

    fs::path folder;
    fs::path file;
};

}  // namespace

TEST_F(ReplaceFile, CreatesAndReplacesAFile) {
    for (std::string const& content : {std::string("first"), std::string(),
                                       std::string(3000000, 'x'), std::string("\0\r\n", 3)}) {
        DocumentError error;
        ASSERT_TRUE(replaceFile(file.string(), content, &error)) << error.message;
        EXPECT_EQ(contentsOf(file), content);
        EXPECT_EQ(files(), 1u);
    }
}

TEST_F(ReplaceFile, SavesAndLoadsDocuments) {
    Patch root{1, 1};
    root.name = "saved";
    ASSERT_TRUE(saveDocument(file.string(), root, 24.0));
    DocumentInfo info;
    EXPECT_EQ(loadDocument(file.string(), nullptr, &info), root);
    EXPECT_EQ(info.framesPerSecond, 24.0);
    EXPECT_EQ(contentsOf(file), writeDocument(root, 24.0));
}

TEST_F(ReplaceFile, ReportsWhyAFileCannotBeLoaded) {
    DocumentError error;
    EXPECT_FALSE(loadDocument((folder / "none").string(), &error));
    EXPECT_EQ(error.message, "there is no such file");
    EXPECT_FALSE(loadDocument(folder.string(), &error));
    EXPECT_EQ(error.message, "it is a folder");
    EXPECT_FALSE(replaceFile(folder.string(), "x", &error));
    EXPECT_EQ(error.message, "it is not a file that can be replaced");
    EXPECT_FALSE(replaceFile((folder / "none" / "file").string(), "x", &error));
    EXPECT_FALSE(error.message.empty());
    EXPECT_EQ(error.line, 0u);
}

#if !defined(_WIN32) && !defined(__EMSCRIPTEN__)

TEST_F(ReplaceFile, AcceptsTheLongestFileNames) {
    fs::path const longest = folder / std::string(255, 'n');
    EXPECT_TRUE(replaceFile(longest.string(), "x"));
    EXPECT_EQ(contentsOf(longest), "x");
}

TEST_F(ReplaceFile, KeepsPermissionsAndLinks) {
    for (fs::perms const permissions : {fs::perms(0600), fs::perms(0644), fs::perms(0751)}) {
        std::ofstream(file) << "old";
        fs::permissions(file, permissions);
        ASSERT_TRUE(replaceFile(file.string(), "new"));
        EXPECT_EQ(fs::status(file).permissions(), permissions);
    }
    fs::path const link = folder / "link.json";
    fs::create_symlink(file, link);
    ASSERT_TRUE(replaceFile(link.string(), "through the link"));
    EXPECT_TRUE(fs::is_symlink(link));
    EXPECT_EQ(contentsOf(file), "through the link");

    fs::path const nowhere = folder / "nowhere.json";
    fs::create_symlink(folder / "none.json", nowhere);
    EXPECT_FALSE(replaceFile(nowhere.string(), "x"));
    EXPECT_TRUE(fs::is_symlink(nowhere));

    mode_t const mask = ::umask(027);
    ASSERT_TRUE(replaceFile((folder / "new.json").string(), "x"));
    ::umask(mask);
    EXPECT_EQ(fs::status(folder / "new.json").permissions(), fs::perms(0640));
}

TEST_F(ReplaceFile, KeepsTheFileWhenTheFolderIsReadOnly) {
    if (::geteuid() == 0) GTEST_SKIP() << "root may write everywhere";
    std::ofstream(file) << "old";
    fs::permissions(folder, fs::perms(0500));
    DocumentError error;
    EXPECT_FALSE(replaceFile(file.string(), "new", &error));
    fs::permissions(folder, fs::perms(0700));
    EXPECT_EQ(contentsOf(file), "old");
    EXPECT_EQ(files(), 1u);
}

TEST_F(ReplaceFile, KeepsTheFileAtTheSizeLimitOfTheProcess) {
    std::ofstream(file) << "old";
    // In a child process, because the limit is per process.
    pid_t const child = ::fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
        std::signal(SIGXFSZ, SIG_IGN);
        rlimit const limit{1000, 1000};
        ::setrlimit(RLIMIT_FSIZE, &limit);
        DocumentError error;
        bool const isReplaced = replaceFile(file.string(), std::string(100000, 'x'), &error);
        ::_exit(isReplaced || error.message.empty() ? 1 : 0);
    }
    int status = 0;
    ASSERT_EQ(::waitpid(child, &status, 0), child);
    EXPECT_EQ(status, 0);
    EXPECT_EQ(contentsOf(file), "old");
    EXPECT_EQ(files(), 1u);
}

TEST_F(ReplaceFile, KeepsTheFileWhenTheDiskIsFull) {
    fs::path const disk = folder / "disk";
    fs::create_directory(disk);
    if (::mount("tmpfs", disk.c_str(), "tmpfs", 0, "size=256k") != 0) {
        GTEST_SKIP() << "only root can make a small disk";
    }
    std::string const old(100000, 'o');
    std::string const name = (disk / "document.json").string();
    ASSERT_TRUE(replaceFile(name, old));
    DocumentError error;
    EXPECT_FALSE(replaceFile(name, std::string(300000, 'n'), &error));
    EXPECT_FALSE(error.message.empty());
    EXPECT_EQ(contentsOf(name), old);
    EXPECT_EQ(std::distance(fs::directory_iterator(disk), fs::directory_iterator()), 1);
    EXPECT_TRUE(replaceFile(name, "short"));
    EXPECT_EQ(contentsOf(name), "short");
    EXPECT_EQ(::umount(disk.c_str()), 0);
}

TEST_F(ReplaceFile, ShowsReadersTheOldOrTheNewContent) {
    tests::Random random(50);
    constexpr std::size_t kSize = 2000000;
    ASSERT_TRUE(replaceFile(file.string(), std::string(kSize, 'a')));
    for (int i = 0; i < 60; ++i) {
        pid_t const child = ::fork();
        ASSERT_GE(child, 0);
        if (child == 0) {
            for (char c = 'b';; c = c == 'z' ? 'a' : static_cast<char>(c + 1)) {
                replaceFile(file.string(), std::string(kSize, c));
            }
        }
        // The first writer waits here until it has replaced the file.
        while (i == 0 && contentsOf(file)[0] == 'a') std::this_thread::yield();
        std::this_thread::sleep_for(std::chrono::microseconds(random.below(20000)));
        ::kill(child, SIGKILL);
        ASSERT_EQ(::waitpid(child, nullptr, 0), child);
        std::string const content = contentsOf(file);
        ASSERT_EQ(content.size(), kSize);
        ASSERT_EQ(content, std::string(kSize, content[0]));
    }
}

#endif
