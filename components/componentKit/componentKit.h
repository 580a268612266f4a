// SPDX-License-Identifier: BSL-1.0
/// Templates and a macro that keep the source of a component library short. Header-only.
///
/// A component library consists of a few classes and one line that lists their builders:
///
///     class WorldGreeter final : public Mz::Kit::Object<WorldGreeter, Greeter> { … };
///
///     MZ_COMPONENT(L"Greetings", L"Says hello in several languages",
///                  Mz::Kit::builderOf<WorldGreeter>({.uid = greeterUid, .name = L"greeter"}))
///
/// This header includes the whole kit for components, one header for each thought:
///
/// - `object.h`: counted objects with interfaces
/// - `builder.h`: builders, and what describes them
/// - `importBuilder.h`, `importer.h`: imports of foreign files
/// - `translation.h`: interfaces that one object supplies for another
/// - `uidLiteral.h`: uids as text
///
/// This file implements the interfaces that `componentImp.h` requires of a component library. A
/// library with other needs implements those interfaces by hand. It can combine both.
///
/// Mistakes that the compiler can find are errors with a sentence that names the mistake and the
/// remedy.
#pragma once

#include "components/componentKit/builder.h"
#include "components/componentKit/importBuilder.h"
#include "components/componentKit/importer.h"
#include "components/componentKit/object.h"
#include "components/componentKit/stamp.h"
#include "components/componentKit/translation.h"
#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/componentImp.h"

#include <algorithm>
#include <cstddef>
#include <new>
#include <utility>
#include <vector>

namespace Mz::Kit {

/// The description of the component library. It is not counted: the entry point returns the same
/// object to all callers, from the first call until the library is unloaded.
class Description final : public QrCastImpl<Description, QrComponentDescription> {
  public:
    using Builders = std::vector<OwnedBuilder>; ///< in the order in which they are enumerated

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
    template <class... Plans>
    Description* make(const wchar_t* label, const wchar_t* text, const Plans&... plans) {
        Description::Builders builders;
        builders.reserve(sizeof...(plans));
        (builders.push_back(plans), ...);
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
///
/// Two builders must not have the same uid. Two equal constants do not compile, unless another
/// builder in the list has a uid that is known at run time only, or is made with arguments. The uid
/// of a class that is passed as `Mz::Kit::builder<Class>()` takes part if the class has it as a
/// constant named `builderUid`.
#define MZ_COMPONENT(label, text, ...)                                                             \
    MZ_COMPONENT_STAMP;                                                                            \
    static constinit Mz::Kit::StaticDescription mzComponentDescription;                            \
    static void mzDropComponentBuilders() {                                                        \
        mzComponentDescription.dropBuilders();                                                     \
    }                                                                                              \
    MZ_AT_UNLOAD(mzDropComponentBuilders);                                                         \
    static_assert(__builtin_constant_p(Mz::Kit::detail::uidsDiffer(__VA_ARGS__))                   \
                      ? Mz::Kit::detail::uidsDiffer(__VA_ARGS__)                                   \
                      : true,                                                                      \
                  "two builders of this component have the same uid: make a new one for each");    \
    extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {                             \
        static Mz::Kit::Description* const description =                                           \
            mzComponentDescription.make(label, text __VA_OPT__(, ) __VA_ARGS__);                   \
        return description;                                                                        \
    }
