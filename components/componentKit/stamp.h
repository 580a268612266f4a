// SPDX-License-Identifier: BSL-1.0
/// Exports the stamp of a component library: see `componentStamp.h`. `MZ_COMPONENT` contains it. A
/// component library that is written by hand adds it in one of its sources, outside all namespaces:
///
///     MZ_COMPONENT_STAMP;
///
/// \since 0.2
#pragma once

#include "components/base/export.h"
#include "components/componentManager/componentStamp.h"
#include "components/componentManager/libraryInterfaces.h"

/// Defines and exports the stamp of this component library, with the ABI for which this source is
/// compiled, and the fingerprints of the interfaces of libMZcomponentManager. Use it once in a
/// library. A library that lists its exported names (a version script or a .def file) lists
/// `MzComponentStamp`, too.
///
/// The linker keeps it as an exported symbol; `used` keeps it in the compiler, which sees no use.
#define MZ_COMPONENT_STAMP                                                                         \
    MZ_LIBRARY_INTERFACES;                                                                         \
    extern "C" MZ_EXPORT const Mz::ComponentStamp MzComponentStamp;                                \
    __attribute__((used)) constexpr Mz::ComponentStamp MzComponentStamp = MZ_STAMP_VALUE
