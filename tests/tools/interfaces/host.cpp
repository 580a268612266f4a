// SPDX-License-Identifier: BSL-1.0
/// The program of a host that uses the original interface. It exports nothing.
#include "tests/tools/interfaces/edited.h"

int main() {}
