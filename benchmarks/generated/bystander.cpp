// SPDX-License-Identifier: BSL-1.0
/// An ordinary shared library without the entry point. It exports other functions and lies in a
/// folder of candidates.
#include "components/base/export.h"

#include <string>

#define MZ_BYSTANDER_FUNCTION(name)                                                                \
    extern "C" MZ_EXPORT const char* name() {                                                      \
        static const std::string text = std::string("bystander ") + #name;                         \
        return text.c_str();                                                                       \
    }

MZ_BYSTANDER_FUNCTION(bystanderOpen)
MZ_BYSTANDER_FUNCTION(bystanderClose)
MZ_BYSTANDER_FUNCTION(bystanderRead)
MZ_BYSTANDER_FUNCTION(bystanderWrite)
MZ_BYSTANDER_FUNCTION(bystanderSeek)
MZ_BYSTANDER_FUNCTION(bystanderTell)
MZ_BYSTANDER_FUNCTION(bystanderFlush)
MZ_BYSTANDER_FUNCTION(bystanderStatus)
MZ_BYSTANDER_FUNCTION(bystanderVersion)
MZ_BYSTANDER_FUNCTION(bystanderCreate)
MZ_BYSTANDER_FUNCTION(bystanderDestroy)
MZ_BYSTANDER_FUNCTION(bystanderCopy)
MZ_BYSTANDER_FUNCTION(bystanderCompare)
MZ_BYSTANDER_FUNCTION(bystanderFind)
MZ_BYSTANDER_FUNCTION(bystanderInsert)
MZ_BYSTANDER_FUNCTION(bystanderErase)
