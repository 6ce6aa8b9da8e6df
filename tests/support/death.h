// tests/support/death.h: tests for assertion failures by their whole message.

#ifndef TARN_TESTS_SUPPORT_DEATH_H
#define TARN_TESTS_SUPPORT_DEATH_H

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <cstddef>
#include <ostream>
#include <string>

/// Expects the statement to end the program with a matching message. Skips the test where a program
/// cannot start itself again.
#if GTEST_HAS_DEATH_TEST
#define EXPECT_ENDS(statement, output) EXPECT_DEATH(statement, output)
#else
#define EXPECT_ENDS(statement, output)                                                             \
    if (static_cast<void>(output), tests::hasNoDeathTests()) {                                     \
        GTEST_SKIP() << "no death tests here";                                                     \
    } else {                                                                                       \
        statement;                                                                                 \
    }
#endif

namespace tests {

// A function and not a constant, so that the compiler does not warn of unreachable code.
inline bool hasNoDeathTests() { return true; }

/// Matches exactly that output. Each platform has its own regular expressions, and an emulator of
/// another machine adds a line.
class FailedAssertion : public testing::MatcherInterface<std::string const&> {
public:
    FailedAssertion(std::string const& condition, std::string const& function,
                    std::string const& module, int line)
        : before("Assertion failed: (" + condition + "), function " + function + ", file " +
                 module + ", line "),
          expectedLine(line) {}

    bool MatchAndExplain(std::string const& output, testing::MatchResultListener*) const override {
        std::string text = output;
        text.erase(std::remove(text.begin(), text.end(), '\r'), text.end());
        if (std::size_t const emulator = text.find("qemu: "); emulator != std::string::npos) {
            text.resize(emulator);
        }
        if (text.compare(0, before.size(), before) != 0) return false;
        std::string const rest = text.substr(before.size());
        auto const digits = rest.find_first_not_of("0123456789");
        return digits != 0 && digits != std::string::npos && rest.substr(digits) == ".\n" &&
               (expectedLine == kAnyLine || rest.substr(0, digits) == std::to_string(expectedLine));
    }
    void DescribeTo(std::ostream* stream) const override {
        *stream << before << (expectedLine == kAnyLine ? "..." : std::to_string(expectedLine))
                << ".";
    }

    static constexpr int kAnyLine = 0;

private:
    std::string before;
    int expectedLine;
};

inline testing::Matcher<std::string const&> failedAssertion(std::string const& condition,
                                                            std::string const& function,
                                                            std::string const& module,
                                                            int line = FailedAssertion::kAnyLine) {
    return testing::MakeMatcher(new FailedAssertion(condition, function, module, line));
}

}  // namespace tests

#endif
