#include "tests/tools/components/enumerates.h"

#include <cstdlib>

MZ_TEST_ENUMERATES(std::abort())
