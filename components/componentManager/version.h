// SPDX-License-Identifier: BSL-1.0
/// The version of the library, as numbers for the preprocessor.
///
/// The build reads its own version from these lines. While the major number is 0, a new minor
/// version may break source compatibility.
///
/// \since 0.2
#pragma once

/// Grows with an incompatible change.
#define MZ_VERSION_MAJOR 0
/// Grows with what is new.
#define MZ_VERSION_MINOR 2
/// Grows with corrections.
#define MZ_VERSION_PATCH 0

/// The version as one ascending number: 10,000 × major + 100 × minor + patch. Use it in `#if`.
#define MZ_VERSION (MZ_VERSION_MAJOR * 10000 + MZ_VERSION_MINOR * 100 + MZ_VERSION_PATCH)

/// The number of the binary interface: it grows when compiled users no longer work with the
/// library. It is part of the library's name on Linux (`libMZcomponentManager.so.0`), and of the
/// stamp of component libraries (`componentStamp.h`).
#define MZ_SOVERSION 0
