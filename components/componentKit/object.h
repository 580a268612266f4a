// SPDX-License-Identifier: BSL-1.0
/// The base of the counted objects that components make.
///
/// An interface, in a header that host and component share, and a class that has it:
///
///     class Greeter : public Mz::QrCastable {
///       public:
///         using Self = Greeter;
///         static constexpr Mz::QrUid uid = "6E1B0A01-4D1F-11EF-9C2A-7B105D3E8F41"_uid;
///
///         virtual const char* greeting() const = 0;
///     };
///
///     class WorldGreeter final : public Mz::Kit::Object<WorldGreeter, Greeter> {
///         const char* greeting() const override { return "Hello, world!"; }
///     };
///
/// The interface declares no destructor: an object is destroyed by its last release. Each interface
/// has a different uid (`mzcomponents uid` prints a new one). A changed interface gets a new uid.
///
/// `Object` combines three templates of `castImpl.h`: `QrCastRef` counts the references,
/// `QrCastHeap` deletes the object at `destroy`, and `QrCastImpl` (for one interface) or
/// `QrCastMulti` (for several) answers casts. Use those templates directly for a combination that
/// `Object` does not offer.
///
/// This header also checks interfaces at compile time. The checks are made where a class is
/// declared or registered, so that a mistake does not wait for the first host that casts.
///
/// \since 0.2
#pragma once

#include "components/componentManager/castImpl.h"

#include <type_traits>

namespace Mz {
class QrBaseImporter;
} // namespace Mz

namespace Mz::Kit {

namespace detail {

/// Whether `Iface` has a constant of the right type named `uid`, its own or an inherited one.
template <class Iface>
concept HasUid = requires {
    requires std::is_same_v<decltype(Iface::uid), const QrUid>;
};

/// Whether `Iface` declares `Self`, and not only inherits it. `QrBaseImporter` is an
/// implementation of `QrImporter`, whose `uid` and `Self` it inherits on purpose.
template <class Iface>
concept HasOwnSelf = std::is_same_v<Iface, QrBaseImporter> || requires {
    requires std::is_same_v<Iface, typename Iface::Self>;
};

/// Refuses to compile for a class that is not a complete interface, with the remedy.
template <class Iface>
struct CheckedInterface {
    static_assert(std::is_base_of_v<QrCastable, Iface>,
                  "an interface of this class does not derive from Mz::QrCastable: derive it");
    static_assert(HasUid<Iface>, "an interface of this class has no uid: add to the interface"
                                 " `static constexpr Mz::QrUid uid = ...;` with a new uid");
    static_assert(!HasUid<Iface> || HasOwnSelf<Iface>,
                  "an interface of this class has no Self of its own: add to the interface"
                  " `using Self = ...;` with its own name, and a uid of its own");
};

/// The interface of a link of a cast chain; every other interface is its own.
template <class Iface>
struct InterfaceOfLink {
    using Type = Iface;
};
template <class Impl, class Iface, class Next, class Arg>
struct InterfaceOfLink<QrCastHierarchy<Impl, Iface, Next, Arg>> {
    using Type = Iface;
};

/// Instantiates the checks of the interfaces that a cast template was given.
template <class... Ifaces>
constexpr bool checkInterfaces() {
    return ((sizeof(CheckedInterface<Ifaces>) > 0) && ...);
}
template <class Impl, class Iface, class Arg>
constexpr bool checkInterfacesOf(const QrCastImpl<Impl, Iface, Arg>*) {
    return checkInterfaces<typename InterfaceOfLink<Iface>::Type>();
}
template <class Impl, class First, class... Rest>
constexpr bool checkInterfacesOf(const QrCastMulti<Impl, First, Rest...>*) {
    return checkInterfaces<First, Rest...>();
}
/// The class implements its casts by hand: there is nothing to check.
constexpr bool checkInterfacesOf(const void*) {
    return true;
}

/// Whether `newReference` of this type is the no-op of an uncounted object.
template <class Function>
inline constexpr bool isNoOp = false;
template <>
inline constexpr bool isNoOp<long (QrCastable::*)()> = true;
template <class Impl, class First, class... Rest>
inline constexpr bool isNoOp<long (QrCastMulti<Impl, First, Rest...>::*)()> =
    isNoOp<decltype(&First::newReference)>;

/// Whether references to objects of this class are counted, as far as the compiler can tell.
template <class Class>
concept Counted = !requires {
    requires isNoOp<decltype(&Class::newReference)>;
};

/// The template that answers casts to these interfaces.
template <class Impl, class... Ifaces>
struct CastsTo {
    using Type = QrCastMulti<Impl, Ifaces...>;
};
template <class Impl, class Iface>
struct CastsTo<Impl, Iface> {
    using Type = QrCastImpl<Impl, Iface>;
};
/// Not an object, but enough for `Object` to say so.
template <class Impl>
struct CastsTo<Impl> {
    using Type = QrCastable;
};

} // namespace detail

/// The base of a counted class, `Impl`, that supports the interfaces `Ifaces`, of which there is at
/// least one.
///
/// The object lives until its last reference is released, so create it with `new`. It supports the
/// listed interfaces only, not those from which they derive (see `BaseInterface`). With one
/// interface, object and interface have the same address. With several, the principal object is the
/// first one, and a conversion to `QrCastable*` is ambiguous: write `object->getCastable()`.
///
/// Each interface must declare `uid` and `Self`, or the class does not compile.
///
/// Threads: references may be taken and released by any thread.
template <class Impl, class... Ifaces>
class Object : public QrCastRef<QrCastHeap<typename detail::CastsTo<Impl, Ifaces...>::Type>> {
    static_assert(
        sizeof...(Ifaces) > 0,
        "this class has no interface: name at least one, `Kit::Object<Class, Interface>`");
    static_assert(detail::checkInterfaces<Ifaces...>());

  public:
    using QrCastRef<QrCastHeap<typename detail::CastsTo<Impl, Ifaces...>::Type>>::QrCastRef;
};

/// The last link of a cast chain (`QrCastImpl2`), for an object whose interface derives from the
/// interface `Base`. The object then supports `Base` too:
///
///     class MyImporter : public QrCastRef<QrCastHeap<QrCastImpl2<
///         MyImporter, IMyImporter, Kit::BaseInterface<MyImporter, QrImporter>>>>
template <class Impl, class Base>
class BaseInterface {
  public:
    /// Returns `object` as `Base`, with a new reference, if `wanted` is the uid of `Base`; else
    /// null.
    static QrCastable* getInterface(Impl* object, const QrUid& wanted) {
        static_assert(QrInterface<Base>, "the base has its own uid and Self");
        return wanted == Base::uid ? QrPtr<Base>(object).detach() : nullptr;
    }

    /// Returns whether `wanted` is the uid of `Base`.
    static bool hasInterface(const Impl*, const QrUid& wanted) { return wanted == Base::uid; }
};

} // namespace Mz::Kit
