// SPDX-License-Identifier: BSL-1.0
/// Export and import macros of the shared libraries, and a hook that runs at unload. Apart from the
/// platform layer, only this header depends on the object file format.
///
/// Everything is compiled with hidden visibility. Each library has an `export.h` with a macro for
/// its public names (`MZ_BASE_API`, `MZ_COMPONENT_MANAGER_API`, ...). The macro exports while that
/// library is compiled, and imports elsewhere. `MZ_EXPORT` always exports; the entry point of a
/// component library needs it.
#pragma once

#if __cplusplus <= 201703L
#error "libMZcomponentManager needs C++20: compile with -std=c++20 or later"
#endif

/// Registers a function that runs at unload: `MZ_AT_UNLOAD(function);`, at namespace scope.
/// `void function()` runs when its library is unloaded, after the destructors of all static objects
/// of that library.
///
/// When the process ends, static objects of the program may be destroyed after those of a library
/// that it loaded. On Linux `function` runs after both. Since 0.2.

/// \def MZ_INTERFACE_TABLE
/// Places the constant with this name in a section for `MZ_INTERFACE`, though no code uses it. The
/// linker discards equal constants of several sources with their sections, so each constant needs a
/// separate section. The line distinguishes constants of the same name.
#ifdef _WIN32
#define MZ_EXPORT __declspec(dllexport)
#define MZ_IMPORT __declspec(dllimport)
#define MZ_SHARED_TYPE
/// The static objects of a library are destroyed at unload, in reverse order of construction. This
/// hook has the first priority, so it is constructed first and destroyed last. A destructor
/// function is no alternative here: it runs before the static objects are destroyed.
#define MZ_AT_UNLOAD(function)                                                                     \
    namespace {                                                                                    \
    struct function##UnloadHook {                                                                  \
        ~function##UnloadHook() { function(); }                                                    \
    };                                                                                             \
    __attribute__((init_priority(101))) function##UnloadHook function##AtUnload;                   \
    }                                                                                              \
    static_assert(true)
/// The linker joins the sections whose names are equal before the '$'.
#define MZ_INTERFACE_TABLE(name, line) __attribute__((used, section("mziface$" #name "." #line)))
#else
/// Exports a name from any library.
#define MZ_EXPORT __attribute__((visibility("default")))
#define MZ_IMPORT __attribute__((visibility("default")))
/// Marks class templates whose instances cross library boundaries: their type information must be
/// the same in every library.
#define MZ_SHARED_TYPE __attribute__((visibility("default")))
/// At unload, a destructor function that the compiler adds destroys the static objects of the
/// library. It has no priority; destructor functions with a priority run after it. When the process
/// ends, the static objects of all libraries are destroyed before any destructor function runs.
#define MZ_AT_UNLOAD(function)                                                                     \
    __attribute__((destructor(101))) static void function##AtUnload() {                            \
        function();                                                                                \
    }                                                                                              \
    static_assert(true)
/// `retain` protects it from `--gc-sections`.
#if __has_attribute(retain)
#define MZ_INTERFACE_TABLE(name, line)                                                             \
    __attribute__((used, retain, visibility("hidden"), section("mziface." #name "." #line)))
#else
#define MZ_INTERFACE_TABLE(name, line)                                                             \
    __attribute__((used, visibility("hidden"), section("mziface." #name "." #line)))
#endif
#endif

#ifdef MZ_BUILDING_BASE
#define MZ_BASE_API MZ_EXPORT
#else
#define MZ_BASE_API MZ_IMPORT
#endif
