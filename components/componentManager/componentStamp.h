// SPDX-License-Identifier: BSL-1.0
/// The stamp of a component library: a constant in its file that names the ABI for which it was
/// built. `stamp.h` of the kit exports it; the tools read it without loading the library.
///
/// A component and its host exchange objects of C++. They need the same binary compatibility number
/// (SOVERSION) of this library, the same C++ ABI, and the same layout of the standard library's
/// classes. The stamp shows a mismatch before code of the library runs.
///
/// \since 0.2
#pragma once

#include "components/componentManager/version.h"

#include <cstdint>
#include <type_traits>
#include <version>

namespace Mz {

/// The rules by which a compiler lays out classes and names symbols.
enum class CxxAbi : std::uint8_t {
    unknown,
    itanium,   ///< GCC and Clang, MinGW-w64 included
    microsoft, ///< MSVC
};

/// The standard library, as far as the layout of `std::string` and `std::wstring` depends on it.
enum class StringAbi : std::uint8_t {
    unknown,
    libstdcxx,    ///< libstdc++ with `_GLIBCXX_USE_CXX11_ABI=1`, the default
    libstdcxxOld, ///< libstdc++ with `_GLIBCXX_USE_CXX11_ABI=0`
    libcxx,       ///< libc++ with its stable ABI
    libcxxNext,   ///< libc++ with `_LIBCPP_ABI_VERSION` 2 or higher
};

/// The stamp. It has no pointers and no padding, and its numbers are little-endian, as on all
/// supported processors.
///
/// A new field is added at the end, and `layout` stays. `layout` grows only when an existing field
/// changes its meaning. The tools judge a library whose `layout` they do not know like a library
/// without a stamp.
struct ComponentStamp {
    char magic[8];               ///< "MZstamp" and NUL
    std::uint16_t layout;        ///< 1
    std::uint16_t size;          ///< size of the stamp in bytes
    std::uint32_t soVersion;     ///< `MZ_SOVERSION`: must be the same
    std::uint16_t version[3];    ///< major, minor, patch; for people: a difference does not matter
    CxxAbi cxxAbi;               ///< must be the same
    StringAbi stringAbi;         ///< must be the same
    std::uint8_t containerDebug; ///< 1 if the standard library's debug mode changes the layout of
                                 ///< containers (`_GLIBCXX_DEBUG`), else 0: must be the same
    std::uint8_t wideCharSize;   ///< `sizeof(wchar_t)`: must be the same
    std::uint8_t reserved[2];    ///< 0
};
static_assert(sizeof(ComponentStamp) == 28 && std::is_trivially_copyable_v<ComponentStamp>);

/// The ABI for which this translation unit is compiled. A macro, so that translation units with
/// different options do not define one constant differently.
#ifdef __GXX_ABI_VERSION
#define MZ_CXX_ABI Mz::CxxAbi::itanium
#elif defined(_MSVC_LANG)
#define MZ_CXX_ABI Mz::CxxAbi::microsoft
#else
#define MZ_CXX_ABI Mz::CxxAbi::unknown
#endif

/// \def MZ_STRING_ABI
/// The strings with which this is compiled, a `StringAbi`.
#if defined(_LIBCPP_ABI_VERSION) && _LIBCPP_ABI_VERSION > 1
#define MZ_STRING_ABI Mz::StringAbi::libcxxNext
#elif defined(_LIBCPP_VERSION)
#define MZ_STRING_ABI Mz::StringAbi::libcxx
#elif defined(_GLIBCXX_USE_CXX11_ABI) && _GLIBCXX_USE_CXX11_ABI
#define MZ_STRING_ABI Mz::StringAbi::libstdcxx
#elif defined(__GLIBCXX__)
#define MZ_STRING_ABI Mz::StringAbi::libstdcxxOld
#else
#define MZ_STRING_ABI Mz::StringAbi::unknown
#endif

/// `_GLIBCXX_ASSERTIONS` and libc++'s hardening only add checks.
#if defined(_GLIBCXX_DEBUG) || defined(_LIBCPP_ENABLE_DEBUG_MODE)
#define MZ_CONTAINER_DEBUG 1
#else
#define MZ_CONTAINER_DEBUG 0
#endif

/// The value of the stamp, for an object of type `ComponentStamp`.
#define MZ_STAMP_VALUE                                                                             \
    {                                                                                              \
        "MZstamp", 1, sizeof(Mz::ComponentStamp), MZ_SOVERSION,                                    \
            {MZ_VERSION_MAJOR, MZ_VERSION_MINOR, MZ_VERSION_PATCH}, MZ_CXX_ABI, MZ_STRING_ABI,     \
            MZ_CONTAINER_DEBUG, sizeof(wchar_t), {}                                                \
    }

} // namespace Mz
