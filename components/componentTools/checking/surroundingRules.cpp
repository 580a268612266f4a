// SPDX-License-Identifier: BSL-1.0
/// The rules of the surroundings that one process can check: threads, and memory that runs out.
#include "components/componentTools/checking/rules.h"

#include "components/componentTools/checking/allocationLimit.h"
#include "components/componentTools/checking/checkController.h"
#include "components/componentTools/checking/checkObjects.h"
#include "components/componentTools/checking/importing.h"
#include "components/componentTools/probing/exceptionText.h"

#include <array>
#include <atomic>
#include <chrono>
#include <mutex>
#include <optional>
#include <thread>

namespace Mz::Tools {

namespace {

const AllocationLimit* limitOfProgram = nullptr;

} // namespace

const AllocationLimit* allocationLimit() {
    return limitOfProgram;
}

void setAllocationLimit(const AllocationLimit* limit) {
    limitOfProgram = limit;
}

namespace Rules {

namespace {

/// Calls the library again and again, each time with one more allocation before the failure.
/// Whether the call returns or throws is up to the library; it must only survive.
/// \param prepare  runs before each call, without the limit
void callWithLimits(
    CheckContext& context, const std::wstring& what, const std::wstring& place,
    const std::function<void()>& call, const std::function<void()>& prepare = [] {}) {
    const AllocationLimit& limit = *allocationLimit();
    constexpr int most = 300;
    for (int allowed = 0; allowed < most; ++allowed) {
        bool reached = false;
        prepare();
        context.attempt(
            what, place,
            [&] {
                limit.set(allowed);
                try {
                    call();
                } catch (...) {
                    limit.set(-1);
                    reached = true;
                    throw;
                }
                reached = limit.reached();
                limit.set(-1);
            },
            L"the allocation " + std::to_wstring(allowed + 1) + L" fails");
        if (!reached)
            return;
    }
}

} // namespace

void failingAllocations(CheckContext& context) {
    QrComponentDescription* const description = context.description();
    if (!allocationLimit())
        return context.messages().skipped();
    if (!description)
        return;
    for (const DescribedBuilder& described : context.builders()) {
        const QrPtr<QrComponentBuilder> builder = context.builder(described);
        if (!builder || context.isAvoided(L"createObject", described.place))
            continue;
        callWithLimits(context, L"createObject without memory", described.place,
                       [&] { static_cast<void>(builder->createObject()); });
        callWithLimits(context, L"createBuilder without memory", described.place,
                       [&] { static_cast<void>(description->createBuilder(described.uid)); });
    }
    const CheckInputs inputs(context.task().seed, context.task().samples);
    for (const ImportingBuilder& importing : importBuilders(context)) {
        const std::wstring& place = importing.described->place;
        if (context.isAvoided(L"canImport", place) || context.isAvoided(L"import", place))
            continue;
        CheckController controller;
        std::optional<ImportTry> attempt;
        callWithLimits(
            context, L"import without memory", place, [&] { attempt->importUnguarded(); },
            [&] { attempt.emplace(importing, inputs.at(0), 0); });
    }
}

void fromThreads(CheckContext& context) {
    QrComponentDescription* const description = context.description();
    if (!context.task().threadSafe)
        return context.messages().skipped();
    if (!description)
        return;
    for (const DescribedBuilder& described : context.builders()) {
        const QrPtr<QrComponentBuilder> builder = context.builder(described);
        if (!builder || context.isAvoided(L"createObject", described.place))
            continue;
        const bool makes = static_cast<bool>(context.object(described, *builder));
        std::atomic<int> failures{0};
        std::wstring text;
        std::mutex textMutex;
        const auto work = [&] {
            try {
                const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(1);
                for (int round = 0; round < 500 && std::chrono::steady_clock::now() < end; ++round)
                    if (static_cast<bool>(builder->createObject()) != makes)
                        ++failures;
            } catch (...) {
                ++failures;
                const std::lock_guard lock(textMutex);
                text = exceptionText();
            }
        };
        context.attempt(L"createObject from 8 threads", described.place, [&] {
            std::array<std::thread, 8> threads;
            for (std::thread& thread : threads)
                thread = std::thread(work);
            for (std::thread& thread : threads)
                thread.join();
        });
        if (failures)
            context.report(described.place,
                           L"createObject fails when 8 threads call it at a time" +
                               (text.empty() ? std::wstring() : L": " + text) +
                               L". Guard what the builder shares, or do not declare the library "
                               L"thread-safe.");
    }
}

} // namespace Rules

} // namespace Mz::Tools
