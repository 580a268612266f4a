// SPDX-License-Identifier: BSL-1.0
/// Tells streams which IO passes the text of numbers on to another one unchanged.
///
/// \since 0.2
#pragma once

#include "components/componentManager/bufferio.h"
#include "components/componentManager/export.h"

#include <typeinfo>

namespace Mz {

/// A declaration that the objects of one IO class pass the text of numbers on to another IO.
///
/// A stream on such an object writes and reads numbers at the other IO if that is a `QrOutBuffer`
/// or `QrInBuffer` over a buffer of the standard library, and calls the functions of `Functions` in
/// place of the virtual functions of the object. In all other cases, and for all other values, the
/// object receives every call.
///
/// The declaration applies to objects whose dynamic type is exactly the class: a derived class may
/// override what the declaration relies on. libMZobjectIO declares its two classes.
///
/// Make it a static object of the library that has the class. There is room for `maximumCount`
/// declarations in a process; further ones have no effect. Thread-safe.
class MZ_COMPONENT_MANAGER_API QrNumberRelay {
  public:
    /// The number of declarations for which there is room.
    static constexpr int maximumCount = 16;

    /// What the objects of the class do with a number. Each function receives an object of the
    /// class. None may throw.
    struct Functions {
        /// Returns the IO that would receive the number that the stream is about to write, or null
        /// if the object must receive it. Changes nothing.
        QrBufferedIO* (*output)(QrBufferedIO& io) = nullptr;
        /// Called before a number is written to that IO. `separator` is the blank or line end
        /// before the number, or 0.
        void (*noteNumber)(QrBufferedIO& io, char separator) = nullptr;
        /// Called before a number is read. Returns the IO that supplies it, or null if the object
        /// must be asked. The stream may ask the object afterwards, also if the result is not null.
        QrBufferedIO* (*input)(QrBufferedIO& io) = nullptr;
        /// Called after a number was read from that IO, with the number of bytes that were taken
        /// from it. Not called if the stream asked the object instead.
        void (*noteRead)(QrBufferedIO& io, int bytes) = nullptr;
    };

    /// Declares the class. A function that is null is one that returns null.
    QrNumberRelay(const std::type_info& exactClass, const Functions& functions);
    /// Ends the declaration. No stream on an object of the class may be in use.
    ~QrNumberRelay();
    QrNumberRelay(const QrNumberRelay&) = delete;
    QrNumberRelay& operator=(const QrNumberRelay&) = delete;

  private:
    int slot = -1;
};

} // namespace Mz
