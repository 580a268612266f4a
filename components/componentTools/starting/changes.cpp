// SPDX-License-Identifier: BSL-1.0
/// The list itself cannot tell: a scan outside the host, or the start that failed, has recorded the
/// change already. Therefore each start saves what it saw, apart from the list.
#include "components/componentTools/starting/changes.h"

#include "components/componentManager/exceptions.h"
#include "components/componentManager/files.h"
#include "components/componentManager/utf8.h"
#include "components/componentTools/records/json.h"
#include "components/componentTools/records/openPatiently.h"

#include <cstdint>
#include <fstream>
#include <map>

namespace Mz::Tools {

namespace {

using Name = LibraryNames::value_type;
using Status = std::pair<std::uint32_t, std::int64_t>; ///< time and size

constexpr int version = 1;

/// What a start saw.
struct Seen {
    std::map<Name, Status> components;
    LibraryNames changed;

    friend bool operator==(const Seen&, const Seen&) = default;
};

std::filesystem::path fileOf(const std::filesystem::path& list) {
    std::filesystem::path file = list;
    file += ".starts.json";
    return file;
}

Seen seenIn(const Json& all) {
    Seen seen;
    if (integerOf(all.at("version")) != version)
        return seen;
    for (const Json& entry : all.at("components")) {
        const Name name(fromUtf8(entry.at("directory").get<std::string>()),
                        fromUtf8(entry.at("fileName").get<std::string>()));
        seen.components[name] = {static_cast<std::uint32_t>(integerOf(entry.at("time"))),
                                 integerOf(entry.at("size"))};
        if (entry.at("changed").get<bool>())
            seen.changed.insert(name);
    }
    return seen;
}

Seen readSeen(const std::filesystem::path& file) {
    std::ifstream input;
    if (!openPatiently(input, file))
        return {};
    try {
        return seenIn(jsonIn(input));
    } catch (const Json::exception&) {
        return {};
    } catch (const std::ios_base::failure&) {
        return {}; // The buffer of a file throws it, and JSON is read from the buffer.
    }
}

void writeSeen(const std::filesystem::path& file, const Seen& seen) {
    OrderedJson entries = OrderedJson::array();
    for (const auto& [name, status] : seen.components)
        entries.push_back({{"directory", toUtf8(name.first)},
                           {"fileName", toUtf8(name.second)},
                           {"time", status.first},
                           {"size", status.second},
                           {"changed", seen.changed.contains(name)}});
    const OrderedJson all{{"version", version}, {"components", entries}};
    try {
        replaceFile(file, linesOf(all));
    } catch (const QrStreamEx&) {
        return; // The folder of the list may be read-only.
    }
}

} // namespace

LibraryNames changedLast(const std::filesystem::path& list, const RecordedLibraries& components) {
    const Seen before = readSeen(fileOf(list));
    Seen now;
    for (const RecordedLibrary& library : components) {
        const Name name(library.directory, library.fileName);
        const Status status(library.time, library.size);
        now.components[name] = status;
        const auto known = before.components.find(name);
        if (known == before.components.end() || known->second != status)
            now.changed.insert(name);
    }
    if (now.changed.empty())
        for (const Name& name : before.changed)
            if (now.components.contains(name))
                now.changed.insert(name);
    if (now != before)
        writeSeen(fileOf(list), now);
    return now.changed;
}

} // namespace Mz::Tools
