// SPDX-License-Identifier: BSL-1.0
/// Offers a builder whose identity was forgotten.
#include "tests/components/plain.h"

using namespace Mz::Test;

MZ_PLAIN_ENTRY_POINT(PlainDescription, "nameless", {{Mz::QrUid{}, L"nameless"}})
