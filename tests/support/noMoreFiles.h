// SPDX-License-Identifier: BSL-1.0
/// A process that can open no further file (POSIX).
#pragma once

#include <gtest/gtest.h>

#include <sys/resource.h>

namespace Mz::Test {

/// While it lives, opening a file fails with `EMFILE`. What is open stays open.
class NoMoreFiles {
  public:
    NoMoreFiles() {
        EXPECT_EQ(::getrlimit(RLIMIT_NOFILE, &before), 0);
        const rlimit none{0, before.rlim_max};
        EXPECT_EQ(::setrlimit(RLIMIT_NOFILE, &none), 0);
    }
    ~NoMoreFiles() { EXPECT_EQ(::setrlimit(RLIMIT_NOFILE, &before), 0); }
    NoMoreFiles(const NoMoreFiles&) = delete;
    NoMoreFiles& operator=(const NoMoreFiles&) = delete;

  private:
    rlimit before{};
};

} // namespace Mz::Test
