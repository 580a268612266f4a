/// Text read by a format in the manner of the wide `scanf`, alike on every platform and in every
/// locale.
#pragma once

#include <cstdarg>

namespace Mz {

class QrBufferedIO;

/// Reads from `io`, character by character, what `format` describes, stores it through `arguments`
/// and returns how many were assigned. What `QrStream::formattedRead` promises, its locale
/// included. Exceptions of `io` pass through.
int scanText(QrBufferedIO& io, const wchar_t* format, std::va_list& arguments);

} // namespace Mz
