#include "components/componentTools/verdictsFile.h"

#include "components/componentManager/platform/platform.h"
#include "components/componentTools/replaceFile.h"
#include "components/componentTools/utf8.h"

#include <fstream>
#include <nlohmann/json.hpp>

namespace Mz::Tools {

namespace {

using Json = nlohmann::ordered_json;

constexpr int version = 1;

std::wstring wide(const Json& entry, const char* key) {
    return fromUtf8(entry.at(key).get<std::string>());
}

KeptVerdicts verdictsOf(const Json& all) {
    KeptVerdicts verdicts;
    if (all.at("version").get<int>() != version)
        return verdicts;
    for (const Json& entry : all.at("libraries")) {
        const auto verdict = verdictNamed(entry.at("verdict").get<std::string>());
        if (!verdict)
            continue;
        verdicts[{wide(entry, "directory"), wide(entry, "fileName")}] = {
            entry.at("time").get<std::uint32_t>(), entry.at("size").get<std::int64_t>(),
            Finding{*verdict, wide(entry, "subject"), wide(entry, "words")}};
    }
    return verdicts;
}

} // namespace

KeptVerdicts readVerdicts(const std::filesystem::path& file) {
    std::ifstream input;
    if (!openPatiently(input, file))
        return {};
    try {
        return verdictsOf(Json::parse(input));
    } catch (const nlohmann::json::exception&) {
        return {}; // Only a memory of ours: without it a little more is tried again.
    }
}

void writeVerdicts(const std::filesystem::path& file, const KeptVerdicts& verdicts) {
    Json libraries = Json::array();
    for (const auto& [name, kept] : verdicts)
        libraries.push_back({{"directory", toUtf8(name.first)},
                             {"fileName", toUtf8(name.second)},
                             {"time", kept.time},
                             {"size", kept.size},
                             {"verdict", nameOf(kept.finding.verdict)},
                             {"subject", toUtf8(kept.finding.subject)},
                             {"words", toUtf8(kept.finding.words)},
                             {"sentence", toUtf8(sentenceOf(kept.finding))},
                             {"cure", toUtf8(cureOf(kept.finding))}});
    replaceFile(file,
                Json{{"version", version}, {"libraries", libraries}}.dump(2, ' ', true) + "\n");
}

} // namespace Mz::Tools
