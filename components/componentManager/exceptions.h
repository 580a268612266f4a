// SPDX-License-Identifier: BSL-1.0
/// The exceptions of the library.
///
/// All exceptions are thrown by value. Each is both a `std::runtime_error`, for generic handlers,
/// and an `ExBase`, which holds the source position and the reason. Catch a concrete class, a whole
/// family (`QrStreamEx`, `QrComponentManagerEx`), or `std::exception`. An exception can be caught
/// in a different library than the one that threw it.
///
/// Each class has a fixed reason, which opens the comment of the class. A constructor with a
/// `name`, usually the name of a file or an object, puts `name` and ": " before the reason. The
/// name is used unchanged; null counts as empty. Names and second texts are UTF-8 on every
/// platform, whatever the locale: `utf8Name` (`nativeText.h`) returns the name of a file in that
/// form, and `displayText` makes a reason readable. Constructors throw `std::bad_alloc` if memory
/// runs out; `clone()` returns null.
#pragma once

#include "components/base/exBase.h"
#include "components/componentManager/export.h"

#include <new>
#include <stdexcept>

namespace Mz {

/// The base of all concrete exceptions: `Self` is the exception, `Scope` its family.
///
/// `what()` returns the reason of the `ExBase` part. The message of the `std::runtime_error` part
/// is always empty.
template <class Self, class Scope>
class MZ_SHARED_TYPE QrConcreteException : public std::runtime_error, public Scope {
  public:
    const char* what() const noexcept override { return this->getReason(); }

    ExBase* clone() const override {
        try {
            return new Self(static_cast<const Self&>(*this));
        } catch (const std::bad_alloc&) {
            return nullptr;
        }
    }

  protected:
    QrConcreteException(const char* file, int line) : std::runtime_error(""), Scope(file, line) {}
    QrConcreteException(const QrConcreteException&) = default;
    QrConcreteException& operator=(const QrConcreteException&) = default;
    ~QrConcreteException() override = default;
};

/// The family of the exceptions of streams and of buffered IO.
class MZ_COMPONENT_MANAGER_API QrStreamEx : public ExBase {
  public:
    QrStreamEx(const char* file, int line);
    QrStreamEx(const QrStreamEx& other);
    QrStreamEx& operator=(const QrStreamEx& other);
    ~QrStreamEx() override;

    class ExBadSwapSize;
    class ExRead;
    class ExReadError;
    class ExReadObject;
    class ExReadObjectImp;
    class ExReadOpen;
    class ExWrite;
    class ExWriteError;
    class ExWriteObject;
    class ExWriteObjectImp;
    class ExWriteOpen;
};

/// The family of the exceptions of the component manager and of casts.
class MZ_COMPONENT_MANAGER_API QrComponentManagerEx : public ExBase {
  public:
    QrComponentManagerEx(const char* file, int line);
    QrComponentManagerEx(const QrComponentManagerEx& other);
    QrComponentManagerEx& operator=(const QrComponentManagerEx& other);
    ~QrComponentManagerEx() override;

    class ExBadCast;
};

/// "Bad swap bytes size.": a value of an unsupported width was to be reversed. This library does
/// not throw it; it is for foreign streams that reverse values of a width chosen at run time.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExBadSwapSize
    : public QrConcreteException<QrStreamEx::ExBadSwapSize, QrStreamEx> {
  public:
    ExBadSwapSize(const char* file, int line);
    ExBadSwapSize(const ExBadSwapSize& other);
    ~ExBadSwapSize() override;
};

/// "Read on output stream.": a reading function was called on an object that only writes.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExRead
    : public QrConcreteException<QrStreamEx::ExRead, QrStreamEx> {
  public:
    ExRead(const char* file, int line);
    ExRead(const ExRead& other);
    ~ExRead() override;
};

/// "Error reading stream.": the input failed, ended inside a value, or is invalid.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExReadError
    : public QrConcreteException<QrStreamEx::ExReadError, QrStreamEx> {
  public:
    ExReadError(const char* file, int line);
    ExReadError(const char* file, int line, const char* name);
    ExReadError(const ExReadError& other);
    ~ExReadError() override;
};

/// "Error loading object.": the data of an object could not be read.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExReadObject
    : public QrConcreteException<QrStreamEx::ExReadObject, QrStreamEx> {
  public:
    ExReadObject(const char* file, int line);
    ExReadObject(const char* file, int line, const char* name);
    ExReadObject(const ExReadObject& other);
    ~ExReadObject() override;
};

/// "readObject not implemented.": the buffered IO does not support objects.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExReadObjectImp
    : public QrConcreteException<QrStreamEx::ExReadObjectImp, QrStreamEx> {
  public:
    ExReadObjectImp(const char* file, int line);
    ExReadObjectImp(const ExReadObjectImp& other);
    ~ExReadObjectImp() override;
};

/// "Error opening input stream.": an input could not be opened.
///
/// With two names, the reason has two lines: "name: Error opening input stream" without a full
/// stop, then `name2`.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExReadOpen
    : public QrConcreteException<QrStreamEx::ExReadOpen, QrStreamEx> {
  public:
    ExReadOpen(const char* file, int line);
    ExReadOpen(const char* file, int line, const char* name);
    ExReadOpen(const char* file, int line, const char* name, const char* name2);
    ExReadOpen(const ExReadOpen& other);
    ~ExReadOpen() override;
};

/// "Write on input stream.": a writing function was called on an object that only reads.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExWrite
    : public QrConcreteException<QrStreamEx::ExWrite, QrStreamEx> {
  public:
    ExWrite(const char* file, int line);
    ExWrite(const ExWrite& other);
    ~ExWrite() override;
};

/// "Error writing stream.": the output failed, or a value cannot be represented in the format.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExWriteError
    : public QrConcreteException<QrStreamEx::ExWriteError, QrStreamEx> {
  public:
    ExWriteError(const char* file, int line);
    ExWriteError(const char* file, int line, const char* name);
    ExWriteError(const ExWriteError& other);
    ~ExWriteError() override;
};

/// "Error storing object.": an object could not be written.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExWriteObject
    : public QrConcreteException<QrStreamEx::ExWriteObject, QrStreamEx> {
  public:
    ExWriteObject(const char* file, int line);
    ExWriteObject(const char* file, int line, const char* name);
    ExWriteObject(const ExWriteObject& other);
    ~ExWriteObject() override;
};

/// "writeObject not implemented.": the buffered IO does not support objects.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExWriteObjectImp
    : public QrConcreteException<QrStreamEx::ExWriteObjectImp, QrStreamEx> {
  public:
    ExWriteObjectImp(const char* file, int line);
    ExWriteObjectImp(const ExWriteObjectImp& other);
    ~ExWriteObjectImp() override;
};

/// "Error opening output stream.": an output could not be opened. With two names, the reason has
/// two lines, like that of `ExReadOpen`.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExWriteOpen
    : public QrConcreteException<QrStreamEx::ExWriteOpen, QrStreamEx> {
  public:
    ExWriteOpen(const char* file, int line);
    ExWriteOpen(const char* file, int line, const char* name);
    ExWriteOpen(const char* file, int line, const char* name, const char* name2);
    ExWriteOpen(const ExWriteOpen& other);
    ~ExWriteOpen() override;
};

/// "Bad cast in QrCastable::safeCast": an object is null or lacks a required interface.
class MZ_COMPONENT_MANAGER_API QrComponentManagerEx::ExBadCast
    : public QrConcreteException<QrComponentManagerEx::ExBadCast, QrComponentManagerEx> {
  public:
    ExBadCast(const char* file, int line);
    ExBadCast(const ExBadCast& other);
    ~ExBadCast() override;
};

} // namespace Mz
