// SPDX-License-Identifier: BSL-1.0
/// Templates and a macro that keep the source of a component library short. Header-only.
///
/// A component library consists of a few builders and one line that lists them:
///
///     MZ_COMPONENT(L"Greetings", L"Says hello in several languages",
///                  Mz::Kit::builderOf<Greeter>({.uid = greeterUid, .name = L"greeter"}))
///
/// This file implements the interfaces that `componentImp.h` requires of a component library. A
/// library with other needs implements those interfaces by hand. It can combine both.
#pragma once

#include "components/componentKit/stamp.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/importBuilder.h"

#include <algorithm>
#include <initializer_list>
#include <memory>
#include <new>
#include <type_traits>
#include <utility>
#include <vector>

namespace Mz::Kit {

/// The identity of a builder, which is not nil. A builder with a constant identity of four zero
/// words, or without one, does not compile.
class BuilderUid {
  public:
    BuilderUid() = delete; // Each builder has an identity: set `.uid`.

    /// Takes a constant.
    consteval BuilderUid(const QrUid& uid) : value(uid) {
        if (uid == QrUid{})
            throw "the uid of a builder is nil: make a new one, four random words";
    }

    /// Takes an identity that is known at run time only, and must not be nil.
    static BuilderUid atRunTime(const QrUid& uid) { return {uid, RunTime()}; }

    constexpr operator const QrUid&() const { return value; }

  private:
    struct RunTime {};
    BuilderUid(const QrUid& uid, RunTime) : value(uid) {}

    QrUid value;
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
template <class Impl, class... Ifaces>
class Builder
    : public SelfDescribing<QrCastRef<
          QrCastHeap<QrCastMulti<Impl, QrBuilderDescription, QrComponentBuilder, Ifaces...>>>> {
  public:
    using SelfDescribing<QrCastRef<QrCastHeap<
        QrCastMulti<Impl, QrBuilderDescription, QrComponentBuilder, Ifaces...>>>>::SelfDescribing;
};

/// A builder that creates each object with `new Object`. `Object` must be counted (`QrCastRef`).
///
/// The builder itself is not counted: a count would cost six references to the builder for each
/// object. The description of the library owns it.
template <class Object>
class ObjectBuilder final
    : public SelfDescribing<
          QrCastMulti<ObjectBuilder<Object>, QrComponentBuilder, QrBuilderDescription>> {
  public:
    using SelfDescribing<QrCastMulti<ObjectBuilder<Object>, QrComponentBuilder,
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
        static_assert(!std::is_same_v<decltype(&Object::newReference), long (QrCastable::*)()>,
                      "the object is counted (QrCastRef): nothing else would delete it");
        return (new Object)->getCastable(); // The returned `QrRef` takes the first reference.
    }
};

/// The base of a builder, `Impl`, that imports foreign files. `Impl` implements the buffer forms of
/// `canImport` and `import`.
template <class Impl>
class ImportBuilder : public Builder<Impl, QrImportBuilder> {
  public:
    /// Creates a builder that reads files with these extensions.
    ///
    /// \param fileExtensions  extensions without dot or wildcard (L"obj"). They are stored as
    ///                        pointers, like all texts.
    ImportBuilder(const BuilderInfo& builderInfo,
                  std::initializer_list<const wchar_t*> fileExtensions)
        : Builder<Impl, QrImportBuilder>(builderInfo), extensions(fileExtensions) {}

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    QrEnum::Action enumerateExtensions(QrEnumerator<const wchar_t*>& e) const override {
        for (const wchar_t* extension : extensions)
            if (const QrEnum::Action action = e.process(extension))
                return action;
        return e.finished();
    }

    /// Returns null: an object exists only as the result of an import.
    QrRef<QrCastable> createObject() override { return nullptr; }

  private:
    std::vector<const wchar_t*> extensions;
};

/// The last link of a cast chain (`QrCastImpl2`), for an object whose interface derives from the
/// interface `Base`. The object then supports `Base` too:
///
///     class MyImporter : public QrCastRef<QrCastHeap<QrCastImpl2<
///         MyImporter, IMyImporter, Kit::BaseInterface<MyImporter, QrImporter>>>>
template <class Impl, class Base>
class BaseInterface {
  public:
    static QrCastable* getInterface(Impl* object, const QrUid& wanted) {
        static_assert(QrInterface<Base>, "the base has its own uid and Self");
        return wanted == Base::uid ? QrPtr<Base>(object).detach() : nullptr;
    }

    static bool hasInterface(const Impl*, const QrUid& wanted) { return wanted == Base::uid; }
};

/// The handle through which a description owns a builder. It owns one reference to a counted
/// builder, and is the only owner of an uncounted one.
using OwnedBuilder = std::shared_ptr<QrBuilderDescription>;

/// Returns a new counted builder of class `T`, for `MZ_COMPONENT`.
///
/// \param args  arguments of the constructor of `T`
template <class T, class... Args>
OwnedBuilder builder(Args&&... args) {
    return OwnedBuilder(QrPtr<T>(new T(std::forward<Args>(args)...)).detach(),
                        [](T* counted) { counted->release(); });
}

/// Returns a new builder of objects of class `Object`, for `MZ_COMPONENT`.
template <class Object>
OwnedBuilder builderOf(const BuilderInfo& info) {
    return std::make_shared<ObjectBuilder<Object>>(info);
}

/// The description of the component library. It is not counted: the entry point returns the same
/// object to all callers, from the first call until the library is unloaded.
class Description final : public QrCastImpl<Description, QrComponentDescription> {
  public:
    using Builders = std::vector<OwnedBuilder>;

    Description(const wchar_t* componentLabel, const wchar_t* componentText, Builders allBuilders)
        : label(componentLabel), text(componentText), builders(std::move(allBuilders)) {
        for (const OwnedBuilder& known : builders)
            uids.push_back(known->getUid());
    }

    QrRef<QrCastable> createBuilder(const QrUid& wanted) override {
        const auto known = std::find(uids.begin(), uids.end(), wanted);
        if (known == uids.end())
            return nullptr;
        return builders[static_cast<std::size_t>(known - uids.begin())]->getBuilder();
    }

    int64 getComponentValue() override { return 0; }
    const wchar_t* getComponentLabel() override { return label; }
    const wchar_t* getComponentText() override { return text; }
    unsigned int getBuilderCount() override { return static_cast<unsigned int>(builders.size()); }

    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        for (const OwnedBuilder& known : builders)
            if (const QrEnum::Action action = e.process(known.get()))
                return action;
        return e.finished();
    }

    /// Releases all builders and frees the memory of the list. The description stays usable; it has
    /// no builders afterwards.
    void dropBuilders() {
        uids = std::vector<QrUid>();
        const Builders dropped = std::exchange(builders, Builders());
    }

  private:
    const wchar_t* label;
    const wchar_t* text;
    Builders builders;
    std::vector<QrUid> uids; ///< `uids[i]` is the uid of `builders[i]`
};

/// Static storage for the description of the library, which is never destroyed.
///
/// The destructors of static objects, of hosts and of the library itself, may still call the entry
/// point. The storage itself disappears when the library is unloaded. The builders are on the heap;
/// `dropBuilders` frees them.
class StaticDescription {
  public:
    constexpr StaticDescription() = default;

    /// Constructs the description and returns it. Must be called only once.
    Description* make(const wchar_t* label, const wchar_t* text, Description::Builders builders) {
        description = new (storage) Description(label, text, std::move(builders));
        return description;
    }

    void dropBuilders() {
        if (description)
            description->dropBuilders();
    }

  private:
    alignas(Description) unsigned char storage[sizeof(Description)]{};
    Description* description = nullptr;
};

} // namespace Mz::Kit

/// Defines the entry point of this component library: `MZ_COMPONENT(label, text, builders...)`.
///
/// Use it once in a library, outside all namespaces. The label and the text are for people. They
/// are stored as pointers and must stay valid until the library is unloaded. Each builder is the
/// result of `Mz::Kit::builderOf` or `Mz::Kit::builder`.
#define MZ_COMPONENT(label, text, ...)                                                             \
    MZ_COMPONENT_STAMP;                                                                            \
    static constinit Mz::Kit::StaticDescription mzComponentDescription;                            \
    static void mzDropComponentBuilders() {                                                        \
        mzComponentDescription.dropBuilders();                                                     \
    }                                                                                              \
    MZ_AT_UNLOAD(mzDropComponentBuilders);                                                         \
    extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {                             \
        static Mz::Kit::Description* const description =                                           \
            mzComponentDescription.make(label, text, {__VA_ARGS__});                               \
        return description;                                                                        \
    }
