// SPDX-License-Identifier: BSL-1.0
/// Contains the fingerprints of the library's interfaces. They are in one source, because a macro
/// beside each interface would repeat the work in every source that includes its header.
#include "components/componentManager/libraryInterfaces.h"

MZ_LIBRARY_INTERFACES;
