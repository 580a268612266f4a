// SPDX-License-Identifier: BSL-1.0
/// Builders of a component library: what they are, and how `MZ_COMPONENT` gets them.
///
/// Most builders need no class of their own. `builderOf<Class>({.uid = …})` makes one that creates
/// objects of a class. A builder that does more derives from `Builder`, or from `ImportBuilder`
/// (`importBuilder.h`), and is passed to `MZ_COMPONENT` as `builder<Class>()`.
#pragma once

#include "components/componentKit/object.h"
#include "components/componentManager/componentImp.h"

#include <initializer_list>
#include <memory>
#include <type_traits>
#include <utility>

namespace Mz::Kit {

/// The identity of a builder, which is not nil. A builder with a constant identity of four zero
/// words, or without one, does not compile.
///
/// \since 0.2
class BuilderUid {
  public:
    /// Does not compile: each builder has an identity.
    template <bool given = false>
    constexpr BuilderUid() {
        static_assert(given, "a builder has no uid: write `.uid = ...` with a new uid");
    }

    /// Takes a constant.
    consteval BuilderUid(const QrUid& uid) : value(uid) {
        if (uid == QrUid{})
            throw "the uid of a builder is nil: `mzcomponents uid` prints a new one";
    }

    /// Takes an identity that is known at run time only, and must not be nil.
    static BuilderUid atRunTime(const QrUid& uid) { return {uid, RunTime::yes}; }

    /// Returns the uid.
    constexpr operator const QrUid&() const { return value; }

  private:
    enum class RunTime { yes };
    BuilderUid(const QrUid& uid, RunTime) : value(uid) {}

    QrUid value{};
};

/// The description of one builder. The texts are stored as pointers, so they must stay valid until
/// the library is unloaded. String literals do.
struct BuilderInfo {
    BuilderUid uid;             ///< identity of the builder; generate a new one for each builder
    const wchar_t* name = L"";  ///< name by which importers find the builder
    const wchar_t* label = L""; ///< short text for people; importers show it in file dialogs
    const wchar_t* text = L"";  ///< longer text for people
    unsigned int number = 0;    ///< number whose meaning you agree on with your clients
    bool flag = false;          ///< flag whose meaning you agree on with your clients
};

/// The base of a builder that is its own description and its own builder.
///
/// `Casts` supplies casting and lifetime (see `castImpl.h`). The derived class implements
/// `createObject`.
template <class Casts>
class SelfDescribing : public Casts {
  public:
    explicit SelfDescribing(const BuilderInfo& builderInfo) : info(builderInfo) {}

    const QrUid& getUid() const override { return info.uid; }
    const wchar_t* getName() const override { return info.name; }
    const wchar_t* getLabel() const override { return info.label; }
    unsigned int getNumber() const override { return info.number; }
    const wchar_t* getText() const override { return info.text; }
    bool getFlag() const override { return info.flag; }

    /// Returns an empty text, as `getComponentText` does. The manager takes both texts from the
    /// description of the library.
    const wchar_t* getComponentLabel() const override { return L""; }
    const wchar_t* getComponentText() const override { return L""; }

    QrRefPtr<QrComponentBuilder> getBuilder() override { return this; }
    QrCRefPtr<QrComponentBuilder> getBuilder() const override { return this; }

  private:
    BuilderInfo info;
};

/// The base of a counted builder, `Impl`, that also implements the interfaces `Ifaces`.
///
/// `Impl` implements `createObject` and the functions of `Ifaces`. Create it with
/// `Mz::Kit::builder`: the release of the last reference deletes it.
///
/// Not made with `Object`: its name would then be found before a class `Object` of the component.
template <class Impl, class... Ifaces>
class Builder
    : public SelfDescribing<QrCastRef<
          QrCastHeap<QrCastMulti<Impl, QrBuilderDescription, QrComponentBuilder, Ifaces...>>>> {
    static_assert(detail::checkInterfaces<Ifaces...>());

  public:
    using SelfDescribing<QrCastRef<QrCastHeap<
        QrCastMulti<Impl, QrBuilderDescription, QrComponentBuilder, Ifaces...>>>>::SelfDescribing;
};

namespace detail {

/// Refuses to compile for a class whose objects a builder cannot create, with the remedy.
template <class Class>
struct CheckedClass {
    static_assert(std::is_base_of_v<QrCastable, Class>,
                  "a builder makes castable objects: derive the class from"
                  " `Kit::Object<Class, Interface>`");
    static_assert(checkInterfacesOf(static_cast<const Class*>(nullptr)));
    static_assert(Counted<Class>,
                  "this class is not counted, so nothing would delete its objects: derive it from"
                  " `Kit::Object<Class, Interface>`");
    static_assert(!std::is_abstract_v<Class>,
                  "this class is abstract, so it has no objects: implement every function of its"
                  " interfaces");
    static_assert(std::is_abstract_v<Class> || std::is_default_constructible_v<Class>,
                  "this class has no public default constructor: add one, or derive a builder from"
                  " `Kit::Builder` that passes the arguments");
};

} // namespace detail

/// A builder that creates each object with `new Class`. `Class` must be counted (`Kit::Object`) and
/// have a default constructor.
///
/// The builder itself is not counted: a count would cost six references to the builder for each
/// object. The description of the library owns it.
template <class Class>
class ObjectBuilder final
    : public SelfDescribing<
          QrCastMulti<ObjectBuilder<Class>, QrComponentBuilder, QrBuilderDescription>> {
    static_assert(sizeof(detail::CheckedClass<Class>) > 0);

  public:
    using SelfDescribing<QrCastMulti<ObjectBuilder<Class>, QrComponentBuilder,
                                     QrBuilderDescription>>::SelfDescribing;

    /// Repeats the root's no-op here, to avoid a call into another library.
    long newReference() override { return 1; }
    long release() override { return 1; }

    /// Returns this builder. The reference is adopted, not taken: taking one is a no-op.
    QrRefPtr<QrComponentBuilder> getBuilder() override {
        return QrRefPtr<QrComponentBuilder>::adopt(this);
    }
    QrCRefPtr<QrComponentBuilder> getBuilder() const override {
        return QrCRefPtr<QrComponentBuilder>::adopt(this);
    }

    QrRef<QrCastable> createObject() override {
        return (new Class)->getCastable(); // The returned `QrRef` takes the first reference.
    }
};

/// The handle through which a description owns a builder. It owns one reference to a counted
/// builder, and is the only owner of an uncounted one.
using OwnedBuilder = std::shared_ptr<QrBuilderDescription>;

namespace detail {

/// Returns the owner of a new counted builder.
template <class T, class... Args>
OwnedBuilder newBuilder(Args&&... args) {
    return OwnedBuilder(QrPtr<T>(new T(std::forward<Args>(args)...)).detach(),
                        [](T* counted) { counted->release(); });
}

/// Returns the owner of a new builder of objects of class `Class`.
template <class Class>
OwnedBuilder newBuilderOf(const BuilderInfo& info) {
    return std::make_shared<ObjectBuilder<Class>>(info);
}

} // namespace detail

/// A builder that does not exist yet: `MZ_COMPONENT` makes it from this plan when the library is
/// asked for its description for the first time. Its uid can be compared at compile time.
class BuilderPlan {
  public:
    constexpr BuilderPlan(const BuilderInfo& builderInfo,
                          OwnedBuilder (*makeBuilder)(const BuilderInfo&))
        : info(builderInfo), make(makeBuilder) {}

    /// Makes the builder.
    operator OwnedBuilder() const { return make(info); }

    /// Returns the uid of the builder.
    constexpr const QrUid& uid() const { return info.uid; }

  private:
    BuilderInfo info;
    OwnedBuilder (*make)(const BuilderInfo&);
};

/// The plan of a builder of class `T`, which describes itself. If `T` has a constant named
/// `builderUid`, that is taken for its uid in the comparison at compile time.
template <class T>
class SelfDescribingPlan {
  public:
    /// Makes the builder.
    operator OwnedBuilder() const { return detail::newBuilder<T>(); }

    /// Returns the uid of the builder, or a nil uid if it is not known before the builder exists.
    static constexpr QrUid uid() {
        if constexpr (requires { QrUid(T::builderUid); })
            return T::builderUid;
        else
            return {};
    }
};

/// Returns a counted builder of class `T`, for `MZ_COMPONENT`. It is made when the library is asked
/// for its description for the first time.
template <class T>
constexpr SelfDescribingPlan<T> builder() {
    return {};
}

/// Returns a new counted builder of class `T`, for `MZ_COMPONENT`.
///
/// \param first, args  arguments of the constructor of `T`
template <class T, class First, class... Args>
OwnedBuilder builder(First&& first, Args&&... args) {
    return detail::newBuilder<T>(std::forward<First>(first), std::forward<Args>(args)...);
}

/// Returns a builder of objects of class `Class`, for `MZ_COMPONENT`. It is made when the library
/// is asked for its description for the first time.
///
/// `Class` does not compile here, with a sentence that names the mistake and the remedy, if an
/// interface of it has no `uid` or `Self`, if it is not counted, if it is abstract, or if it has no
/// default constructor.
template <class Class>
constexpr BuilderPlan builderOf(const BuilderInfo& info) {
    static_assert(sizeof(detail::CheckedClass<Class>) > 0);
    return {info, &detail::newBuilderOf<Class>};
}

namespace detail {

/// Returns the uid of an argument of `MZ_COMPONENT`, or a nil uid if it is not constant.
constexpr QrUid constantUid(const BuilderPlan& plan) {
    return plan.uid();
}
template <class T>
constexpr QrUid constantUid(const SelfDescribingPlan<T>&) {
    return SelfDescribingPlan<T>::uid();
}
inline QrUid constantUid(const OwnedBuilder&) {
    return {};
}

/// Returns whether no two of the builders have one uid. Nil uids are not compared.
template <class... Builders>
constexpr bool uidsDiffer(const Builders&... builders) {
    const std::initializer_list<QrUid> uids{constantUid(builders)...};
    for (auto one = uids.begin(); one != uids.end(); ++one)
        for (auto other = uids.begin(); other != one; ++other)
            if (*one == *other && !(*one == QrUid{}))
                return false;
    return true;
}

} // namespace detail

} // namespace Mz::Kit
