// SPDX-License-Identifier: BSL-1.0
/// The rules of builders, and of the objects that they make.
///
/// What the rules of interfaces and references see is found in one inspection of an object, of
/// which each rule reports its part.
#include "components/componentTools/checking/rules.h"

#include "components/componentManager/bufferio.h"
#include "components/componentManager/importBuilder.h"
#include "components/componentManager/importer.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/processControl.h"
#include "components/componentTools/checking/growth.h"
#include "components/componentTools/uidText.h"

#include <functional>

namespace Mz::Tools::Rules {

namespace {

/// The first fault of each kind that an inspection found; empty if there is none.
struct Inspection {
    std::wstring interfaces, castable, references;
};

void note(std::wstring& fault, const std::wstring& sentence) {
    if (fault.empty())
        fault = sentence;
}

/// Asks one object for one interface.
class InterfaceInspection {
  public:
    InterfaceInspection(QrCastable& inspected, const QrUid& wanted, Inspection& found)
        : object(inspected), uid(wanted), result(found) {}

    void run() {
        const ReferenceCount before = countOf(object);
        const bool promised = object.hasInterface(uid);
        noteCount(before, 0, L"hasInterface");
        QrCastable* const view = object.getInterface(uid);
        if ((view != nullptr) != promised)
            note(result.interfaces, L"hasInterface(" + textOf(uid) + L") returns " +
                                        (promised ? L"true" : L"false") + L", but getInterface " +
                                        (view ? L"returns a pointer" : L"returns null") +
                                        L". Let both answer from one list of interfaces.");
        noteCount(before, view ? 1 : 0, L"getInterface");
        if (!view)
            return;
        inspectView(*view);
        view->release();
        noteCount(before, 0, L"the release of an interface");
    }

  private:
    void inspectView(QrCastable& view) {
        const QrCastable& constant = view;
        if (!view.getCastable() || view.getCastable() != constant.getCastable() ||
            view.getCastable() != object.getCastable())
            note(result.castable,
                 L"getCastable of the interface " + textOf(uid) +
                     L" does not return the principal object. Return the same object from every "
                     L"interface, and from both forms of getCastable.");
        QrCastable* const again = view.getInterface(uid);
        if (!again)
            note(result.interfaces, L"the interface " + textOf(uid) +
                                        L" does not know itself: its getInterface returns null. "
                                        L"Answer for it in every view of the object.");
        else
            again->release();
    }

    /// Compares with the count before, if the object counts.
    void noteCount(const ReferenceCount& before, long expected, const wchar_t* function) {
        const ReferenceCount now = countOf(object);
        if (!now.valid)
            note(result.references, L"newReference and release do not return the number of "
                                    L"references minus one. Use QrCastRef to count.");
        else if (before.counted && now.value != before.value + expected)
            note(result.references, std::wstring(function) + L" for the interface " + textOf(uid) +
                                        L" changes the " + L"number of references by " +
                                        std::to_wstring(now.value - before.value) +
                                        L" instead of " + std::to_wstring(expected) +
                                        L". Take one reference for each pointer that is returned.");
    }

    QrCastable& object;
    const QrUid& uid;
    Inspection& result;
};

std::vector<QrUid> knownUids(CheckContext& context) {
    std::vector<QrUid> uids{QrComponentDescription::uid,
                            QrBuilderDescription::uid,
                            QrComponentBuilder::uid,
                            QrImportBuilder::uid,
                            QrImporter::uid,
                            QrPersistant::uid,
                            QrBufferedIO::uid,
                            QrProcessControl::uid,
                            QrComponentManager::uid,
                            QrUid{}};
    for (const DescribedBuilder& builder : context.builders())
        uids.push_back(builder.uid);
    // A uid that no object can know.
    uids.push_back({0x0D9B0F6A, 0x5C3E4B71, 0x8A2F6E0D, 0x417C93B5});
    return uids;
}

Inspection inspect(QrCastable& object, const std::vector<QrUid>& uids) {
    Inspection result;
    const QrCastable& constant = object;
    QrCastable* const principal = object.getCastable();
    if (!principal || principal != constant.getCastable() || principal->getCastable() != principal)
        note(result.castable, L"getCastable does not always return the same object. Return the "
                              L"principal object from both forms, also of the principal itself.");
    for (const QrUid& uid : uids)
        InterfaceInspection(object, uid, result).run();
    return result;
}

/// Calls `use` with each object of the library: the description, the builders and what they make.
void forEachObject(
    CheckContext& context,
    const std::function<void(const std::wstring& place, const wchar_t* kind, QrCastable&)>& use) {
    if (QrComponentDescription* const description = context.description())
        use({}, L"the description", *description);
    for (const DescribedBuilder& described : context.builders()) {
        use(described.place, L"the builder's description",
            const_cast<QrBuilderDescription&>(*described.description));
        const QrPtr<QrComponentBuilder> builder = context.builder(described);
        if (!builder)
            continue;
        use(described.place, L"the builder", *builder);
        if (const QrRef<QrCastable> object = context.object(described, *builder))
            use(described.place, L"the object", *object);
    }
}

/// Reports one part of the inspections of all objects.
void reportInspections(CheckContext& context, std::wstring Inspection::*part) {
    const std::vector<QrUid> uids = knownUids(context);
    forEachObject(context, [&](const std::wstring& place, const wchar_t* kind, QrCastable& object) {
        Inspection found;
        context.attempt(std::wstring(L"the interfaces of ") + kind, place,
                        [&] { found = inspect(object, uids); });
        if (!(found.*part).empty())
            context.report(place, std::wstring(kind) + L": " + found.*part);
    });
}

/// Returns why nothing destroys the objects of a builder; empty if their last release does.
std::wstring whyNotDestroyed(CheckContext& context, const DescribedBuilder& described,
                             QrComponentBuilder& builder) {
    QrRef<QrCastable> first = context.object(described, builder);
    const QrRef<QrCastable> second = context.object(described, builder);
    if (!first || !second || first->getCastable() == second->getCastable())
        return {}; // No object, or one for all clients.
    std::wstring fault;
    context.attempt(L"the release of an object", described.place, [&] {
        const ReferenceCount count = countOf(*first);
        if (!count.counted)
            fault = L"createObject returns a new object at each call, but the objects do not "
                    L"count references, so that nothing destroys them. Use QrCastRef.";
        else if (count.value > 1)
            fault = L"createObject returns an object with " + std::to_wstring(count.value) +
                    L" references, so that its last release does not destroy it. Return one "
                    L"reference; `adopt` takes over a reference that a pointer carries.";
        else if (const long left = first.detach()->release(); left != -1)
            fault = L"the last release of an object returns " + std::to_wstring(left) +
                    L" instead of -1. Let it destroy the object.";
    });
    return fault;
}

} // namespace

void buildersMade(CheckContext& context) {
    QrComponentDescription* const description = context.description();
    for (const DescribedBuilder& described : context.builders()) {
        QrRef<QrCastable> made;
        bool casts = false;
        if (!context.attempt(L"createBuilder", described.place, [&] {
                made = description->createBuilder(described.uid);
                casts = static_cast<bool>(queryCast<QrComponentBuilder>(made.get()));
            }))
            continue;
        if (!made)
            context.report(described.place, L"createBuilder returns null for a builder that the "
                                            L"library describes. Return the builder.");
        else if (!casts)
            context.report(described.place, L"createBuilder returns an object without "
                                            L"QrComponentBuilder. Return the builder.");
    }
}

void builderInterfaces(CheckContext& context) {
    for (const DescribedBuilder& described : context.builders()) {
        const QrPtr<QrComponentBuilder> builder = context.builder(described);
        if (!builder)
            continue;
        context.attempt(L"the interfaces of the builder", described.place, [&] {
            const auto description = queryCast<QrBuilderDescription>(builder.get());
            if (!description && queryCast<QrImportBuilder>(builder.get()))
                context.report(described.place,
                               L"the import builder has no QrBuilderDescription, which importers "
                               L"ask for its label. Let one object support both.");
            if (description && !(description->getUid() == described.uid))
                context.report(described.place, L"createBuilder returns the builder with the uid " +
                                                    textOf(description->getUid()) +
                                                    L". Return the one that was asked for.");
        });
    }
}

void builderItself(CheckContext& context) {
    for (const DescribedBuilder& described : context.builders()) {
        const QrPtr<QrComponentBuilder> builder = context.builder(described);
        if (!builder)
            continue;
        context.attempt(L"getBuilder", described.place, [&] {
            const ReferenceCount before = countOf(*builder);
            const QrRefPtr<QrComponentBuilder> itself = builder->getBuilder();
            if (!itself)
                return context.report(described.place,
                                      L"getBuilder returns null. Return the builder to use.");
            const long taken = countOf(*builder).value - before.value;
            if (before.counted && itself.get() == builder.get() && taken != 1)
                context.report(described.place, L"getBuilder changes the number of references by " +
                                                    std::to_wstring(taken) +
                                                    L" instead of 1. Return one new reference.");
        });
    }
}

void interfacesAgree(CheckContext& context) {
    reportInspections(context, &Inspection::interfaces);
}

void castableConsistent(CheckContext& context) {
    reportInspections(context, &Inspection::castable);
}

void referencesBalanced(CheckContext& context) {
    reportInspections(context, &Inspection::references);
}

void objectsDestroyed(CheckContext& context) {
    for (const DescribedBuilder& described : context.builders())
        if (const QrPtr<QrComponentBuilder> builder = context.builder(described))
            if (const std::wstring why = whyNotDestroyed(context, described, *builder);
                !why.empty())
                context.report(described.place, why);
}

void objectsGrowth(CheckContext& context) {
    for (const DescribedBuilder& described : context.builders()) {
        const QrPtr<QrComponentBuilder> builder = context.builder(described);
        // Objects that nothing destroys are the finding of another rule.
        if (!builder || !context.object(described, *builder) ||
            !whyNotDestroyed(context, described, *builder).empty())
            continue;
        const std::size_t growth =
            growthOf([&] { static_cast<void>(context.object(described, *builder)); }, 100);
        if (growth)
            context.report(described.place,
                           L"each call of createObject leaves about " + std::to_wstring(growth) +
                               L" bytes behind. Free in the destructor of the object what it "
                               L"allocates.");
    }
}

} // namespace Mz::Tools::Rules
