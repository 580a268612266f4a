// SPDX-License-Identifier: BSL-1.0
// The start of the manager in new processes, compared with the calls that it cannot avoid.
#include "byHand.h"
#include "comparisons.h"
#include "freshStart.h"

#include <string>

namespace Mz::Benchmarks {

namespace {

void addFirstStart(RatioTable& table, unsigned int count, const std::string& countText) {
    const SharedFolder folder = componentFolder(count);
    table.addSelfTimed({"start/first" + std::to_string(count),
                        "first start, " + countText + " libraries",
                        loadingCalls() + ", libraries kept", 1.15},
                       freshly("initialize", folder, count), freshly("load", folder, count));
}

void addRecordedStart(RatioTable& table, unsigned int count, const std::string& countText,
                      double reach) {
    const SharedFolder folder = componentFolder(count);
    table.addSelfTimed({"start/recorded" + std::to_string(count),
                        "start with a recorded list, " + countText + " libraries",
                        "list, status, read the list, fill a map", reach},
                       freshly("initializeRecorded", folder, count),
                       freshly("readList", folder, count));
}

} // namespace

void addStartComparisons(RatioTable& table) {
    addFirstStart(table, 100, "100");
    addFirstStart(table, 1000, "1,000");
    table.addSelfTimed({"start/bystanders", "1,000 candidates without the entry point",
                        "list, status, open, two small reads, close", 1.4},
                       freshly("initialize", bystanderFolder(), 0),
                       freshly("readTables", bystanderFolder(), 1000));
    addRecordedStart(table, 100, "100", 1.5);
    addRecordedStart(table, 1000, "1,000", 1.6);
}

void addLargeStartComparisons(RatioTable& table) {
    addRecordedStart(table, 4000, "4,000", 1.65);
}

} // namespace Mz::Benchmarks
