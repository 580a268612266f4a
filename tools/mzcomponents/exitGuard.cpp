// SPDX-License-Identifier: BSL-1.0
/// The guard is an exit handler, so it works without cooperation of the component. It runs after
/// the destructors of the components' static objects, which were constructed later. It ends the
/// process itself, because a handler cannot change the status that was passed to `exit`.
#include "tools/mzcomponents/exitGuard.h"
#include "tools/mzcomponents/commands.h"
#include "tools/mzcomponents/output.h"

#include <cstdlib>
#include <mutex>
#include <type_traits>
#include <utility>

namespace Mz::Commands {

namespace {

/// The state of the guard. The mutex is needed because a component's thread may call `exit`. Never
/// destroyed, because exit handlers use it.
struct State {
    std::mutex mutex;
    std::wstring activity;
    bool guarded = false, done = false;
};

State& state() {
    static State& only = *new State;
    return only;
}

std::wstring exchangeActivity(std::wstring activity) {
    const std::lock_guard lock(state().mutex);
    return std::exchange(state().activity, std::move(activity));
}

void onExit() {
    std::wstring text = L"a component ended the program";
    {
        const std::lock_guard lock(state().mutex);
        if (state().done)
            return;
        if (!state().activity.empty())
            text += L" while " + state().activity;
    }
    flushResults();
    printError(text);
    std::_Exit(exitFailure);
}

} // namespace

void guardExit() {
    if (!std::exchange(state().guarded, true))
        std::atexit(onExit);
}

void commandIsDone() {
    const std::lock_guard lock(state().mutex);
    state().done = true;
}

Activity::Activity(std::wstring what) : outer(exchangeActivity(std::move(what))) {}

Activity::~Activity() {
    exchangeActivity(std::move(outer));
}

} // namespace Mz::Commands
