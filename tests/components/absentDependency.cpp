/// The library that `missesDependency` cannot find.
#include "components/base/export.h"

extern "C" MZ_EXPORT int absentFunction() {
    return 1;
}
