/// Export macro for what only the project's own tests reach.
///
/// The shipped library hides these names. The tests link another form of it, made of the same
/// sources with `MZ_EXPORTING_INTERNALS` defined, and define `MZ_IMPORTING_INTERNALS` themselves.
#pragma once

#include "components/base/export.h"

#if defined(MZ_EXPORTING_INTERNALS)
#define MZ_INTERNAL_API MZ_EXPORT
#elif defined(MZ_IMPORTING_INTERNALS)
#define MZ_INTERNAL_API MZ_IMPORT
#else
#define MZ_INTERNAL_API
#endif
