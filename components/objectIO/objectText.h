/// The form of objects on each kind of stream, as text and as binary data.
///
/// A stream writes no more than a value needs, and the program sees to it that a reader finds the
/// end of it. Inside an object that is not enough: what follows is often written by the IO, or by
/// another class. So the IO completes what the stream writes:
///
/// - Formatted text has no separator after it. The IO writes a blank before the next value.
/// - On a stream that is neither text nor binary throughout, single values are text and arrays are
///   binary data. Between text and binary data there is always one line end, from the stream or
///   from the IO, which the reader consumes. Characters that a class writes and reads by count
///   are data in this sense.
///
/// Text that cannot be read back even so is refused when it is written.
#pragma once

#include "components/componentManager/stream.h"

#include <string_view>

namespace Mz {

/// The forms of an object: that of its stream.
enum class ObjectForm {
    Binary,
    Text,
    Mixed ///< Single values as text, arrays as binary data.
};

inline ObjectForm formOf(const QrStream& stream) {
    return stream.isBinaryStream() ? ObjectForm::Binary
           : stream.isTextStream() ? ObjectForm::Text
                                   : ObjectForm::Mixed;
}

/// What an object writes, between its values.
class ObjectTextOutput {
  public:
    /// Throws `QrStreamEx::ExWriteError` for text that is not read back as it was.
    static void check(QrStream::TextKind kind, ObjectForm form, std::wstring_view text);

    /// Writes what is due before text of this kind, and remembers how the text ends. Throws
    /// `QrStreamEx::ExWriteError` where a reader could not find its beginning.
    void begin(QrBufferedIO& io, QrStream::TextKind kind, ObjectForm form, std::wstring_view text);
    /// Writes what is due before binary data. Throws `QrStreamEx::ExWriteError` where the reader
    /// could not find its beginning.
    void beginData(QrBufferedIO& io, ObjectForm form);
    void noteSpace();
    void noteLineEnd();

  private:
    enum class Last { LineEndOrData, Value, Formatted, FormattedAndBlank };
    Last last = Last::LineEndOrData;
};

} // namespace Mz
