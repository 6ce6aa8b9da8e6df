// tests/support/streams.h: output to streams, and its details.

#ifndef TARN_TESTS_SUPPORT_STREAMS_H
#define TARN_TESTS_SUPPORT_STREAMS_H

#include <algorithm>
#include <locale>
#include <sstream>
#include <string>

namespace tests {

/// The output of `what`.
template <class T>
std::string written(T const& what) {
    std::ostringstream stream;
    stream << what;
    return stream.str();
}

/// Counts how often a stream is flushed.
struct FlushCounter : std::stringbuf {
    int flushes = 0;
    int sync() override {
        ++flushes;
        return 0;
    }
};

/// A locale whose newline is "|".
inline std::locale barForNewline() {
    struct Widening : std::ctype<char> {
        char do_widen(char c) const override { return c == '\n' ? '|' : c; }
        char const* do_widen(char const* begin, char const* end, char* to) const override {
            std::replace_copy(begin, end, to, '\n', '|');
            return end;
        }
    };
    return std::locale(std::locale::classic(), new Widening);
}

}  // namespace tests

#endif
