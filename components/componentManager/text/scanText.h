// SPDX-License-Identifier: BSL-1.0
/// The scanner of the wide `scanf` formats, equal on every platform and in every locale.
#pragma once

#include <cstdarg>

namespace Mz {

class QrBufferedIO;

/// Reads values from `io` in `format` and stores them through `arguments`, in the "C" locale, as
/// `QrStream::formattedRead` documents. Exceptions of `io` pass through.
///
/// \return the number of arguments assigned
int scanText(QrBufferedIO& io, const wchar_t* format, std::va_list& arguments);

} // namespace Mz
