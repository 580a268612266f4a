// SPDX-License-Identifier: BSL-1.0
/// Has the builder of a class of stored objects that another library makes, too.
#include "tests/checks/sound/crate.h"

using namespace Mz;
using namespace Mz::Test;

MZ_COMPONENT(L"Crates", L"The builder of crates",
             Kit::builderOf<Crate>({.uid = Crate::classUid, .name = L"crate"}))
