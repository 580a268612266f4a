// SPDX-License-Identifier: BSL-1.0
/// The function that the test host's program exports for its components.
#pragma once

#include "components/base/export.h"

#ifdef MZ_BUILDING_RECORDED_HOST
#define MZ_RECORDED_HOST_API MZ_EXPORT
#else
#define MZ_RECORDED_HOST_API MZ_IMPORT
#endif

extern "C" MZ_RECORDED_HOST_API int mzTestHostNumber();
