// SPDX-License-Identifier: BSL-1.0
/// Messages are JSON in frames, as those of a check. JSON is written in ASCII, so that the two
/// processes need not have the same locale. Times are whole nanoseconds.
#include "components/componentTools/profiling/profileMessages.h"

#include "components/componentManager/utf8.h"
#include "components/componentTools/probing/frames.h"
#include "components/componentTools/records/json.h"

#include <stdexcept>

namespace Mz::Tools {

namespace {

using std::chrono::nanoseconds;

/// The kind of the frames. Probes and checks have others.
constexpr unsigned char profileKind = 128;

std::string messageOf(const Json& value) {
    return frameOf(profileKind, asciiOf(value));
}

Json jsonOf(const Finding& finding) {
    return {{"verdict", nameOf(finding.verdict)},
            {"subject", toUtf8(finding.subject)},
            {"words", toUtf8(finding.words)}};
}

Finding findingIn(const Json& value) {
    const auto verdict = verdictNamed(value.at("verdict").get<std::string>());
    if (!verdict)
        throw std::runtime_error("unknown verdict");
    return {*verdict, fromUtf8(value.at("subject").get<std::string>()),
            fromUtf8(value.at("words").get<std::string>())};
}

/// Reads the messages of one process.
class ReportReader {
  public:
    ReportReader(ProfileReport& target, std::size_t count) : report(target), candidates(count) {}

    /// \throws std::exception if the message is invalid
    void read(const Json& value) {
        const std::string kind = value.at("kind");
        if (kind == "begin")
            report.current = indexIn(value);
        else if (kind == "stage")
            report.stage = stageIn(value);
        else if (kind == "fault")
            report.fault = findingIn(value);
        else if (kind == "steps")
            readSteps(value);
        else if (kind == "others")
            readOthers(value);
        else if (kind == "listing")
            finish(report.listing, value.at("time"));
        else if (kind == "whole")
            readWhole(value);
        else if (kind == "otherFolders")
            report.otherFolders = true;
        else
            throw std::runtime_error("unknown kind of message");
    }

  private:
    static nanoseconds timeIn(const Json& value) {
        const std::int64_t time = integerOf(value);
        if (time < 0)
            throw std::runtime_error("invalid time");
        return nanoseconds(time);
    }

    std::size_t indexIn(const Json& value) const {
        const auto index = static_cast<std::size_t>(integerOf(value.at("index")));
        if (index >= candidates)
            throw std::runtime_error("unknown candidate");
        return index;
    }

    static Stage stageIn(const Json& value) {
        const auto stage = integerOf(value.at("stage"));
        if (stage < 0 || stage > static_cast<std::int64_t>(Stage::enumerating))
            throw std::runtime_error("unknown stage");
        return static_cast<Stage>(stage);
    }

    void readSteps(const Json& value) {
        LibrarySteps steps;
        steps.index = indexIn(value);
        const Json& times = value.at("times");
        if (times.size() != startPhaseCount)
            throw std::runtime_error("unknown phases");
        for (std::size_t phase = 0; phase < startPhaseCount; ++phase)
            steps.times[phase] = timeIn(times.at(phase));
        steps.verdict = findingIn(value);
        report.libraries.push_back(std::move(steps));
        report.current.reset();
    }

    void readOthers(const Json& value) {
        report.otherFiles = static_cast<std::size_t>(integerOf(value.at("count")));
        report.otherTime = timeIn(value.at("time"));
    }

    void readWhole(const Json& value) {
        if (value.contains("reading"))
            report.listReading = timeIn(value.at("reading"));
        finish(report.initialize, value.at("time"));
    }

    void finish(nanoseconds& target, const Json& value) {
        target = timeIn(value);
        report.done = true;
    }

    ProfileReport& report;
    std::size_t candidates;
};

} // namespace

std::string encodeTask(const ProfileTask& task) {
    return asciiOf(
        {{"whole", task.whole}, {"candidates", task.candidates}, {"excluded", task.excluded}});
}

ProfileTask decodeProfileTask(const std::string& text) {
    const Json value = jsonIn(text);
    ProfileTask task;
    value.at("whole").get_to(task.whole);
    value.at("candidates").get_to(task.candidates);
    value.at("excluded").get_to(task.excluded);
    return task;
}

std::string encodeLibraryBegin(std::size_t index) {
    return messageOf({{"kind", "begin"}, {"index", index}});
}

std::string encodeProfileStage(Stage stage) {
    return messageOf({{"kind", "stage"}, {"stage", static_cast<unsigned int>(stage)}});
}

std::string encodeProfileFault(Verdict verdict, const std::wstring& subject,
                               const std::wstring& words) {
    Json value = jsonOf(Finding{verdict, subject, words});
    value["kind"] = "fault";
    return messageOf(value);
}

std::string encodeSteps(const LibrarySteps& steps) {
    Json value = jsonOf(steps.verdict);
    value["kind"] = "steps";
    value["index"] = steps.index;
    value["times"] = Json::array();
    for (const nanoseconds time : steps.times)
        value["times"].push_back(time.count());
    return messageOf(value);
}

std::string encodeOthers(std::size_t count, nanoseconds time) {
    return messageOf({{"kind", "others"}, {"count", count}, {"time", time.count()}});
}

std::string encodeListing(nanoseconds time) {
    return messageOf({{"kind", "listing"}, {"time", time.count()}});
}

std::string encodeWhole(std::optional<nanoseconds> listReading, nanoseconds initialize) {
    Json value{{"kind", "whole"}, {"time", initialize.count()}};
    if (listReading)
        value["reading"] = listReading->count();
    return messageOf(value);
}

std::string encodeOtherFolders() {
    return messageOf({{"kind", "otherFolders"}});
}

ProfileReport decodeProfileReport(std::string_view bytes, std::size_t candidates) {
    ProfileReport report;
    ReportReader reader(report, candidates);
    FrameReader frames(bytes);
    while (const std::optional<Frame> frame = frames.next()) {
        try {
            if (frame->kind != profileKind)
                throw std::runtime_error("unknown kind of frame");
            reader.read(jsonIn(frame->payload));
        } catch (const std::exception&) {
            report.garbled = true;
            return report;
        }
    }
    report.garbled = frames.garbled();
    return report;
}

} // namespace Mz::Tools
