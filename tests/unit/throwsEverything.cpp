// SPDX-License-Identifier: BSL-1.0
// A library that throws each exception class by number.
#include "tests/unit/throwsEverything.h"

#include "components/base/assertions.h"
#include "components/componentManager/exceptions.h"

using namespace Mz;

namespace {

constexpr const char* source = "components/foreign/thrower";
constexpr int line = 17;

[[noreturn]] void throwSecondHalf(int which) {
    switch (which) {
    case 6: throw QrStreamEx::ExWrite(source, line);
    case 7: throw QrStreamEx::ExWriteError(source, line);
    case 8: throw QrStreamEx::ExWriteObject(source, line);
    case 9: throw QrStreamEx::ExWriteObjectImp(source, line);
    case 10: throw QrStreamEx::ExWriteOpen(source, line);
    case 11: throw QrComponentManagerEx::ExBadCast(source, line);
    default: throw Assertions::ExProgramAborted(source, line);
    }
}

} // namespace

extern "C" MZ_EXPORT void throwException(int which) {
    switch (which) {
    case 0: throw QrStreamEx::ExBadSwapSize(source, line);
    case 1: throw QrStreamEx::ExRead(source, line);
    case 2: throw QrStreamEx::ExReadError(source, line, "foreign");
    case 3: throw QrStreamEx::ExReadObject(source, line);
    case 4: throw QrStreamEx::ExReadObjectImp(source, line);
    case 5: throw QrStreamEx::ExReadOpen(source, line);
    default: throwSecondHalf(which);
    }
}
