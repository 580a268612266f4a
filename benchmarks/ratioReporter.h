// SPDX-License-Identifier: BSL-1.0
/// What Google Benchmark measures goes to the table.
#pragma once

#include "ratioTable.h"

#include <vector>

namespace Mz::Benchmarks {

/// Passes the results of all repetitions to a table.
class RatioReporter final : public benchmark::BenchmarkReporter {
  public:
    explicit RatioReporter(RatioTable& table) : table(table) {}

    bool ReportContext(const Context& context) override;
    void ReportRuns(const std::vector<Run>& runs) override;

  private:
    RatioTable& table;
};

} // namespace Mz::Benchmarks
