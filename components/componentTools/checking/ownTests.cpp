// SPDX-License-Identifier: BSL-1.0
/// Runs the tests that a library brings along.
#include "components/componentTools/checking/rules.h"

#include "components/componentKit/componentTest.h"
#include "components/componentManager/nativeText.h"
#include "components/componentTools/probing/exceptionText.h"

namespace Mz::Tools::Rules {

namespace {

class Report final : public Kit::TestReport {
  public:
    explicit Report(CheckContext& checked) : context(checked) {}

    void begin(const wchar_t* testName) override { name = textOrEmpty(testName); }
    void fail(const wchar_t* sentence) override {
        context.report(L"test \"" + name + L'"', textOrEmpty(sentence) + std::wstring(L"."));
    }

  private:
    CheckContext& context;
    std::wstring name;
};

} // namespace

void ownTests(CheckContext& context) {
    auto* const run =
        reinterpret_cast<Kit::RunComponentTest*>(context.function("MzRunComponentTest"));
    if (!run || !context.description())
        return;
    Report report(context);
    bool more = true;
    for (int number = 0; more; ++number) {
        const auto runOne = [&] {
            try {
                more = run(number, report);
            } catch (...) {
                report.fail((L"it throws: " + exceptionText()).c_str());
            }
        };
        if (!context.attempt(L"test " + std::to_wstring(number + 1), {}, runOne))
            return;
    }
}

} // namespace Mz::Tools::Rules
