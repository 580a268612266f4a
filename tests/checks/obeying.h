// SPDX-License-Identifier: BSL-1.0
/// What the component `obedient` and the tests that load it share.
#pragma once

#include "components/componentKit/componentTest.h"
#include "components/componentManager/componentImp.h"

namespace Mz::Test {

/// The functions with which the component answers.
struct Orders {
    QrCastable* (*describe)() = nullptr;
    Kit::RunComponentTest* runTest = nullptr;
};

/// The function of the component that takes them, `mzTestObey`.
using Obey = void(const Orders*);

} // namespace Mz::Test
