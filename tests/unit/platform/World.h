#pragma once

#include <gtest/gtest.h>

#include <functional>

namespace vexa::test {

/// Runs a test's body where the implementation under test wants it: on the test's own thread with a clock
/// that stands still, or as the first thread of a seeded world. Either way time moves by platform::advance()
/// alone, apart from waits for which nothing else is left to do.
void inWorld(const std::function<void()>& body);

/// A test whose body, which follows, runs there.
#define IN_WORLD(suite, name)               \
    static void suite##name();              \
    TEST(suite, name) {                     \
        ::vexa::test::inWorld(suite##name); \
    }                                       \
    static void suite##name()

}  // namespace vexa::test
