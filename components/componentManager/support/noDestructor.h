/// Process-wide objects that outlive every other.
#pragma once

namespace Mz {

/// Holds a constant-initialised object that is never destroyed: static objects of other libraries
/// may still use it in their destructors, whose order is not defined. What such an object owns must
/// be freed by `MZ_AT_UNLOAD`, or it leaks each time that this library is unloaded.
template <class T>
union NoDestructor {
    constexpr NoDestructor() : value() {}
    ~NoDestructor() {}
    NoDestructor(const NoDestructor&) = delete;
    NoDestructor& operator=(const NoDestructor&) = delete;

    T value;
};

} // namespace Mz
