// SPDX-License-Identifier: BSL-1.0
/// Has a builder with the nil uid.
#include "tests/components/plain.h"

using namespace Mz::Test;

MZ_PLAIN_ENTRY_POINT(PlainDescription, "nameless", {{Mz::QrUid{}, L"nameless"}})
