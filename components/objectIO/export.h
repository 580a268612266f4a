// SPDX-License-Identifier: BSL-1.0
/// Export macro of libMZobjectIO.
#pragma once

#include "components/base/export.h"

#ifdef MZ_BUILDING_OBJECT_IO
#define MZ_OBJECT_IO_API MZ_EXPORT
#else
#define MZ_OBJECT_IO_API MZ_IMPORT
#endif
