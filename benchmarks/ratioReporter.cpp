// SPDX-License-Identifier: BSL-1.0
// Only single repetitions count: the table makes its own medians.
#include "ratioReporter.h"

#include <string>

namespace Mz::Benchmarks {

bool RatioReporter::ReportContext(const Context& context) {
    PrintBasicContext(&GetErrorStream(), context);
    return true;
}

void RatioReporter::ReportRuns(const std::vector<Run>& runs) {
    for (const Run& run : runs) {
        if (run.run_type != Run::RT_Iteration)
            continue;
        const std::string& name = run.run_name.function_name;
        if (run.error_occurred) {
            table.noteError(name, run.error_message);
            continue;
        }
        const bool selfTimed = !run.run_name.time_type.empty();
        const double time = selfTimed ? run.GetAdjustedRealTime() : run.GetAdjustedCPUTime();
        table.note(name, time / benchmark::GetTimeUnitMultiplier(run.time_unit) * 1e9);
    }
}

} // namespace Mz::Benchmarks
