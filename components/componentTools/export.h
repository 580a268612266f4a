// SPDX-License-Identifier: BSL-1.0
/// The export macro of libMZcomponentTools: `MZ_COMPONENT_TOOLS_API` marks its public names.
#pragma once

#include "components/base/export.h"

#ifdef MZ_BUILDING_COMPONENT_TOOLS
#define MZ_COMPONENT_TOOLS_API MZ_EXPORT
#else
#define MZ_COMPONENT_TOOLS_API MZ_IMPORT
#endif
