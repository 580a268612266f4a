// SPDX-License-Identifier: BSL-1.0
/// A component with one more builder of the family: a policy can keep it from being loaded.
#include "tests/kit/scriptBuilder.h"

using namespace Mz;
using namespace Mz::Test;

MZ_COMPONENT(L"More script importers", L"For the tests of the kit",
             Kit::builder<ScriptBuilder>(
                 Kit::BuilderInfo{.uid = gammaUid, .name = L"script", .label = L"Gamma"}, 'C',
                 L"c"))
