// tests/support/death.h: the whole of what a program says when an assertion ends it.

#ifndef TARN_TESTS_SUPPORT_DEATH_H
#define TARN_TESTS_SUPPORT_DEATH_H

#include <string>

namespace tests {

/// The pattern of that output, out of patterns. An emulator of another machine adds a line of its
/// own.
inline std::string failedAssertion(std::string const& condition, std::string const& function,
                                   std::string const& module, std::string const& line = "[0-9]+") {
    return "^Assertion failed: \\(" + condition + "\\), function " + function + ", file " + module +
           ", line " + line + "\\.\n(qemu: uncaught target signal [^\n]*\n)?$";
}

}  // namespace tests

#endif
