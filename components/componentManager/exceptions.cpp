// SPDX-License-Identifier: BSL-1.0
/// Sets the fixed reasons of the exceptions.
///
/// Every constructor, copy constructor and destructor is defined here, not inline: the type
/// information and the virtual tables then exist once, in this library, so that an exception can be
/// caught in any other.
#include "components/componentManager/exceptions.h"

#include <string>

namespace Mz {

namespace {

/// Returns `name`, then ": " and `reason`.
std::string withName(const char* name, const char* reason) {
    return std::string(name ? name : "") + ": " + reason;
}

/// Returns the same text and a second line, `name2`. The `reason` of this form has no full stop.
std::string withName(const char* name, const char* reason, const char* name2) {
    return withName(name, reason) + "\n" + (name2 ? name2 : "");
}

} // namespace

QrStreamEx::QrStreamEx(const char* file, int line) : ExBase(file, line) {}
QrStreamEx::QrStreamEx(const QrStreamEx& other) = default;
QrStreamEx& QrStreamEx::operator=(const QrStreamEx& other) = default;
QrStreamEx::~QrStreamEx() = default;

QrComponentManagerEx::QrComponentManagerEx(const char* file, int line) : ExBase(file, line) {}
QrComponentManagerEx::QrComponentManagerEx(const QrComponentManagerEx& other) = default;
QrComponentManagerEx& QrComponentManagerEx::operator=(const QrComponentManagerEx& other) = default;
QrComponentManagerEx::~QrComponentManagerEx() = default;

QrStreamEx::ExBadSwapSize::ExBadSwapSize(const char* file, int line)
    : QrConcreteException(file, line) {
    setReason("Bad swap bytes size.");
}
QrStreamEx::ExBadSwapSize::ExBadSwapSize(const ExBadSwapSize& other) = default;
QrStreamEx::ExBadSwapSize::~ExBadSwapSize() = default;

QrStreamEx::ExRead::ExRead(const char* file, int line) : QrConcreteException(file, line) {
    setReason("Read on output stream.");
}
QrStreamEx::ExRead::ExRead(const ExRead& other) = default;
QrStreamEx::ExRead::~ExRead() = default;

QrStreamEx::ExReadError::ExReadError(const char* file, int line) : QrConcreteException(file, line) {
    setReason("Error reading stream.");
}
QrStreamEx::ExReadError::ExReadError(const char* file, int line, const char* name)
    : QrConcreteException(file, line) {
    setReason(withName(name, "Error reading stream.").c_str());
}
QrStreamEx::ExReadError::ExReadError(const ExReadError& other) = default;
QrStreamEx::ExReadError::~ExReadError() = default;

QrStreamEx::ExReadObject::ExReadObject(const char* file, int line)
    : QrConcreteException(file, line) {
    setReason("Error loading object.");
}
QrStreamEx::ExReadObject::ExReadObject(const char* file, int line, const char* name)
    : QrConcreteException(file, line) {
    setReason(withName(name, "Error loading object.").c_str());
}
QrStreamEx::ExReadObject::ExReadObject(const ExReadObject& other) = default;
QrStreamEx::ExReadObject::~ExReadObject() = default;

QrStreamEx::ExReadObjectImp::ExReadObjectImp(const char* file, int line)
    : QrConcreteException(file, line) {
    setReason("readObject not implemented.");
}
QrStreamEx::ExReadObjectImp::ExReadObjectImp(const ExReadObjectImp& other) = default;
QrStreamEx::ExReadObjectImp::~ExReadObjectImp() = default;

QrStreamEx::ExReadOpen::ExReadOpen(const char* file, int line) : QrConcreteException(file, line) {
    setReason("Error opening input stream.");
}
QrStreamEx::ExReadOpen::ExReadOpen(const char* file, int line, const char* name)
    : QrConcreteException(file, line) {
    setReason(withName(name, "Error opening input stream.").c_str());
}
QrStreamEx::ExReadOpen::ExReadOpen(const char* file, int line, const char* name, const char* name2)
    : QrConcreteException(file, line) {
    setReason(withName(name, "Error opening input stream", name2).c_str());
}
QrStreamEx::ExReadOpen::ExReadOpen(const ExReadOpen& other) = default;
QrStreamEx::ExReadOpen::~ExReadOpen() = default;

QrStreamEx::ExWrite::ExWrite(const char* file, int line) : QrConcreteException(file, line) {
    setReason("Write on input stream.");
}
QrStreamEx::ExWrite::ExWrite(const ExWrite& other) = default;
QrStreamEx::ExWrite::~ExWrite() = default;

QrStreamEx::ExWriteError::ExWriteError(const char* file, int line)
    : QrConcreteException(file, line) {
    setReason("Error writing stream.");
}
QrStreamEx::ExWriteError::ExWriteError(const char* file, int line, const char* name)
    : QrConcreteException(file, line) {
    setReason(withName(name, "Error writing stream.").c_str());
}
QrStreamEx::ExWriteError::ExWriteError(const ExWriteError& other) = default;
QrStreamEx::ExWriteError::~ExWriteError() = default;

QrStreamEx::ExWriteObject::ExWriteObject(const char* file, int line)
    : QrConcreteException(file, line) {
    setReason("Error storing object.");
}
QrStreamEx::ExWriteObject::ExWriteObject(const char* file, int line, const char* name)
    : QrConcreteException(file, line) {
    setReason(withName(name, "Error storing object.").c_str());
}
QrStreamEx::ExWriteObject::ExWriteObject(const ExWriteObject& other) = default;
QrStreamEx::ExWriteObject::~ExWriteObject() = default;

QrStreamEx::ExWriteObjectImp::ExWriteObjectImp(const char* file, int line)
    : QrConcreteException(file, line) {
    setReason("writeObject not implemented.");
}
QrStreamEx::ExWriteObjectImp::ExWriteObjectImp(const ExWriteObjectImp& other) = default;
QrStreamEx::ExWriteObjectImp::~ExWriteObjectImp() = default;

QrStreamEx::ExWriteOpen::ExWriteOpen(const char* file, int line) : QrConcreteException(file, line) {
    setReason("Error opening output stream.");
}
QrStreamEx::ExWriteOpen::ExWriteOpen(const char* file, int line, const char* name)
    : QrConcreteException(file, line) {
    setReason(withName(name, "Error opening output stream.").c_str());
}
QrStreamEx::ExWriteOpen::ExWriteOpen(const char* file, int line, const char* name,
                                     const char* name2)
    : QrConcreteException(file, line) {
    setReason(withName(name, "Error opening output stream", name2).c_str());
}
QrStreamEx::ExWriteOpen::ExWriteOpen(const ExWriteOpen& other) = default;
QrStreamEx::ExWriteOpen::~ExWriteOpen() = default;

QrComponentManagerEx::ExBadCast::ExBadCast(const char* file, int line)
    : QrConcreteException(file, line) {
    setReason("Bad cast in QrCastable::safeCast");
}
QrComponentManagerEx::ExBadCast::ExBadCast(const ExBadCast& other) = default;
QrComponentManagerEx::ExBadCast::~ExBadCast() = default;

} // namespace Mz
