// SPDX-License-Identifier: BSL-1.0
/// The separators between the values of an object, for each kind of stream.
///
/// A stream writes no more than a value needs; the program ensures that a reader finds its end.
/// Inside an object that is not enough, because the IO or another class often writes what follows.
/// So the IO completes the stream's output:
///
/// - Formatted text has no separator after it. The IO writes a blank before the next value.
/// - On a stream that is neither text nor binary, single values are text and arrays are binary
/// data.
///   Between text and binary data there is always one line end, from the stream or from the IO,
///   which the reader consumes. Characters that a class writes and reads by count are data in this
///   sense.
///
/// Writing text that still cannot be read back throws.
#pragma once

#include "components/componentManager/stream.h"

#include <string_view>

namespace Mz {

/// The form of an object, which is that of its stream.
enum class ObjectForm {
    Binary,
    Text,
    Mixed ///< Single values as text, arrays as binary data.
};

/// Returns the form in which `stream` writes objects.
inline ObjectForm formOf(const QrStream& stream) {
    return stream.isBinaryStream() ? ObjectForm::Binary
           : stream.isTextStream() ? ObjectForm::Text
                                   : ObjectForm::Mixed;
}

/// The separators that the writing IO adds, and the checks of the text between them.
class ObjectTextOutput {
  public:
    /// Throws `QrStreamEx::ExWriteError` if the text would not be read back exactly.
    static void check(QrStream::TextKind kind, ObjectForm form, std::wstring_view text);

    /// Writes the separator that text of this kind needs before it, and records how the text ends.
    /// Throws `QrStreamEx::ExWriteError` if a reader could not find the beginning of the text.
    void begin(QrBufferedIO& io, QrStream::TextKind kind, ObjectForm form, std::wstring_view text);
    /// Returns whether `begin` would write nothing before a value, and only record it.
    bool continuesWithValue() const { return last != Last::Formatted; }
    /// Records that a value was written.
    void noteValue() { last = Last::Value; }
    /// Writes the line end that binary data needs before it. Throws `QrStreamEx::ExWriteError` if a
    /// reader could not find the beginning of the data.
    void beginData(QrBufferedIO& io, ObjectForm form);
    /// Records that the stream has written a blank.
    void noteSpace();
    /// Records that the stream has written a line end.
    void noteLineEnd();

  private:
    enum class Last { LineEndOrData, Value, Formatted, FormattedAndBlank };
    Last last = Last::LineEndOrData;
};

} // namespace Mz
