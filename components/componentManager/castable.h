/// The root of every object that crosses a library's border, and the casts between interfaces.
#pragma once

#include "components/componentManager/export.h"
#include "components/componentManager/reference.h"
#include "components/componentManager/translation.h"
#include "components/componentManager/uid.h"

#include <cstddef>
#include <type_traits>

namespace Mz {

/// The root interface: reference counting, and casting by interface identity.
///
/// Objects are never viewed with `dynamic_cast`; a client asks the object for an interface by its
/// `QrUid` and is given a pointer that carries a reference. What concrete classes need for all this
/// comes from the templates of `castImpl.h`.
///
/// The root itself counts nothing: an object that inherits its `newReference` and `release` lives
/// as long as its storage (a static, a local, a member), whatever anybody does with references.
///
/// The order of the virtual operations is fixed for good; components built years apart meet here.
class MZ_COMPONENT_MANAGER_API QrCastable {
  public:
    /// The principal object behind this interface: the object itself, or the owner of a companion.
    /// No reference is taken; the result is never null.
    virtual const QrCastable* getCastable() const = 0;
    virtual QrCastable* getCastable() = 0;

    /// This object, or a companion of it, as the interface `uid`; null when it has none such.
    /// A result carries one new reference, which the caller owns, and becomes the interface by
    /// `static_cast`. Never throws for an identifier it does not know.
    virtual QrCastable* getInterface(const QrUid& uid) = 0;

    /// Whether `getInterface(uid)` would succeed. Takes no reference and creates nothing.
    virtual bool hasInterface(const QrUid& uid) const = 0;

    /// Asks for the object to be disposed of. What that means is the concrete class's choice:
    /// nothing, deletion, or deletion and the same request to an owner.
    virtual void destroy() = 0;

    /// Takes a reference. Counted objects return the number of references minus one, so 0 for the
    /// first; the root returns 1 and counts nothing. Counted objects allow any thread.
    virtual long newReference();

    /// Gives a reference back. A counted object returns the number left minus one and is deleted
    /// when that is negative; the root returns 1 and does nothing. Counted objects allow any
    /// thread.
    virtual long release();

    virtual ~QrCastable();

  private:
    /// Throws `QrComponentManagerEx::ExBadCast`.
    [[noreturn]] static void throwBadCast();

    template <class T>
    friend T* safeCast(QrCastable* object);
};

/// An interface that names itself, and so is what its `uid` says.
template <class T>
concept QrInterface = std::is_same_v<T, typename T::Self> &&
    std::is_same_v<decltype(T::uid), const QrUid> && std::is_base_of_v<QrCastable, T>;

namespace detail {

/// Returns the object's own answer, else that of the first translator that accepts `uid`, else
/// null.
inline QrCastable* findInterface(QrCastable* object, const QrUid& uid) {
    QrCastable* found = object->getInterface(uid);
    if (translationsExist.load(std::memory_order_relaxed) && !found) [[unlikely]]
        found = QrTranslateInterface(object, uid);
    return found;
}

} // namespace detail

/// `object` as the interface `T`, or null: asks the object itself, then its translators. A null
/// `object` gives null.
template <class T>
QrPtr<T> queryCast(QrCastable* object) {
    static_assert(QrInterface<T>, "cast to an interface that has its own uid and Self");
    if (!object)
        return nullptr;
    return QrPtr<T>::adopt(static_cast<T*>(detail::findInterface(object, T::uid)));
}

/// `object` as the interface `T`: asks the object itself, then its translators.
///
/// The result carries one reference, which the caller owns. Hand it over at once:
///
///     auto io = QrPtr<QrBufferedIO>::adopt(safeCast<QrBufferedIO>(object));   // right
///     QrPtr<QrBufferedIO> io(safeCast<QrBufferedIO>(object));                 // leaks one
///
/// Throws `QrComponentManagerEx::ExBadCast` when `object` is null or has no such interface; no
/// reference is held then.
template <class T>
T* safeCast(QrCastable* object) {
    static_assert(QrInterface<T>, "cast to an interface that has its own uid and Self");
    if (!object)
        QrCastable::throwBadCast();
    QrCastable* found = detail::findInterface(object, T::uid);
    if (!found)
        QrCastable::throwBadCast();
    return static_cast<T*>(found);
}

/// The same for objects that are at hand as const only; what was const stays so.
template <class T>
const T* safeCast(const QrCastable* object) {
    return safeCast<T>(const_cast<QrCastable*>(object));
}

template <class T>
QrCPtr<T> queryCast(const QrCastable* object) {
    return queryCast<T>(const_cast<QrCastable*>(object));
}

template <class T>
T* safeCast(std::nullptr_t) {
    return safeCast<T>(static_cast<QrCastable*>(nullptr));
}

template <class T>
QrPtr<T> queryCast(std::nullptr_t) {
    return nullptr;
}

} // namespace Mz
