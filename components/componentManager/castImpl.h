// SPDX-License-Identifier: BSL-1.0
/// The templates that implement casts and reference counts for concrete classes.
///
/// Choose by the interfaces of the class and by the owner of its objects:
///
///     class Gauge : public QrCastImpl<Gauge, IGauge>                            // static or local
///     class Mesh  : public QrCastRef<QrCastHeap<QrCastImpl<Mesh, IMesh>>>       // counted
///     class Both  : public QrCastRef<QrCastHeap<QrCastMulti<Both, IMesh, IShape>>>
///
/// The parameter `Arg` is a tag that makes the instances of different classes different types.
/// Leave it at its default.
#pragma once

#include "components/componentManager/castable.h"
#include "components/resmgt/lkCounter.h"

#include <type_traits>
#include <utility>

namespace Mz {

namespace detail {

/// Takes one reference to `object`; `view` is an interface of the same object. The call is
/// devirtualised if `Impl` is final, and omitted if `Impl` inherits the root's no-op.
template <class Impl>
void takeReference(Impl* object, QrCastable* view) {
    using RootFunction = long (QrCastable::*)();
    constexpr bool inheritsNoOp = std::is_final_v<Impl> && requires {
        requires std::is_same_v<decltype(&Impl::newReference), RootFunction>;
    };
    if constexpr (!requires { object->newReference(); })
        view->newReference(); // `Impl` declares it private, or hides it by other overloads.
    else if constexpr (!inheritsNoOp)
        object->newReference();
}

} // namespace detail

/// The base of a class, `Impl`, that supports one interface. The object is uncounted and ignores
/// `destroy`, unless `QrCastRef` and `QrCastHeap` are added.
///
/// The object supports `Iface` only: neither the uid of `Impl` nor that of an interface from which
/// `Iface` derives. Object and interface have the same address.
template <class Impl, class Iface, class Arg = const Impl&>
class QrCastImpl : public Iface {
  public:
    using Iface::Iface;

    const QrCastable* getCastable() const override { return this; }
    QrCastable* getCastable() override { return this; }

    QrCastable* getInterface(const QrUid& wanted) override {
        if (wanted == Iface::uid) {
            detail::takeReference(static_cast<Impl*>(this), this);
            return this;
        }
        if constexpr (continuesChain)
            return Iface::getInterface(wanted);
        else
            return nullptr;
    }

    bool hasInterface(const QrUid& wanted) const override {
        if constexpr (continuesChain)
            return Iface::hasInterface(wanted);
        else
            return wanted == Iface::uid;
    }

    void destroy() override {}

  private:
    static constexpr bool continuesChain = requires { typename Iface::CastChainLink; };
};

/// A link of a cast chain: it supports `Iface` and passes every other uid to `Next`.
///
/// `Next` has two static functions, `getInterface(Impl*, const QrUid&)` and
/// `hasInterface(const Impl*, const QrUid&)`. They follow the functions of `QrCastable`.
template <class Impl, class Iface, class Next, class Arg = const Impl&>
class QrCastHierarchy : public Iface {
  public:
    using Iface::Iface;
    using CastChainLink = Next;

    QrCastable* getInterface(const QrUid& wanted) override {
        if (wanted == Iface::uid) {
            this->newReference();
            return this;
        }
        return Next::getInterface(static_cast<Impl*>(this), wanted);
    }

    bool hasInterface(const QrUid& wanted) const override {
        return wanted == Iface::uid || Next::hasInterface(static_cast<const Impl*>(this), wanted);
    }
};

/// The base of a class, `Impl`, that supports one interface itself and leaves the others to `Next`.
template <class Impl, class Iface, class Next, class Arg = const Impl&>
class QrCastImpl2 : public QrCastImpl<Impl, QrCastHierarchy<Impl, Iface, Next, Arg>, Arg> {
  public:
    using QrCastImpl<Impl, QrCastHierarchy<Impl, Iface, Next, Arg>, Arg>::QrCastImpl;
};

/// The last link of a cast chain, for an interface that a separate companion object implements.
///
/// Every request creates a new companion with `new Temp(owner)` and returns a reference to it. The
/// companion is counted: it lives as long as it is referenced, and owns a reference to its owner.
/// Companions are never shared.
template <class Owner, class Temp>
class QrTempIface {
  public:
    /// Returns a new companion, with one reference, if `wanted` is its uid; else null.
    static QrCastable* getInterface(Owner* owner, const QrUid& wanted) {
        if (!(wanted == Temp::uid))
            return nullptr;
        return QrPtr<Temp>(new Temp(owner)).detach();
    }

    /// Returns whether `wanted` is the uid of the companion.
    static bool hasInterface(const Owner*, const QrUid& wanted) { return wanted == Temp::uid; }
};

/// The base of a class, `Impl`, that supports several interfaces. Each interface has a different
/// address. The principal object is the first interface. The object is uncounted and ignores
/// `destroy`, unless `QrCastRef` and `QrCastHeap` are added.
///
/// A conversion of such an object to `QrCastable*` is ambiguous. Write `object->getCastable()`.
template <class Impl, class First, class... Rest>
class QrCastMulti : public First, public Rest... {
  public:
    const QrCastable* getCastable() const override { return static_cast<const First*>(this); }
    QrCastable* getCastable() override { return static_cast<First*>(this); }

    QrCastable* getInterface(const QrUid& wanted) override {
        QrCastable* view = nullptr;
        static_cast<void>(viewAs<First>(wanted, view) || (viewAs<Rest>(wanted, view) || ...));
        if (view)
            detail::takeReference(static_cast<Impl*>(this), view);
        return view;
    }

    bool hasInterface(const QrUid& wanted) const override {
        return wanted == First::uid || ((wanted == Rest::uid) || ...);
    }

    void destroy() override {}

    /// Overrides the functions of all root bases at once, so that a call through the object is not
    /// ambiguous.
    long newReference() override { return First::newReference(); }
    long release() override { return First::release(); }

  private:
    template <class Iface>
    bool viewAs(const QrUid& wanted, QrCastable*& view) {
        if (wanted == Iface::uid)
            view = static_cast<Iface*>(this);
        return view != nullptr;
    }
};

/// Adds to `Base` a `destroy` that deletes the object. Create such objects with `new`.
template <class Base, class Arg = const Base&>
class QrCastHeap : public Base {
  public:
    using Base::Base;
    void destroy() override { delete this; }
};

/// Adds a reference count to `Base`.
///
/// A new object has no reference; its creator owns it until the first reference is taken. The
/// release of the last reference deletes the object, so create it with `new`. A copy starts without
/// references. Reference operations are thread-safe.
template <class Base, class Arg = const Base&>
class QrCastRef : public Base {
  public:
    using Base::Base;
    QrCastRef() = default;
    QrCastRef(const QrCastRef& other) : Base(other) {}
    QrCastRef& operator=(const QrCastRef& other) {
        Base::operator=(other);
        return *this;
    }

    long newReference() override { return ++references; }

    /// Not inlined: compilers that see the body warn about uses after the deletion, which the count
    /// rules out.
    [[gnu::noinline]] long release() override {
        // Who holds the only reference need not fear that another thread takes or releases one.
        // The result is a local: the object and its counter may no longer exist at the return.
        const long left = references.dropLast() ? -1 : --references;
        if (left < 0)
            delete this;
        return left;
    }

  private:
    /// The number of references minus one.
    LkCounterWindows<long> references{-1};
};

/// The base of a companion: a counted object that implements an interface for its owner. It owns a
/// reference to the owner. `Base` supplies the interface and the reference count.
///
/// The companion answers for the uid of the companion's interface and passes other uids to the
/// owner. `hasInterface` returns the owner's result. The principal object is that of the owner.
///
/// `destroy` deletes the companion, then calls `destroy` of the owner, then releases the owner. Do
/// not call it if the owner's `destroy` deletes the owner: the release would follow the deletion.
template <class Owner, class Base>
class QrTempObject : public Base {
  public:
    /// Takes a reference to `owner`.
    ///
    /// \param owner  owner of the companion; must not be null
    /// \param args   arguments of the constructor of `Base`
    template <class... Args>
    explicit QrTempObject(Owner* owner, Args&&... args)
        : Base(std::forward<Args>(args)...), ownerReference(owner) {}

    ~QrTempObject() override { ownerReference.reset(); }

    const QrCastable* getCastable() const override {
        return std::as_const(*ownerReference).getCastable();
    }
    QrCastable* getCastable() override { return ownerReference->getCastable(); }

    QrCastable* getInterface(const QrUid& wanted) override {
        if (wanted == Base::uid) {
            this->newReference();
            return this;
        }
        return ownerReference->getInterface(wanted);
    }

    bool hasInterface(const QrUid& wanted) const override {
        return ownerReference->hasInterface(wanted);
    }

    void destroy() override {
        const QrPtr<Owner> ownerGuard = ownerReference; // Outlives the companion.
        delete this;
        ownerGuard->destroy();
    }

  protected:
    Owner* owner() const noexcept { return ownerReference.get(); }

  private:
    QrPtr<Owner> ownerReference;
};

} // namespace Mz
