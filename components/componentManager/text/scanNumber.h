// SPDX-License-Identifier: BSL-1.0
/// The fast scanner for a single number in a standard buffer, which is nearly all formatted
/// reading.
#pragma once

#include "components/componentManager/uid.h"

#include <cstdarg>

namespace Mz {

class ByteSource;

/// Reads a number, as `scanText` does, in one of the formats `%d %u %hd %hu %ld %lu %I64d %I64u %g
/// %lg`. `source` must be free.
///
/// \return the number of bytes taken from the source if the number was stored. 0 if the format is
///         another one, or the number is unusual or not complete in the buffer with an ASCII
///         character after it. The input and the arguments are then unchanged.
/// \throws QrStreamEx::ExReadError if the medium fails
int scanNumber(const ByteSource& source, const wchar_t* format, std::va_list& arguments);

/// The same for one number without a format: reads what `%d`, `%u`, `%I64d`, `%I64u`, `%g` and
/// `%lg` read.
int scanNumber(const ByteSource& source, int& value);
int scanNumber(const ByteSource& source, unsigned int& value);
int scanNumber(const ByteSource& source, int64& value);
int scanNumber(const ByteSource& source, unsigned long long& value);
int scanNumber(const ByteSource& source, float& value);
int scanNumber(const ByteSource& source, double& value);

} // namespace Mz
