// SPDX-License-Identifier: BSL-1.0
/// Messages are JSON in frames. JSON is written in ASCII, so that the two processes need not have
/// the same locale.
#include "components/componentTools/checking/checkMessages.h"

#include "components/componentManager/utf8.h"
#include "components/componentTools/probing/frames.h"
#include "components/componentTools/records/json.h"

namespace Mz::Tools {

namespace {

/// The kind of the frames; the kinds of a probe are smaller.
constexpr unsigned char checkKind = 64;

std::string messageOf(const Json& value) {
    return frameOf(checkKind, asciiOf(value));
}

std::string hexOf(const std::string& bytes) {
    constexpr const char* digits = "0123456789abcdef";
    std::string text;
    for (const char byte : bytes) {
        text += digits[static_cast<unsigned char>(byte) >> 4];
        text += digits[static_cast<unsigned char>(byte) & 15];
    }
    return text;
}

std::wstring wideAt(const Json& value, const char* name) {
    return fromUtf8(value.at(name).get<std::string>());
}

Json wordsOf(const QrUid& uid) {
    return Json::array({uid.w0, uid.w1, uid.w2, uid.w3});
}

QrUid uidAt(const Json& value, const char* name) {
    const Json& words = value.at(name);
    return {words.at(0), words.at(1), words.at(2), words.at(3)};
}

void readFinding(const Json& value, CheckReport& report) {
    CheckFinding finding;
    finding.rule = findCheckRule(value.at("rule").get<std::string>());
    finding.place = wideAt(value, "place");
    finding.sentence = wideAt(value, "sentence");
    finding.reproduce = value.at("reproduce").get<std::string>();
    finding.missingClass = uidAt(value, "missingClass");
    if (finding.rule)
        report.findings.push_back(std::move(finding));
}

void readBuilder(const Json& value, CheckReport& report) {
    CheckedBuilder builder;
    builder.name = wideAt(value, "name");
    builder.uid = uidAt(value, "uid");
    report.builders.push_back(std::move(builder));
}

void readMessage(const Json& value, CheckReport& report) {
    const std::string kind = value.at("kind");
    if (kind == "rule") {
        report.rule = value.at("id");
        report.activity = {};
    } else if (kind == "activity") {
        report.activity = {value.at("key"), wideAt(value, "what"), wideAt(value, "place"),
                           wideAt(value, "detail"), value.at("reproduce")};
    } else if (kind == "finding") {
        readFinding(value, report);
    } else if (kind == "builder") {
        readBuilder(value, report);
    } else if (kind == "answer") {
        report.answers[wideAt(value, "key")] = value.at("value").get<std::string>();
    } else if (kind == "skipped") {
        report.skipped.push_back(report.rule);
    } else if (kind == "fault") {
        report.fault = wideAt(value, "text");
    } else if (kind == "done") {
        report.done = true;
    }
}

} // namespace

std::string encodeTask(const CheckTask& task) {
    return asciiOf({{"rules", task.rules},
                    {"avoided", task.avoided},
                    {"seed", task.seed},
                    {"fuzz", task.fuzzMilliseconds},
                    {"threadSafe", task.threadSafe},
                    {"builder", task.builder},
                    {"input", task.input},
                    {"memoryPattern", task.memoryPattern},
                    {"otherLocale", task.otherLocale},
                    {"otherFolder", task.otherFolder},
                    {"noInput", task.noInput}});
}

CheckTask decodeCheckTask(const std::string& text) {
    const Json value = jsonIn(text);
    CheckTask task;
    value.at("rules").get_to(task.rules);
    value.at("avoided").get_to(task.avoided);
    value.at("seed").get_to(task.seed);
    value.at("fuzz").get_to(task.fuzzMilliseconds);
    value.at("threadSafe").get_to(task.threadSafe);
    value.at("builder").get_to(task.builder);
    value.at("input").get_to(task.input);
    value.at("memoryPattern").get_to(task.memoryPattern);
    value.at("otherLocale").get_to(task.otherLocale);
    value.at("otherFolder").get_to(task.otherFolder);
    value.at("noInput").get_to(task.noInput);
    return task;
}

void CheckSender::rule(const std::string& id) {
    lastActivity.clear();
    output(messageOf({{"kind", "rule"}, {"id", id}}));
}

void CheckSender::activity(const CheckActivity& activity) {
    const auto now = std::chrono::steady_clock::now();
    const std::string name = activity.key + '\n' + toUtf8(activity.detail);
    if (name == lastActivity && now - lastTime < std::chrono::milliseconds(500))
        return;
    lastActivity = name;
    lastTime = now;
    output(messageOf({{"kind", "activity"},
                      {"key", activity.key},
                      {"what", toUtf8(activity.what)},
                      {"place", toUtf8(activity.place)},
                      {"detail", toUtf8(activity.detail)},
                      {"reproduce", activity.reproduce}}));
}

void CheckSender::finding(const CheckFinding& finding) {
    output(messageOf({{"kind", "finding"},
                      {"rule", finding.rule->id},
                      {"place", toUtf8(finding.place)},
                      {"sentence", toUtf8(finding.sentence)},
                      {"reproduce", finding.reproduce},
                      {"missingClass", wordsOf(finding.missingClass)}}));
}

void CheckSender::builder(const CheckedBuilder& builder) {
    output(messageOf(
        {{"kind", "builder"}, {"name", toUtf8(builder.name)}, {"uid", wordsOf(builder.uid)}}));
}

void CheckSender::answer(const std::wstring& key, const std::string& value) {
    output(messageOf({{"kind", "answer"}, {"key", toUtf8(key)}, {"value", hexOf(value)}}));
}

void CheckSender::skipped() {
    output(messageOf({{"kind", "skipped"}}));
}

void CheckSender::done() {
    output(messageOf({{"kind", "done"}}));
}

std::string CheckSender::faultMessage(const std::wstring& text) {
    return messageOf({{"kind", "fault"}, {"text", toUtf8(text)}});
}

void decodeReport(std::string& bytes, CheckReport& report) {
    FrameReader frames(bytes);
    while (const std::optional<Frame> frame = report.garbled ? std::nullopt : frames.next()) {
        try {
            readMessage(jsonIn(frame->payload), report);
        } catch (const Json::exception&) {
            report.garbled = true;
        }
    }
    report.garbled = report.garbled || frames.garbled();
    bytes.erase(0, bytes.size() - frames.remaining());
}

} // namespace Mz::Tools
