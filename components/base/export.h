/// Export and import markers of the shared libraries. This header and the platform layer are the
/// only places that know the object format.
///
/// Everything is compiled with hidden visibility. Each library has an `export.h` with a macro for
/// its public names (`MZ_BASE_API`, `MZ_COMPONENT_MANAGER_API`, ...), which exports while that
/// library is compiled and imports elsewhere. `MZ_EXPORT` always exports: the entry point of a
/// component library needs it.
#pragma once

#ifdef _WIN32
#define MZ_EXPORT __declspec(dllexport)
#define MZ_IMPORT __declspec(dllimport)
#define MZ_SHARED_TYPE
#else
#define MZ_EXPORT __attribute__((visibility("default")))
#define MZ_IMPORT __attribute__((visibility("default")))
/// For class templates whose instances cross library borders: their type information must be one
/// and the same everywhere.
#define MZ_SHARED_TYPE __attribute__((visibility("default")))
#endif

#ifdef MZ_BUILDING_BASE
#define MZ_BASE_API MZ_EXPORT
#else
#define MZ_BASE_API MZ_IMPORT
#endif
