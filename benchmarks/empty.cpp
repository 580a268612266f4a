// SPDX-License-Identifier: BSL-1.0
// Does nothing in a new process, with the libraries that the child process of a scan needs.
#include "components/componentManager/componentImp.h"

int main() {
    return Mz::QrGetComponentManager() ? 0 : 1;
}
