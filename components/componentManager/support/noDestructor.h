// SPDX-License-Identifier: BSL-1.0
/// A wrapper for process-wide objects that are never destroyed.
#pragma once

namespace Mz {

/// Holds a constant-initialised object that is never destroyed.
///
/// The destructors of static objects of other libraries may use the object; their order is not
/// under control. Free the memory that the object owns by `MZ_AT_UNLOAD`: otherwise it leaks each
/// time that this library is unloaded.
template <class T>
union NoDestructor {
    constexpr NoDestructor() : value() {}
    ~NoDestructor() {}
    NoDestructor(const NoDestructor&) = delete;
    NoDestructor& operator=(const NoDestructor&) = delete;

    T value;
};

} // namespace Mz
