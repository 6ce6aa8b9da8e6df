// tests/support/stack.h: runs work on a stack of a known size.

#ifndef TARN_TESTS_SUPPORT_STACK_H
#define TARN_TESTS_SUPPORT_STACK_H

#include <gtest/gtest.h>

#if !defined(__EMSCRIPTEN__)
#include <pthread.h>
#endif

#include <cstddef>
#include <functional>

#if defined(__has_feature)
#if __has_feature(address_sanitizer)
#define __SANITIZE_ADDRESS__ 1
#endif
#if __has_feature(thread_sanitizer)
#define __SANITIZE_THREAD__ 1
#endif
#endif

namespace tests {

/// Runs `work` on a thread with this many bytes of stack.
#if defined(__EMSCRIPTEN__)
/// Without threads: on the program's stack, whose size is set when linking.
inline void onStackOf(std::size_t, std::function<void()> work) { work(); }
#else
inline void onStackOf(std::size_t bytes, std::function<void()> work) {
    pthread_attr_t attributes;
    ASSERT_EQ(pthread_attr_init(&attributes), 0);
    ASSERT_EQ(pthread_attr_setstacksize(&attributes, bytes), 0);
    pthread_t thread;
    auto const run = [](void* argument) -> void* {
        (*static_cast<std::function<void()>*>(argument))();
        return nullptr;
    };
    ASSERT_EQ(pthread_create(&thread, &attributes, run, &work), 0);
    ASSERT_EQ(pthread_join(thread, nullptr), 0);
    pthread_attr_destroy(&attributes);
}
#endif

/// How deep graphs and layers may nest, and the stack for it. AddressSanitizer puts red zones
/// around variables and needs a multiple of it. ThreadSanitizer supports 65,536 nested calls. A
/// browser's engine has its own stack of about 1 MiB, which cannot be changed.
#if defined(__EMSCRIPTEN__)
constexpr std::size_t kDeepest = 1000;
constexpr std::size_t kStack = 8 * 1024 * 1024;
#elif defined(__SANITIZE_ADDRESS__)
constexpr std::size_t kDeepest = 10000;
constexpr std::size_t kStack = 64 * 1024 * 1024;
#elif defined(__SANITIZE_THREAD__)
constexpr std::size_t kDeepest = 1000;
constexpr std::size_t kStack = 8 * 1024 * 1024;
#else
constexpr std::size_t kDeepest = 10000;
constexpr std::size_t kStack = 8 * 1024 * 1024;
#endif

}  // namespace tests

#endif
