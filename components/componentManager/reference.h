/// The smart references to castable objects.
#pragma once

#include "components/componentManager/export.h"

#include <cstddef>
#include <type_traits>
#include <utility>

namespace Mz {

/// Holds one pointer and, while it is not null, exactly one reference to the object behind it.
///
/// Two ways lead in, and they differ in who pays for the reference:
/// - `QrPtr<T>(pointer)` takes a *new* reference (`newReference`), the caller keeps its own;
/// - `QrPtr<T>::adopt(pointer)` takes *over* a reference that the pointer already carries, as the
///   results of `getInterface`, `safeCast` and `QrTranslateInterface` do.
///
/// Two ways lead out: `get()` only looks, `detach()` gives the reference to the caller.
///
/// `release` must not throw: it is called where an exception ends the process.
///
/// Whether the object is deleted with its last reference is the object's own affair: objects that
/// do not count stay as they are. One reference belongs to one thread at a time; different
/// references to one counted object may be used by different threads.
///
/// Five names exist for it, which say at a glance what a result is for.
template <class T>
class MZ_SHARED_TYPE QrReference {
  public:
    using element_type = T;

    constexpr QrReference() noexcept = default;
    constexpr QrReference(std::nullptr_t) noexcept {}

    /// Takes a new reference on `object`, which may be null.
    QrReference(T* object) : held(object) { take(); }

    QrReference(const QrReference& other) : held(other.held) { take(); }
    QrReference(QrReference&& other) noexcept : held(other.detach()) {}

    template <class U>
    requires std::is_convertible_v<U*, T*> QrReference(const QrReference<U>& other)
        : held(other.get()) {
        take();
    }

    template <class U>
    requires std::is_convertible_v<U*, T*> QrReference(QrReference<U>&& other)
    noexcept : held(other.detach()) {}

    ~QrReference() { reset(); }

    /// The new reference is taken before the old one is given back, so that assigning what the old
    /// object alone keeps alive is safe.
    QrReference& operator=(const QrReference& other) { // NOLINT(bugprone-unhandled-self-assignment)
        QrReference(other).swap(*this);
        return *this;
    }
    QrReference& operator=(QrReference&& other) noexcept {
        QrReference(std::move(other)).swap(*this);
        return *this;
    }
    template <class U>
    requires std::is_convertible_v<U*, T*> QrReference& operator=(const QrReference<U>& other) {
        QrReference(other).swap(*this);
        return *this;
    }
    template <class U>
    requires std::is_convertible_v<U*, T*> QrReference& operator=(QrReference<U>&& other) noexcept {
        QrReference(std::move(other)).swap(*this);
        return *this;
    }
    QrReference& operator=(T* other) {
        QrReference(other).swap(*this);
        return *this;
    }
    QrReference& operator=(std::nullptr_t) noexcept {
        reset();
        return *this;
    }

    /// Takes over the reference that `object` already carries; null is allowed.
    [[nodiscard]] static QrReference adopt(T* object) noexcept {
        QrReference result;
        result.held = object;
        return result;
    }

    T* get() const noexcept { return held; }
    T* operator->() const noexcept { return held; }
    T& operator*() const noexcept { return *held; }
    explicit operator bool() const noexcept { return held != nullptr; }

    /// Gives the reference back and becomes null. Null comes first: whatever the release sets off
    /// finds this reference already empty.
    void reset() noexcept {
        if (T* old = std::exchange(held, nullptr))
            mutableObject(old)->release();
    }

    /// Gives the reference to the caller, who must give it back or adopt it, and becomes null.
    [[nodiscard]] T* detach() noexcept { return std::exchange(held, nullptr); }

    void swap(QrReference& other) noexcept { std::swap(held, other.held); }
    friend void swap(QrReference& a, QrReference& b) noexcept { a.swap(b); }

    /// Whether both look at the same object, at the same interface of it.
    template <class U>
    friend bool operator==(const QrReference& a, const QrReference<U>& b) noexcept {
        return a.get() == b.get();
    }
    friend bool operator==(const QrReference& a, const T* b) noexcept { return a.get() == b; }
    friend bool operator==(const QrReference& a, std::nullptr_t) noexcept { return !a.held; }

  private:
    /// Counting is no change that constness protects against.
    static std::remove_const_t<T>* mutableObject(T* object) noexcept {
        return const_cast<std::remove_const_t<T>*>(object);
    }
    void take() {
        if (held)
            mutableObject(held)->newReference();
    }

    T* held = nullptr;
};

/// What operations return that create or load an object.
template <class T>
using QrRef = QrReference<T>;

/// An interface that was obtained by casting.
template <class T>
using QrPtr = QrReference<T>;

/// The same, for looking only.
template <class T>
using QrCPtr = QrReference<const T>;

/// What builders return of themselves.
template <class T>
using QrRefPtr = QrReference<T>;

/// The same, for looking only.
template <class T>
using QrCRefPtr = QrReference<const T>;

} // namespace Mz
