// SPDX-License-Identifier: BSL-1.0
/// Finds memory that repeated calls leave behind.
#pragma once

#include <cstddef>
#include <functional>

namespace Mz::Tools {

/// Calls `action` several times `count` times. Returns the bytes that each call leaves behind on
/// average; 0 if there is a round in which the heap does not grow. Caches that fill up once, or
/// that grow ever more rarely, are not growth.
std::size_t growthOf(const std::function<void()>& action, int count);

} // namespace Mz::Tools
