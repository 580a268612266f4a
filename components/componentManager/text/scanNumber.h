/// One number read straight from a standard buffer: what nearly all formatted reading is.
#pragma once

#include <cstdarg>
#include <iosfwd>

namespace Mz {

/// Does what `scanText` does with the formats `%d %u %hd %hu %ld %lu %I64d %I64u %g %lg` where the
/// number stands whole in what `buffer`, that of `in`, holds, is an ordinary one and is followed by
/// an ordinary character: stores it, and true. In every other case, which is left to the general
/// way, false, and the buffer and the arguments are as they were. Raises what a read of
/// `QrInBuffer` raises.
bool scanNumber(std::istream& in, std::streambuf& buffer, const wchar_t* format,
                std::va_list& arguments);

} // namespace Mz
