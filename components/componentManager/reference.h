// SPDX-License-Identifier: BSL-1.0
/// Smart references to castable objects.
#pragma once

#include "components/componentManager/export.h"

#include <cstddef>
#include <type_traits>
#include <utility>

namespace Mz {

/// A smart reference: it holds a pointer and, unless the pointer is null, owns one reference to the
/// object.
///
/// There are two ways to construct it from a raw pointer:
/// - `QrPtr<T>(pointer)` takes a new reference (`newReference`). The caller keeps its own.
/// - `QrPtr<T>::adopt(pointer)` takes ownership of a reference that the pointer already carries.
///   Use it for the results of `getInterface`, `safeCast` and `QrTranslateInterface`.
///
/// There are two ways to get the raw pointer: `get()` keeps the reference, `detach()` passes its
/// ownership to the caller.
///
/// The `release` of the object must not throw. It is called from `noexcept` functions, where an
/// exception terminates the process.
///
/// Ownership: the release of the last reference deletes a counted object. An uncounted object lives
/// as long as its storage.
///
/// Threads: one smart reference must not be used by two threads at the same time. Different threads
/// can use different references to one counted object.
///
/// The template has five aliases (below), which document the purpose of a result.
template <class T>
class MZ_SHARED_TYPE QrReference {
  public:
    /// What is referenced, as standard smart pointers name it.
    using element_type = T;

    /// Makes a null reference.
    constexpr QrReference() noexcept = default;
    constexpr QrReference(std::nullptr_t) noexcept {}

    /// Takes a new reference to `object`, which may be null.
    QrReference(T* object) : held(object) { take(); }

    QrReference(const QrReference& other) : held(other.held) { take(); }
    /// Takes over the reference of `other`, which becomes null.
    QrReference(QrReference&& other) noexcept : held(other.detach()) {}

    /// Takes a new reference to the object of `other`.
    template <class U>
    requires std::is_convertible_v<U*, T*> QrReference(const QrReference<U>& other)
        : held(other.get()) {
        take();
    }

    /// Takes over the reference of `other`, which becomes null.
    template <class U>
    requires std::is_convertible_v<U*, T*> QrReference(QrReference<U>&& other)
    noexcept : held(other.detach()) {}

    ~QrReference() { reset(); }

    /// Takes the new reference before it releases the old one. The assigned object may therefore be
    /// one that only the old object keeps alive.
    QrReference& operator=(const QrReference& other) { // NOLINT(bugprone-unhandled-self-assignment)
        QrReference(other).swap(*this);
        return *this;
    }
    /// Takes over the reference of `other`, which becomes null, and releases the old one.
    QrReference& operator=(QrReference&& other) noexcept {
        QrReference(std::move(other)).swap(*this);
        return *this;
    }
    /// Takes a new reference to the object of `other` before it releases the old one.
    template <class U>
    requires std::is_convertible_v<U*, T*> QrReference& operator=(const QrReference<U>& other) {
        QrReference(other).swap(*this);
        return *this;
    }
    /// Takes over the reference of `other`, which becomes null, and releases the old one.
    template <class U>
    requires std::is_convertible_v<U*, T*> QrReference& operator=(QrReference<U>&& other) noexcept {
        QrReference(std::move(other)).swap(*this);
        return *this;
    }
    /// Takes a new reference to `other`, which may be null, before it releases the old one.
    QrReference& operator=(T* other) {
        QrReference(other).swap(*this);
        return *this;
    }
    /// Releases the reference and becomes null.
    QrReference& operator=(std::nullptr_t) noexcept {
        reset();
        return *this;
    }

    /// Returns a smart reference that takes ownership of the reference that `object` already
    /// carries. `object` may be null.
    [[nodiscard]] static QrReference adopt(T* object) noexcept {
        QrReference result;
        result.held = object;
        return result;
    }

    /// Returns the pointer, which may be null. Takes no reference.
    T* get() const noexcept { return held; }

    /// Accesses the object. This reference must not be null.
    T* operator->() const noexcept { return held; }
    T& operator*() const noexcept { return *held; }

    /// Returns whether this reference is not null.
    explicit operator bool() const noexcept { return held != nullptr; }

    /// Releases the reference and becomes null. It becomes null first: code that runs inside the
    /// release already sees it null.
    void reset() noexcept {
        if (T* old = std::exchange(held, nullptr))
            mutableObject(old)->release();
    }

    /// Returns the pointer and becomes null. The caller owns the reference and must release or
    /// adopt it.
    [[nodiscard]] T* detach() noexcept { return std::exchange(held, nullptr); }

    /// Exchanges the objects; counts nothing.
    void swap(QrReference& other) noexcept { std::swap(held, other.held); }
    friend void swap(QrReference& a, QrReference& b) noexcept { a.swap(b); }

    /// Returns whether both hold the same pointer: the same interface of the same object.
    template <class U>
    friend bool operator==(const QrReference& a, const QrReference<U>& b) noexcept {
        return a.get() == b.get();
    }
    /// Returns whether the reference holds this pointer.
    friend bool operator==(const QrReference& a, const T* b) noexcept { return a.get() == b; }
    /// Returns whether the reference is null.
    friend bool operator==(const QrReference& a, std::nullptr_t) noexcept { return !a.held; }

  private:
    /// References to const objects are counted too: the count is not part of the value that const
    /// protects.
    static std::remove_const_t<T>* mutableObject(T* object) noexcept {
        return const_cast<std::remove_const_t<T>*>(object);
    }
    void take() {
        if (held)
            mutableObject(held)->newReference();
    }

    T* held = nullptr;
};

/// The result of a function that creates or loads an object.
template <class T>
using QrRef = QrReference<T>;

/// An interface obtained by a cast.
template <class T>
using QrPtr = QrReference<T>;

/// An interface obtained by a cast, with const access only.
template <class T>
using QrCPtr = QrReference<const T>;

/// The result of a builder's `getBuilder`.
template <class T>
using QrRefPtr = QrReference<T>;

/// The result of a builder's `getBuilder`, with const access only.
template <class T>
using QrCRefPtr = QrReference<const T>;

} // namespace Mz
