// SPDX-License-Identifier: BSL-1.0
/// The rules of objects that store themselves. They are checked with new objects of each builder
/// and, if there are samples, with imported ones.
#include "components/componentTools/checking/rules.h"

#include "components/componentTools/checking/checkController.h"
#include "components/componentTools/checking/checkObjects.h"
#include "components/componentTools/checking/growth.h"
#include "components/componentTools/checking/importing.h"
#include "components/componentTools/checking/inputs.h"
#include "components/componentTools/uidText.h"

#include <algorithm>

namespace Mz::Tools::Rules {

namespace {

/// An object that stores itself, and the builder of its class.
struct StoredObject {
    const DescribedBuilder* builder; ///< of its class
    std::wstring place;
    QrPtr<QrPersistant> object;
};

const DescribedBuilder* builderOfClass(CheckContext& context, const std::wstring& place,
                                       QrPersistant& object) {
    const DescribedBuilder* builder = nullptr;
    context.attempt(L"getClassUid", place, [&] {
        if (const QrUid* const uid = object.getClassUid())
            builder = context.describedAs(*uid);
    });
    return builder;
}

QrPtr<QrPersistant> persistantOf(CheckContext& context, const std::wstring& place,
                                 const QrRef<QrCastable>& object) {
    QrPtr<QrPersistant> stored;
    context.attempt(L"the interfaces of the object", place,
                    [&] { stored = queryCast<QrPersistant>(object.get()); });
    return stored;
}

/// Returns the objects that can be made again by builders of this library, together with all that
/// they contain.
std::vector<StoredObject> storedObjects(CheckContext& context) {
    std::vector<StoredObject> objects;
    const auto add = [&](const std::wstring& place, const QrRef<QrCastable>& made) {
        const QrPtr<QrPersistant> object = made ? persistantOf(context, place, made) : nullptr;
        const DescribedBuilder* const builder =
            object ? builderOfClass(context, place, *object) : nullptr;
        if (builder && missingClassesInside(context, place, *object).empty())
            objects.push_back({builder, place, object});
    };
    for (const DescribedBuilder& described : context.builders())
        add(described.place, context.object(described));
    if (context.task().samples.empty())
        return objects;
    const CheckInputs inputs(context.task().seed, context.task().samples);
    for (const ImportingBuilder& importing : importBuilders(context))
        for (std::size_t number = 0; number < inputs.fixedCount(); ++number)
            if (const CheckInput input = inputs.at(number); input.valid) {
                CheckController controller;
                ImportTry attempt(importing, input, number);
                if (attempt.canImport(context) && attempt.import(context))
                    add(importing.described->place + L", imported from " + input.name,
                        attempt.object());
            }
    return objects;
}

/// Returns a new object of the class; null if it cannot be made.
QrPtr<QrPersistant> newObject(CheckContext& context, const StoredObject& stored) {
    const QrRef<QrCastable> made = context.object(*stored.builder);
    return made ? persistantOf(context, stored.place, made) : nullptr;
}

std::wstring nameOf(StoredForm form) {
    return form == StoredForm::binary ? L"binary" : L"text";
}

/// Calls `use` with each object and what it writes in binary form, if that is anything.
template <class Use>
void forEachStored(CheckContext& context, Use use) {
    for (const StoredObject& stored : storedObjects(context))
        if (const auto bytes =
                writtenBytes(context, stored.place, *stored.object, StoredForm::binary);
            bytes && !bytes->empty())
            use(stored, *bytes);
}

/// Returns whether a new object can be made and its `read` accepts the bytes.
bool isRead(CheckContext& context, const StoredObject& stored, const std::string& bytes) {
    const QrPtr<QrPersistant> object = newObject(context, stored);
    if (!object)
        return false;
    return readBytes(context, stored.place, *object, StoredForm::binary, bytes);
}

/// Returns the positions at which the data is cut off: all of a short one, else some.
std::vector<std::size_t> cuts(std::size_t size) {
    constexpr std::size_t most = 200;
    std::vector<std::size_t> positions;
    for (std::size_t index = 0; index < std::min(size, most); ++index)
        positions.push_back(size <= most ? index : size * index / most);
    return positions;
}

} // namespace

namespace {

void reportMissingClass(CheckContext& context, const std::wstring& place, const QrUid& uid,
                        const wchar_t* whose) {
    context.reportMissingClass(
        place,
        L"the library has no builder for the class uid " + textOf(uid) + L" of " + whose +
            L", so that they cannot be read. Describe a builder with that uid, or check the "
            L"library together with the one that has it.",
        uid);
}

} // namespace

void classUid(CheckContext& context) {
    for (const DescribedBuilder& described : context.builders()) {
        const QrRef<QrCastable> made = context.object(described);
        const QrPtr<QrPersistant> object =
            made ? persistantOf(context, described.place, made) : nullptr;
        if (!object)
            continue;
        const QrUid* uid = nullptr;
        QrUid value{};
        if (!context.attempt(L"getClassUid", described.place, [&] {
                uid = object->getClassUid();
                value = uid ? *uid : QrUid{};
            }))
            continue;
        if (!uid)
            context.report(described.place, L"getClassUid returns null. Return the uid of the "
                                            L"builder that makes objects of this class.");
        else if (!context.describedAs(value))
            reportMissingClass(context, described.place, value, L"its objects");
        for (const QrUid& missing : missingClassesInside(context, described.place, *object))
            reportMissingClass(context, described.place, missing,
                               L"objects that its objects contain");
    }
}

void roundTrip(CheckContext& context) {
    for (const StoredObject& stored : storedObjects(context))
        for (const StoredForm form : {StoredForm::binary, StoredForm::text}) {
            const auto first = writtenBytes(context, stored.place, *stored.object, form);
            // Not every value has a text form.
            if (!first && form == StoredForm::binary && context.lastWasStreamException())
                context.report(stored.place,
                               L"write throws in " + nameOf(form) + L" form: " +
                                   context.lastException() +
                                   L" Let an object be saved in every state. A long or wchar_t "
                                   L"that does not fit the stream's width throws.");
            const QrPtr<QrPersistant> copy = first ? newObject(context, stored) : nullptr;
            if (!copy)
                continue;
            if (!readBytes(context, stored.place, *copy, form, *first)) {
                if (context.lastWasStreamException())
                    context.report(stored.place, L"read does not accept what write wrote in " +
                                                     nameOf(form) + L" form: " +
                                                     context.lastException() +
                                                     L" Read the values that are written, in the "
                                                     L"same order.");
                continue;
            }
            const auto second = writtenBytes(context, stored.place, *copy, form);
            if (second && *second != *first)
                context.report(stored.place,
                               L"an object that was written and read writes other bytes in " +
                                   nameOf(form) + L" form (" + std::to_wstring(first->size()) +
                                   L" bytes, then " + std::to_wstring(second->size()) +
                                   L"). Write and read the whole state.");
        }
}

void inPieces(CheckContext& context) {
    forEachStored(context, [&](const StoredObject& stored, const std::string& bytes) {
        const QrPtr<QrPersistant> whole = newObject(context, stored);
        const QrPtr<QrPersistant> copy = newObject(context, stored);
        if (!whole || !copy)
            return;
        if (!readBytes(context, stored.place, *whole, StoredForm::binary, bytes))
            return;
        const auto expected = writtenBytes(context, stored.place, *whole, StoredForm::binary);
        const bool read = readBytes(context, stored.place, *copy, StoredForm::binary, bytes,
                                    Supply::pieces, L"in pieces of three bytes");
        const auto again =
            read ? writtenBytes(context, stored.place, *copy, StoredForm::binary) : std::nullopt;
        if (!read || again != expected)
            context.report(stored.place, L"read fails on input that comes in pieces and has no "
                                         L"positions, like a pipe. Read values in their order, "
                                         L"and do not seek.");
    });
}

void truncated(CheckContext& context) {
    forEachStored(context, [&](const StoredObject& stored, const std::string& bytes) {
        if (!isRead(context, stored, bytes))
            return; // The finding of another rule.
        for (const std::size_t size : cuts(bytes.size())) {
            const QrPtr<QrPersistant> object = newObject(context, stored);
            if (!object)
                continue;
            const std::wstring detail = L"the first " + std::to_wstring(size) + L" of " +
                                        std::to_wstring(bytes.size()) + L" bytes";
            if (!readBytes(context, stored.place, *object, StoredForm::binary,
                           bytes.substr(0, size), Supply::whole, detail))
                continue;
            context.report(stored.place, L"read accepts " + detail +
                                             L". Throw QrStreamEx::ExReadError if a value is "
                                             L"missing; the stream's >> does.");
            return;
        }
    });
}

void freedAfterFailure(CheckContext& context) {
    forEachStored(context, [&](const StoredObject& stored, const std::string& bytes) {
        const std::string half = bytes.substr(0, bytes.size() / 2);
        const auto readHalf = [&] { return isRead(context, stored, half); };
        const auto readAll = [&] { static_cast<void>(isRead(context, stored, bytes)); };
        if (readHalf())
            return; // The finding of another rule.
        const std::size_t growth = growthOf([&] { static_cast<void>(readHalf()); }, 100);
        if (growth == 0)
            return;
        // An object that leaks anyway is the finding of another rule.
        if (growthOf(readAll, 100) == 0)
            context.report(stored.place, L"each read that fails leaves about " +
                                             std::to_wstring(growth) +
                                             L" bytes behind. Hold what read allocates in objects "
                                             L"that free it.");
    });
}

void damagedObjects(CheckContext& context) {
    forEachStored(context, [&](const StoredObject& stored, const std::string& bytes) {
        const CheckTask& task = context.task();
        const auto readChanged = [&](std::size_t number) {
            const QrPtr<QrPersistant> object = newObject(context, stored);
            if (object)
                readBytes(context, stored.place, *object, StoredForm::binary,
                          changedBytes(bytes, task.seed, number), Supply::whole,
                          L"changed data " + std::to_wstring(number),
                          reproduction("persistant-damaged", *stored.builder, number, task));
        };
        forEachNumber(task, 64, readChanged);
    });
}

} // namespace Mz::Tools::Rules
