/// The exceptions of the library.
///
/// Every failure that the library reports is thrown by value and is at once a `std::runtime_error`,
/// for handlers that know nothing of this library, and an `ExBase`, which knows the source position
/// and the reason. Catch a concrete class, a whole family (`QrStreamEx`, `QrComponentManagerEx`),
/// or `std::exception`. All can be caught in another library than the one that threw.
///
/// The reasons are fixed texts. A constructor with a `name` (a file or object name, usually) puts
/// the name in front of it, exactly as given; a null name counts as empty. Names and second texts
/// are UTF-8 on every platform, whatever the locale: `utf8Name` (`nativeText.h`) gives the name of
/// a file in that form, and `displayText` makes a reason readable. Constructors may throw
/// `std::bad_alloc`; `clone()` answers a lack of memory with null.
#pragma once

#include "components/base/exBase.h"
#include "components/componentManager/export.h"

#include <new>
#include <stdexcept>

namespace Mz {

/// What all concrete exceptions share: `Self` is the exception, `Scope` its family. The message of
/// the `std::runtime_error` stays empty; `what()` gives the reason.
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

/// The failures of streams and of the buffers under them.
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

/// The failures of the component manager and of casting.
class MZ_COMPONENT_MANAGER_API QrComponentManagerEx : public ExBase {
  public:
    QrComponentManagerEx(const char* file, int line);
    QrComponentManagerEx(const QrComponentManagerEx& other);
    QrComponentManagerEx& operator=(const QrComponentManagerEx& other);
    ~QrComponentManagerEx() override;

    class ExBadCast;
};

/// "Bad swap bytes size.": no operation of this library raises it; it is there for streams of
/// others that reverse values of a width chosen at run time.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExBadSwapSize
    : public QrConcreteException<QrStreamEx::ExBadSwapSize, QrStreamEx> {
  public:
    ExBadSwapSize(const char* file, int line);
    ExBadSwapSize(const ExBadSwapSize& other);
    ~ExBadSwapSize() override;
};

/// "Read on output stream.": an operation that reads was called on something that only writes.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExRead
    : public QrConcreteException<QrStreamEx::ExRead, QrStreamEx> {
  public:
    ExRead(const char* file, int line);
    ExRead(const ExRead& other);
    ~ExRead() override;
};

/// "Error reading stream.": the input failed, ended inside a value or does not make sense.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExReadError
    : public QrConcreteException<QrStreamEx::ExReadError, QrStreamEx> {
  public:
    ExReadError(const char* file, int line);
    ExReadError(const char* file, int line, const char* name);
    ExReadError(const ExReadError& other);
    ~ExReadError() override;
};

/// "Error loading object.": an object's data could not be read.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExReadObject
    : public QrConcreteException<QrStreamEx::ExReadObject, QrStreamEx> {
  public:
    ExReadObject(const char* file, int line);
    ExReadObject(const char* file, int line, const char* name);
    ExReadObject(const ExReadObject& other);
    ~ExReadObject() override;
};

/// "readObject not implemented.": the buffer does not know how objects are stored.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExReadObjectImp
    : public QrConcreteException<QrStreamEx::ExReadObjectImp, QrStreamEx> {
  public:
    ExReadObjectImp(const char* file, int line);
    ExReadObjectImp(const ExReadObjectImp& other);
    ~ExReadObjectImp() override;
};

/// "Error opening input stream.": with two names, the second stands on a line of its own behind the
/// first ("name: Error opening input stream", a line feed, then `name2`).
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExReadOpen
    : public QrConcreteException<QrStreamEx::ExReadOpen, QrStreamEx> {
  public:
    ExReadOpen(const char* file, int line);
    ExReadOpen(const char* file, int line, const char* name);
    ExReadOpen(const char* file, int line, const char* name, const char* name2);
    ExReadOpen(const ExReadOpen& other);
    ~ExReadOpen() override;
};

/// "Write on input stream.": an operation that writes was called on something that only reads.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExWrite
    : public QrConcreteException<QrStreamEx::ExWrite, QrStreamEx> {
  public:
    ExWrite(const char* file, int line);
    ExWrite(const ExWrite& other);
    ~ExWrite() override;
};

/// "Error writing stream.": the output failed, or a value has no form in which it can be written.
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

/// "writeObject not implemented.": the buffer does not know how objects are stored.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExWriteObjectImp
    : public QrConcreteException<QrStreamEx::ExWriteObjectImp, QrStreamEx> {
  public:
    ExWriteObjectImp(const char* file, int line);
    ExWriteObjectImp(const ExWriteObjectImp& other);
    ~ExWriteObjectImp() override;
};

/// "Error opening output stream.": its two-name form is as that of `ExReadOpen`.
class MZ_COMPONENT_MANAGER_API QrStreamEx::ExWriteOpen
    : public QrConcreteException<QrStreamEx::ExWriteOpen, QrStreamEx> {
  public:
    ExWriteOpen(const char* file, int line);
    ExWriteOpen(const char* file, int line, const char* name);
    ExWriteOpen(const char* file, int line, const char* name, const char* name2);
    ExWriteOpen(const ExWriteOpen& other);
    ~ExWriteOpen() override;
};

/// "Bad cast in QrCastable::safeCast": an object lacks an interface that is required.
class MZ_COMPONENT_MANAGER_API QrComponentManagerEx::ExBadCast
    : public QrConcreteException<QrComponentManagerEx::ExBadCast, QrComponentManagerEx> {
  public:
    ExBadCast(const char* file, int line);
    ExBadCast(const ExBadCast& other);
    ~ExBadCast() override;
};

} // namespace Mz
