// SPDX-License-Identifier: BSL-1.0
/// The processor for which this is compiled, as ELF files, the loader and people name it. Libraries
/// for another one cannot be loaded here.
#pragma once

#include <bit>
#include <cstdint>

namespace Mz::platform {

/// The numbers of processors in ELF headers.
inline constexpr std::uint16_t elfS390 = 22, elfX86_64 = 62, elfAArch64 = 183;

#if defined(__aarch64__)
inline constexpr std::uint16_t nativeElfMachine = elfAArch64;
/// What the loader puts in the place of `$PLATFORM`.
inline constexpr const char* loaderPlatform = "aarch64";
/// The folder of Debian's libraries for this processor, below `lib`.
inline constexpr const char* multiarchFolder = "aarch64-linux-gnu";
#elif defined(__s390x__)
inline constexpr std::uint16_t nativeElfMachine = elfS390;
inline constexpr const char* loaderPlatform = "s390x";
inline constexpr const char* multiarchFolder = "s390x-linux-gnu";
#else
inline constexpr std::uint16_t nativeElfMachine = elfX86_64;
inline constexpr const char* loaderPlatform = "x86_64";
inline constexpr const char* multiarchFolder = "x86_64-linux-gnu";
#endif

/// The order of the bytes of numbers in ELF files for this processor: 1 is little-endian.
inline constexpr unsigned char nativeElfOrder = std::endian::native == std::endian::little ? 1 : 2;

/// The size of an entry in tables for `DT_HASH`, which s390x alone has widened.
inline constexpr bool hasWideElfHash = nativeElfMachine == elfS390;

} // namespace Mz::platform
