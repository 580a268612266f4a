// SPDX-License-Identifier: BSL-1.0
/// The stamp of a library for another version of libMZcomponentManager. Whatever else the library
/// does is in another source.
#include "components/componentKit/stamp.h"

MZ_LIBRARY_INTERFACES;
extern "C" MZ_EXPORT const Mz::ComponentStamp MzComponentStamp;
__attribute__((used)) constexpr Mz::ComponentStamp MzComponentStamp = [] {
    Mz::ComponentStamp stamp MZ_STAMP_VALUE;
    ++stamp.soVersion;
    return stamp;
}();
