// SPDX-License-Identifier: BSL-1.0
/// New uids, and their text for source code.
#pragma once

#include "components/componentManager/uid.h"

#include <string>

namespace Mz::Commands {

/// Returns a new uid: 122 random bits from the system, in the form of a UUID of version 4.
/// \throws std::exception  if the system has no random source
QrUid randomUid();

/// Returns the uid as the literal `"…"_uid` of the kit takes it, without quotes.
std::string literalOf(const QrUid& uid);

/// Returns the uid as a list of four words, `{0x…, 0x…, 0x…, 0x…}`.
std::string wordsOf(const QrUid& uid);

} // namespace Mz::Commands
