/// How symbols enter and leave the shared libraries: the one header outside the platform layer
/// that has to know the object format.
///
/// Everything is compiled with hidden visibility; what a library offers is marked with its own
/// macro (`MZ_BASE_API`, `MZ_COMPONENT_MANAGER_API`), which exports while that library itself is
/// built and imports for everybody else. `MZ_EXPORT` marks what a library always exports: the entry
/// point of a component library.
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

#ifdef MZ_BUILDING_COMPONENT_MANAGER
#define MZ_COMPONENT_MANAGER_API MZ_EXPORT
#else
#define MZ_COMPONENT_MANAGER_API MZ_IMPORT
#endif
