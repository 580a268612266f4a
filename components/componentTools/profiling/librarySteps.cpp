// SPDX-License-Identifier: BSL-1.0
/// Calls the functions of the platform layer, and of the libraries, that the manager calls, in its
/// order. Where the manager only needs one call for two phases (it probes and loads a file in one),
/// the two calls within it are made one after the other.
///
/// The index and the records are not the manager's, but of equal size. What else the manager does
/// is small, and visible as the difference to its own time.
#include "components/componentTools/profiling/librarySteps.h"

#include "components/componentManager/recordFormat.h"
#include "components/componentTools/images/libraryImage.h"
#include "components/componentTools/probing/fatalFaults.h"
#include "components/platform/platform.h"

#include <numeric>
#include <utility>

namespace Mz::Tools {

namespace {

/// How often the parent process receives a sign of life while no library is loaded.
constexpr std::size_t othersPerMessage = 256;

Finding registered(std::size_t count) {
    if (count == 0)
        return {Verdict::offersNothing, {}, {}};
    return {Verdict::works, std::to_wstring(count), {}};
}

/// Returns the finding for the current exception, with the stage in which it was thrown.
Finding thrownIn(Stage stage) {
    Finding finding = exceptionFinding(Verdict::threw);
    if (finding.verdict == Verdict::outOfMemory)
        finding = {Verdict::threw, {}, L"std::bad_alloc"};
    finding.subject = nameOf(stage);
    return finding;
}

} // namespace

/// Copies each builder description into a record and enters it in the index.
class StartSteps::Registration final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Registration(Index& target, Builders& records, PhaseClock& running)
        : index(target), builders(records), clock(running) {}

    Action process(QrCPtr<QrBuilderDescription> item) override {
        clock.enter(StartPhase::registration);
        wrongItem = item ? L"an object of another interface" : L"null";
        {
            const auto description =
                QrCPtr<QrBuilderDescription>::adopt(safeCast<QrBuilderDescription>(item.get()));
            wrongItem = nullptr;
            builders.push_back(std::make_unique<RecordedBuilder>());
            RecordedBuilder& record = *builders.back();
            Mz::detail::copyDescription(*description, record);
            index[record.uid] = &record;
        }
        clock.enter(StartPhase::description);
        return Continue;
    }

    /// What the last item was, if it was no builder description; else null.
    const wchar_t* wrongItem = nullptr;

  private:
    Index& index;
    Builders& builders;
    PhaseClock& clock;
};

StartSteps::StartSteps(const std::vector<StartFile>& candidates,
                       const std::set<std::size_t>& exceptions,
                       std::function<void(const std::string&)> write)
    : files(candidates), excluded(exceptions), send(std::move(write)) {}

void StartSteps::run() {
    for (std::size_t index = 0; index < files.size(); ++index)
        examine(index);
    send(encodeOthers(otherFiles, otherTime));
}

void StartSteps::examine(std::size_t index) {
    const platform::NativePath path = files[index].openingPath();
    PhaseClock clock;
    clock.enter(StartPhase::check);
    const auto status = platform::queryFile(path);
    const bool unchanged = status && isUnchanged(files[index], *status);
    clock.pause();
    if (unchanged && !files[index].record->builders.empty())
        return restore(index, clock);
    if (!status || unchanged || excluded.contains(index))
        return noteOther(clock);
    clock.enter(StartPhase::probe);
    const bool exported = status->regular && platform::exportsFunction(path, entryPointName);
    clock.pause();
    if (!exported)
        return noteOther(clock);
    send(encodeLibraryBegin(index));
    LibrarySteps steps;
    steps.index = index;
    steps.verdict = load(path, clock);
    clock.pause();
    steps.times = clock.times();
    send(encodeSteps(steps));
}

/// Registers the builders of an unchanged library from its record.
void StartSteps::restore(std::size_t index, PhaseClock& clock) {
    const std::vector<RecordedBuilder>& builders = files[index].record->builders;
    clock.enter(StartPhase::registration);
    for (std::size_t builder = builders.size(); builder-- > 0;)
        builderIndex[builders[builder].uid] = &builders[builder];
    clock.pause();
    LibrarySteps steps;
    steps.index = index;
    steps.times = clock.times();
    steps.verdict = {Verdict::recordedUnchanged, std::to_wstring(builders.size()), {}};
    send(encodeSteps(steps));
}

void StartSteps::noteOther(const PhaseClock& clock) {
    const PhaseTimes& times = clock.times();
    otherTime += std::accumulate(times.begin(), times.end(), std::chrono::nanoseconds(0));
    if (++otherFiles % othersPerMessage == 0)
        send(encodeOthers(otherFiles, otherTime));
}

Finding StartSteps::load(const platform::NativePath& path, PhaseClock& clock) {
    send(encodeProfileStage(Stage::loading));
    clock.enter(StartPhase::load);
    const platform::Module module = platform::loadLibrary(path);
    clock.pause();
    if (!module)
        return {Verdict::loadFailed, {}, {}};
    send(encodeProfileStage(Stage::entryPoint));
    clock.enter(StartPhase::description);
    const auto entryPoint = reinterpret_cast<QrGetComponentDescriptionFunction*>(
        platform::findSymbol(module, entryPointName));
    const Finding finding =
        entryPoint ? describe(entryPoint, clock) : Finding{Verdict::entryPointNoFunction, {}, {}};
    const bool sound =
        finding.verdict == Verdict::works || finding.verdict == Verdict::offersNothing;
    if (!sound) {
        clock.enter(StartPhase::description);
        platform::unloadLibrary(module);
    }
    return finding;
}

Finding StartSteps::describe(QrGetComponentDescriptionFunction* entryPoint, PhaseClock& clock) {
    const auto tell = [&](Stage stage) {
        clock.pause();
        send(encodeProfileStage(stage));
        clock.enter(StartPhase::description);
    };
    Stage stage = Stage::entryPoint;
    const wchar_t* wrongItem = nullptr;
    try {
        QrPtr<QrCastable> described = entryPoint();
        if (!described)
            return {Verdict::nullDescription, {}, {}};
        QrPtr<QrComponentDescription> description =
            queryCast<QrComponentDescription>(described.get());
        described = nullptr;
        if (!description)
            return {Verdict::wrongInterface, {}, {}};
        tell(stage = Stage::describing);
        std::wstring label, text;
        int64 value = 0;
        static_cast<void>(Mz::detail::copyDescription(*description, value, text, label));
        tell(stage = Stage::enumerating);
        Registration registration(builderIndex, records.emplace_back(), clock);
        try {
            description->enumerateBuilders(registration);
        } catch (...) {
            wrongItem = registration.wrongItem;
            throw;
        }
        description = nullptr;
        return registered(records.back().size());
    } catch (const QrComponentManagerEx::ExBadCast&) {
        return wrongItem ? Finding{Verdict::wrongItem, wrongItem, {}} : thrownIn(stage);
    } catch (...) {
        return thrownIn(stage);
    }
}

} // namespace Mz::Tools
