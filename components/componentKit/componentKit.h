/// What makes writing a component library short. Header-only.
///
/// A component library is a handful of builders and one line that names them:
///
///     MZ_COMPONENT(L"Greetings", L"Says hello in several languages",
///                  Mz::Kit::builderOf<Greeter>({.uid = greeterUid, .name = L"greeter"}))
///
/// The rest of this file writes out, once, what `componentImp.h` asks of a component library. A
/// library that needs something else implements those interfaces by hand; both ways mix freely.
#pragma once

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

/// The identity of a builder, which is not nil: a builder with a constant identity whose four words
/// are 0, or with none, does not compile.
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

/// What a builder says of itself. The texts are kept as pointers, so they must live as long as the
/// library; literals do.
struct BuilderInfo {
    BuilderUid uid;             ///< the builder's identity; make a new one for each builder
    const wchar_t* name = L"";  ///< by which importers find it
    const wchar_t* label = L""; ///< for people; importers show it in file dialogs
    const wchar_t* text = L"";  ///< a longer one
    unsigned int number = 0;    ///< whatever you agree on with your clients
    bool flag = false;          ///< likewise
};

/// Adds to `Casts`, which gives a builder its casting and its lifetime, that it describes itself
/// and stands for itself. What is left to write is `createObject`.
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

    /// The manager takes these two from the library's description.
    const wchar_t* getComponentLabel() const override { return L""; }
    const wchar_t* getComponentText() const override { return L""; }

    QrRefPtr<QrComponentBuilder> getBuilder() override { return this; }
    QrCRefPtr<QrComponentBuilder> getBuilder() const override { return this; }

  private:
    BuilderInfo info;
};

/// The base of a builder, `Impl`, that also answers for `Ifaces`. What is left to write is
/// `createObject` and the operations of `Ifaces`.
///
/// Counted, so it stands on the heap.
template <class Impl, class... Ifaces>
class Builder
    : public SelfDescribing<QrCastRef<
          QrCastHeap<QrCastMulti<Impl, QrBuilderDescription, QrComponentBuilder, Ifaces...>>>> {
  public:
    using SelfDescribing<QrCastRef<QrCastHeap<
        QrCastMulti<Impl, QrBuilderDescription, QrComponentBuilder, Ifaces...>>>>::SelfDescribing;
};

/// A builder that makes each object with `new Object`. `Object` is counted (`QrCastRef`).
///
/// The builder is not: each object would pay for six references to it. It lives as long as its
/// owner, the library's description.
template <class Object>
class ObjectBuilder final
    : public SelfDescribing<
          QrCastMulti<ObjectBuilder<Object>, QrComponentBuilder, QrBuilderDescription>> {
  public:
    using SelfDescribing<QrCastMulti<ObjectBuilder<Object>, QrComponentBuilder,
                                     QrBuilderDescription>>::SelfDescribing;

    /// As the root's, which stand in another library.
    long newReference() override { return 1; }
    long release() override { return 1; }

    /// Nobody counts this reference, so nobody is asked for it.
    QrRefPtr<QrComponentBuilder> getBuilder() override {
        return QrRefPtr<QrComponentBuilder>::adopt(this);
    }
    QrCRefPtr<QrComponentBuilder> getBuilder() const override {
        return QrCRefPtr<QrComponentBuilder>::adopt(this);
    }

    QrRef<QrCastable> createObject() override {
        static_assert(!std::is_same_v<decltype(&Object::newReference), long (QrCastable::*)()>,
                      "the object is counted (QrCastRef), or nobody would ever delete it");
        return (new Object)->getCastable(); // The result takes the first reference.
    }
};

/// A builder that makes objects of foreign files. What is left to write is the two operations on a
/// buffer, `canImport` and `import`.
template <class Impl>
class ImportBuilder : public Builder<Impl, QrImportBuilder> {
  public:
    /// `extensions` without dot or wildcard, kept as pointers like all texts.
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

    /// There is no such object without a file.
    QrRef<QrCastable> createObject() override { return nullptr; }

  private:
    std::vector<const wchar_t*> extensions;
};

/// The end of a chain of casts (`QrCastImpl2`) for an object whose interface derives from another
/// one, `Base`, for which it answers as well:
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

/// How a library's description owns a builder: by a reference if the builder counts, else alone.
using OwnedBuilder = std::shared_ptr<QrBuilderDescription>;

/// A new object of class `T`, which is counted and answers for `QrBuilderDescription`.
template <class T, class... Args>
OwnedBuilder builder(Args&&... args) {
    return OwnedBuilder(QrPtr<T>(new T(std::forward<Args>(args)...)).detach(),
                        [](T* counted) { counted->release(); });
}

/// A builder that makes objects of class `Object`.
template <class Object>
OwnedBuilder builderOf(const BuilderInfo& info) {
    return std::make_shared<ObjectBuilder<Object>>(info);
}

/// What the library says of itself. Not counted: the entry point keeps one for all callers, from
/// the first call until the library is unloaded.
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

    /// Releases all builders and the memory that they were kept in. The description stays usable
    /// and has none from now on.
    void dropBuilders() {
        uids = std::vector<QrUid>();
        const Builders dropped = std::exchange(builders, Builders());
    }

  private:
    const wchar_t* label;
    const wchar_t* text;
    Builders builders;
    std::vector<QrUid> uids; ///< of the builders, each in its place
};

/// The place of a library's description, which is never destroyed: hosts may ask for it in the
/// destructors of their static objects, and the library itself in its own. Static storage goes with
/// the library; what the description owns elsewhere, its builders, `dropBuilders` frees.
class StaticDescription {
  public:
    constexpr StaticDescription() = default;

    /// Makes the description. To be called once.
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

/// Defines the entry point of this component library: `MZ_COMPONENT(label, text, builders...)`. The
/// label and the text are shown to people; each builder is the result of `Mz::Kit::builderOf` or
/// `Mz::Kit::builder`. Use it once in a library, outside all namespaces.
#define MZ_COMPONENT(label, text, ...)                                                             \
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
