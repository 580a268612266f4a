/// Export and import markers of the shared libraries, and a hook for the moment at which a library
/// is unloaded. This header and the platform layer are the only places that know the object format.
///
/// Everything is compiled with hidden visibility. Each library has an `export.h` with a macro for
/// its public names (`MZ_BASE_API`, `MZ_COMPONENT_MANAGER_API`, ...), which exports while that
/// library is compiled and imports elsewhere. `MZ_EXPORT` always exports: the entry point of a
/// component library needs it.
#pragma once

/// `MZ_AT_UNLOAD(function);`, at namespace scope, has `void function()` called when the library
/// that contains it is unloaded, after the destructors of all static objects of that library.
///
/// When the process ends, static objects of the program may be destroyed after those of a library
/// that it loaded. On Linux `function` is called after both.
#ifdef _WIN32
#define MZ_EXPORT __declspec(dllexport)
#define MZ_IMPORT __declspec(dllimport)
#define MZ_SHARED_TYPE
/// A library's static objects are destroyed when it is unloaded, in reverse order of their
/// construction, and this one is made first. Destructor functions run before them here.
#define MZ_AT_UNLOAD(function)                                                                     \
    namespace {                                                                                    \
    struct function##Watch {                                                                       \
        ~function##Watch() { function(); }                                                         \
    };                                                                                             \
    __attribute__((init_priority(101))) function##Watch function##AtUnload;                        \
    }                                                                                              \
    static_assert(true)
#else
#define MZ_EXPORT __attribute__((visibility("default")))
#define MZ_IMPORT __attribute__((visibility("default")))
/// For class templates whose instances cross library borders: their type information must be one
/// and the same everywhere.
#define MZ_SHARED_TYPE __attribute__((visibility("default")))
/// A destructor function that the compiler adds destroys the static objects of a library that is
/// unloaded. It has no priority; functions with one run after it. When the process ends, the static
/// objects of all libraries are destroyed before any destructor function runs.
#define MZ_AT_UNLOAD(function)                                                                     \
    __attribute__((destructor(101))) static void function##AtUnload() {                            \
        function();                                                                                \
    }                                                                                              \
    static_assert(true)
#endif

#ifdef MZ_BUILDING_BASE
#define MZ_BASE_API MZ_EXPORT
#else
#define MZ_BASE_API MZ_IMPORT
#endif
