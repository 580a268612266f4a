// SPDX-License-Identifier: BSL-1.0
/// The root interface of all objects that cross library boundaries, and the casts.
#pragma once

#include "components/componentManager/export.h"
#include "components/componentManager/reference.h"
#include "components/componentManager/translation.h"
#include "components/componentManager/uid.h"

#include <cstddef>
#include <type_traits>

namespace Mz {

/// The root interface: reference counting, and casts by interface identity.
///
/// Do not use `dynamic_cast` on these objects. A client requests an interface by its `QrUid` and
/// gets a pointer that carries a reference. Concrete classes derive the implementation from the
/// templates of `castImpl.h`.
///
/// The root does not count references. An object that inherits its `newReference` and `release` is
/// uncounted: it lives as long as its storage (static, local or member), and references do not
/// affect its lifetime.
///
/// The order of the virtual functions is ABI. Never reorder them or insert one.
class MZ_COMPONENT_MANAGER_API QrCastable {
  public:
    /// Returns the principal object: this object, or the owner of this companion. The result is
    /// never null. No reference is taken.
    virtual const QrCastable* getCastable() const = 0;
    virtual QrCastable* getCastable() = 0;

    /// Returns this object, or a companion of it, as the interface `uid`. Prefer `safeCast` and
    /// `queryCast`, which also consult the translators of the object.
    ///
    /// \return a pointer that `static_cast` converts to the interface, or null if the object does
    ///         not support it. The caller owns one new reference. An unknown `uid` never throws.
    virtual QrCastable* getInterface(const QrUid& uid) = 0;

    /// Returns whether `getInterface(uid)` would succeed. Takes no reference and creates nothing.
    virtual bool hasInterface(const QrUid& uid) const = 0;

    /// Requests the disposal of the object. The concrete class decides what happens: nothing, its
    /// deletion, or its deletion and the same request to its owner.
    virtual void destroy() = 0;

    /// Takes a reference. Thread-safe.
    ///
    /// \return for a counted object, the number of references minus one: 0 for the first. For an
    ///         uncounted object 1; the call is a no-op then.
    virtual long newReference();

    /// Releases a reference. The release of the last reference deletes a counted object.
    /// Thread-safe.
    ///
    /// \return for a counted object, the number of remaining references minus one: -1 after the
    ///         deletion. For an uncounted object 1; the call is a no-op then.
    virtual long release();

    virtual ~QrCastable();

  private:
    /// Throws `QrComponentManagerEx::ExBadCast`; never returns.
    [[noreturn]] static void throwBadCast();

    template <class T>
    friend T* safeCast(QrCastable* object);
};

/// An interface that declares its own `uid` and `Self`, and does not only inherit them.
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

/// Returns `object` as the interface `T`. Consults the object first, then its translators.
///
/// \param object  object to cast, or null
/// \return the interface with a new reference, or null if `object` is null or has no such interface
template <class T>
QrPtr<T> queryCast(QrCastable* object) {
    static_assert(QrInterface<T>, "cast to an interface that has its own uid and Self");
    if (!object)
        return nullptr;
    return QrPtr<T>::adopt(static_cast<T*>(detail::findInterface(object, T::uid)));
}

/// Returns `object` as the interface `T`. Consults the object first, then its translators.
///
/// The result is never null. The caller owns one reference; adopt it at once:
///
///     auto io = QrPtr<QrBufferedIO>::adopt(safeCast<QrBufferedIO>(object));   // right
///     QrPtr<QrBufferedIO> io(safeCast<QrBufferedIO>(object));                 // leaks one
///
/// \throws QrComponentManagerEx::ExBadCast  if `object` is null or has no such interface. No
///         reference stays taken.
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

/// Returns the const `object` as the const interface `T`, like the form for non-const objects.
template <class T>
const T* safeCast(const QrCastable* object) {
    return safeCast<T>(const_cast<QrCastable*>(object));
}

/// Returns the const `object` as the const interface `T`, like the form for non-const objects.
template <class T>
QrCPtr<T> queryCast(const QrCastable* object) {
    return queryCast<T>(const_cast<QrCastable*>(object));
}

/// Throws `QrComponentManagerEx::ExBadCast`, as for every null object; never returns.
template <class T>
T* safeCast(std::nullptr_t) {
    return safeCast<T>(static_cast<QrCastable*>(nullptr));
}

/// Returns null.
template <class T>
QrPtr<T> queryCast(std::nullptr_t) {
    return nullptr;
}

} // namespace Mz
