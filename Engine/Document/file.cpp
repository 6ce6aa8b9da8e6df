#include <Engine/Document/document.h>

#include <atomic>
#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <memory>
#include <string>
#include <system_error>
#include <utility>

#if defined(_WIN32)
#include <process.h>
#else
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>
#endif

namespace tarn::engine {

namespace {

namespace fs = std::filesystem;

bool refuse(DocumentError* error, std::string message) {
    if (error != nullptr) *error = DocumentError{std::move(message)};
    return false;
}

std::string reason(char const* what, int number) {
    return std::string(what) + ": " + std::generic_category().message(number);
}

#if defined(_WIN32)
int processNumber() { return ::_getpid(); }
#else
int processNumber() { return ::getpid(); }
#endif

// A file name in the target's folder that no other writer uses, however long the target's name is.
fs::path nameBeside(fs::path const& target) {
    static std::atomic<unsigned> count{0};
    constexpr std::size_t kLongest = 200;
    fs::path name = target.filename();
    if (name.native().size() > kLongest) name = "document";
    auto const now = std::chrono::steady_clock::now().time_since_epoch().count();
    name += "." + std::to_string(processNumber()) + "-" + std::to_string(now) + "-" +
            std::to_string(count++) + ".unfinished";
    return target.parent_path() / name;
}

#if defined(_WIN32)

bool writeBeside(fs::path const& target, fs::path& beside, std::string_view content,
                 std::string& problem) {
    beside = nameBeside(target);
    std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(_wfopen(beside.c_str(), L"wb"),
                                                         &std::fclose);
    bool const isWritten =
        file != nullptr &&
        std::fwrite(content.data(), 1, content.size(), file.get()) == content.size() &&
        std::fclose(file.release()) == 0;
    if (!isWritten) problem = reason("it cannot be written", errno);
    return isWritten;
}

void flushFolder(fs::path const&) {}

#else

class Descriptor {
public:
    explicit Descriptor(int opened) : number(opened) {}
    ~Descriptor() { close(); }
    Descriptor(Descriptor const&) = delete;
    Descriptor& operator=(Descriptor const&) = delete;

    bool isOpen() const { return number >= 0; }
    int get() const { return number; }
    bool close() { return number < 0 || ::close(std::exchange(number, -1)) == 0; }

private:
    int number;
};

bool writeAll(int file, std::string_view content) {
    while (!content.empty()) {
        ssize_t const written = ::write(file, content.data(), content.size());
        if (written < 0 && errno == EINTR) continue;
        if (written < 0) return false;
        content.remove_prefix(static_cast<std::size_t>(written));
    }
    return true;
}

// Copies the permissions and, as far as this user may, the owner of the file that is replaced.
bool copyPermissions(int file, struct stat const& old) {
    if (::fchown(file, old.st_uid, old.st_gid) != 0 && ::fchown(file, uid_t(-1), old.st_gid) != 0) {
        errno = 0;  // Only the permissions matter.
    }
    return ::fchmod(file, old.st_mode & 07777) == 0;
}

bool writeBeside(fs::path const& target, fs::path& beside, std::string_view content,
                 std::string& problem) {
    struct stat old = {};
    bool const replaces = ::stat(target.c_str(), &old) == 0;
    // Until the permissions are set, nobody else may read the content. A new file gets the
    // process's default permissions.
    mode_t const mode = replaces ? 0600 : 0666;
    fs::path name = nameBeside(target);
    Descriptor file(::open(name.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, mode));
    if (!file.isOpen()) {
        problem = reason("no file can be created next to it", errno);
        return false;
    }
    beside = std::move(name);
    bool const isWritten = writeAll(file.get(), content) &&
                           (!replaces || copyPermissions(file.get(), old)) &&
                           ::fsync(file.get()) == 0 && file.close();
    if (!isWritten) problem = reason("it cannot be written", errno);
    return isWritten;
}

// Makes the rename durable. Some file systems do not support this.
void flushFolder(fs::path const& target) {
    fs::path const folder = target.parent_path();
    Descriptor const opened(::open(folder.empty() ? "." : folder.c_str(), O_RDONLY | O_CLOEXEC));
    if (opened.isOpen()) ::fsync(opened.get());
}

#endif

}  // namespace

bool replaceFile(std::string const& fileName, std::string_view content, DocumentError* error) {
    std::error_code failed;
    fs::path target = fs::weakly_canonical(fileName, failed);
    if (failed) target = fileName;
    if (fs::is_symlink(target, failed)) {
        return refuse(error, "it is a dangling symbolic link");
    }
    if (fs::exists(target, failed) && !fs::is_regular_file(target, failed)) {
        return refuse(error, "it is not a file that can be replaced");
    }
    fs::path beside;
    std::string problem;
    if (!writeBeside(target, beside, content, problem)) {
        if (!beside.empty()) fs::remove(beside, failed);
        return refuse(error, std::move(problem));
    }
    fs::rename(beside, target, failed);
    if (failed) {
        std::error_code ignored;
        fs::remove(beside, ignored);
        return refuse(error, "it cannot be replaced: " + failed.message());
    }
    flushFolder(target);
    return true;
}

bool saveDocument(std::string const& fileName, Patch const& root, double framesPerSecond,
                  DocumentError* error) {
    return replaceFile(fileName, writeDocument(root, framesPerSecond), error);
}

Optional<Patch> loadDocument(std::string const& fileName, DocumentError* error,
                             DocumentInfo* info) {
    std::error_code failed;
    char const* problem = nullptr;
    if (!fs::exists(fileName, failed)) {
        problem = "there is no such file";
    } else if (fs::is_directory(fileName, failed)) {
        problem = "it is a folder";
    }
    if (problem != nullptr) {
        refuse(error, problem);
        return std::nullopt;
    }
    std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(std::fopen(fileName.c_str(), "rb"),
                                                         &std::fclose);
    if (file == nullptr) {
        refuse(error, reason("it cannot be opened", errno));
        return std::nullopt;
    }
    std::string text;
    std::uintmax_t const size = fs::file_size(fileName, failed);  // A pipe has no size.
    if (!failed) text.reserve(static_cast<std::size_t>(size));
    char buffer[1 << 16];
    while (std::size_t const count = std::fread(buffer, 1, sizeof buffer, file.get())) {
        text.append(buffer, count);
    }
    if (std::ferror(file.get()) != 0) {
        refuse(error, reason("it cannot be read", errno));
        return std::nullopt;
    }
    return readDocument(text, error, info);
}

}  // namespace tarn::engine
