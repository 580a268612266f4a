// SPDX-License-Identifier: BSL-1.0
/// The export macro of libMZcomponentManager.
#pragma once

#include "components/base/export.h"

#ifdef MZ_BUILDING_COMPONENT_MANAGER
#define MZ_COMPONENT_MANAGER_API MZ_EXPORT
#else
#define MZ_COMPONENT_MANAGER_API MZ_IMPORT
#endif
