/// The templates from which every concrete class takes its casting and counting.
///
/// Pick by two questions, which interfaces and who owns the object:
///
///     class Gauge : public QrCastImpl<Gauge, IGauge>                            // static or local
///     class Mesh  : public QrCastRef<QrCastHeap<QrCastImpl<Mesh, IMesh>>>       // counted
///     class Both  : public QrCastRef<QrCastHeap<QrCastMulti<Both, IMesh, IShape>>>
///
/// The parameter `Arg` of these templates is a tag that only keeps instances of different classes
/// apart; leave it at its default.
#pragma once

#include "components/componentManager/castable.h"
#include "components/resmgt/lkCounter.h"

#include <type_traits>
#include <utility>

namespace Mz {

namespace detail {

/// Takes one reference on `object`; `view` is an interface of the same object. The call is
/// devirtualised if `Impl` is final, and omitted if `Impl` inherits the root's no-op.
template <class Impl>
void takeReference(Impl* object, QrCastable* view) {
    using RootOperation = long (QrCastable::*)();
    constexpr bool isRoots = std::is_final_v<Impl> && requires {
        requires std::is_same_v<decltype(&Impl::newReference), RootOperation>;
    };
    if constexpr (!requires { object->newReference(); })
        view->newReference(); // The class keeps its own private, or has others of that name.
    else if constexpr (!isRoots)
        object->newReference();
}

} // namespace detail

/// An object that answers for one interface, is not counted and ignores `destroy`.
///
/// It answers for `Iface` only: not for `Impl`, nor for an interface that `Iface` derives from.
/// Object and interface share one address.
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

/// A link of a chain: answers for `Iface` and passes every other identifier on to `Next`, which has
/// two static functions, `getInterface(Impl*, const QrUid&)` and
/// `hasInterface(const Impl*, const QrUid&)`, with the meaning of those of `QrCastable`.
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

/// An object that answers for one interface itself and leaves the others to `Next`.
template <class Impl, class Iface, class Next, class Arg = const Impl&>
class QrCastImpl2 : public QrCastImpl<Impl, QrCastHierarchy<Impl, Iface, Next, Arg>, Arg> {
  public:
    using QrCastImpl<Impl, QrCastHierarchy<Impl, Iface, Next, Arg>, Arg>::QrCastImpl;
};

/// The last link of a chain, for an interface that `Owner` shows through a separate companion
/// object. Every request makes a new companion with `new Temp(owner)`, which lives as long as the
/// reference handed out and keeps its owner referenced meanwhile; companions are not shared.
template <class Owner, class Temp>
class QrTempIface {
  public:
    static QrCastable* getInterface(Owner* owner, const QrUid& wanted) {
        if (!(wanted == Temp::uid))
            return nullptr;
        return QrPtr<Temp>(new Temp(owner)).detach();
    }

    static bool hasInterface(const Owner*, const QrUid& wanted) { return wanted == Temp::uid; }
};

/// An object that answers for several interfaces at once. Each interface has an address of its own;
/// the principal object is the first one's.
///
/// A conversion of such an object to `QrCastable*` is ambiguous; write `object->getCastable()`.
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

    /// One body for the roots of all interfaces, so that a call through the object is unambiguous.
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

/// Adds to `Base` that `destroy` deletes the object, which therefore must stand on the heap.
template <class Base, class Arg = const Base&>
class QrCastHeap : public Base {
  public:
    using Base::Base;
    void destroy() override { delete this; }
};

/// Adds a reference counter to `Base`. A new object has no reference and belongs to whoever made
/// it; the release of the last reference deletes it, so it must stand on the heap. A copy of a
/// counted object starts without a reference of its own.
///
/// References may be taken and given back from any thread.
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

    /// Not inlined: compilers that look through it warn of uses behind a deletion that the count
    /// rules out.
    [[gnu::noinline]] long release() override {
        // The object, and the counter in it, may be gone when this function returns.
        const long left = --references;
        if (left < 0)
            delete this;
        return left;
    }

  private:
    /// The number of references minus one.
    LkCounterWindows<long> references{-1};
};

/// A companion: a counted object that shows an interface on behalf of its owner, on which it holds
/// a reference for as long as it lives.
///
/// It answers for its own interface itself and leaves every other question to the owner; the
/// principal object is the owner's. `destroy` disposes of the companion, then asks the owner to
/// dispose of itself, then gives the reference on the owner back: an owner whose `destroy` deletes
/// it must not have companions that are destroyed so.
template <class Owner, class Base>
class QrTempObject : public Base {
  public:
    /// Takes a reference on `owner`, which must not be null.
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
        const QrPtr<Owner> kept = ownerReference;
        delete this;
        kept->destroy();
    }

  protected:
    Owner* owner() const noexcept { return ownerReference.get(); }

  private:
    QrPtr<Owner> ownerReference;
};

} // namespace Mz
