#include "report/graphviz.h"

#include <chrono>
#include <csignal>
#include <cstdio>
#include <memory>
#include <stdexcept>
#include <thread>

#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

constexpr auto kLongestWait = std::chrono::seconds(8);

struct CloseFile {
    void operator()(std::FILE* file) const { std::fclose(file); }
};
using File = std::unique_ptr<std::FILE, CloseFile>;

File temporaryFile() {
    File file(std::tmpfile());
    if (!file) throw std::runtime_error("no temporary file can be made for Graphviz");
    return file;
}

// Waits for the process and kills it after a time limit. Whether it succeeded, or nothing where it
// was killed.
std::optional<bool> outcomeInTime(pid_t child) {
    auto const start = std::chrono::steady_clock::now();
    int status = 0;
    while (waitpid(child, &status, WNOHANG) == 0) {
        if (std::chrono::steady_clock::now() - start > kLongestWait) {
            kill(child, SIGKILL);
            waitpid(child, &status, 0);
            return std::nullopt;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(2));
    }
    return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

}  // namespace

std::optional<std::string> answerOfDot(std::string const& text) {
    File const in = temporaryFile();
    File const out = temporaryFile();
    bool const written = std::fwrite(text.data(), 1, text.size(), in.get()) == text.size() &&
                         std::fflush(in.get()) == 0;
    if (!written) throw std::runtime_error("the graph cannot be written for Graphviz");
    std::rewind(in.get());

    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_adddup2(&actions, fileno(in.get()), STDIN_FILENO);
    posix_spawn_file_actions_adddup2(&actions, fileno(out.get()), STDOUT_FILENO);
    char program[] = "dot";
    char format[] = "-Tplain";
    char* arguments[] = {program, format, nullptr};
    pid_t child = 0;
    int const failed = posix_spawnp(&child, program, &actions, nullptr, arguments, environ);
    posix_spawn_file_actions_destroy(&actions);
    if (failed != 0) throw std::runtime_error("dot (Graphviz) cannot be run; is it installed?");
    std::optional<bool> const succeeded = outcomeInTime(child);
    if (!succeeded) return std::nullopt;
    if (!*succeeded) throw std::runtime_error("dot (Graphviz) failed");

    std::rewind(out.get());
    std::string answer;
    char buffer[65536];
    while (std::size_t const count = std::fread(buffer, 1, sizeof buffer, out.get())) {
        answer.append(buffer, count);
    }
    return answer;
}
