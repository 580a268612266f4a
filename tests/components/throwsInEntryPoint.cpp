#include "components/componentManager/componentImp.h"

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {
    throw 42;
}
