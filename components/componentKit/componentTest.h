// SPDX-License-Identifier: BSL-1.0
/// Tests that a component library brings along. `mzcomponents check` runs them.
///
///     MZ_COMPONENT_TESTS({L"a new mesh is empty", [](Mz::Kit::TestReport& test) {
///                            test.require(MeshObject().vertices().empty(), L"it has vertices");
///                        }})
///
/// The tests are compiled into the library, so they reach what it hides. Leave them out of the
/// library that you ship by a condition around the macro.
///
/// \since 0.2
#pragma once

#include "components/base/export.h"

namespace Mz::Kit {

/// Receives the results of tests. Implemented by the program that runs them. The order of the
/// virtual functions is ABI.
class TestReport {
  public:
    /// Begins a test.
    /// \param name  of the test, for people; not null
    virtual void begin(const wchar_t* name) = 0;

    /// Reports a failure of the test that began last.
    /// \param sentence  what is wrong; not null
    virtual void fail(const wchar_t* sentence) = 0;

    /// Reports a failure unless `condition` is true.
    /// \return `condition`
    bool require(bool condition, const wchar_t* sentence) {
        if (!condition)
            fail(sentence);
        return condition;
    }

  protected:
    ~TestReport() = default;
};

/// One test. An exception that leaves `run` is a failure.
struct ComponentTest {
    const wchar_t* name;             ///< for the report; a literal
    void (*run)(TestReport& report); ///< the test
};

/// The type of the function that `MZ_COMPONENT_TESTS` exports: runs the test with that number,
/// from 0. Returns false if there is none.
using RunComponentTest = bool(int number, TestReport& report);

} // namespace Mz::Kit

/// Adds tests to this component library: `MZ_COMPONENT_TESTS({name, function}, …)`. Use it once in
/// a library, outside all namespaces.
#define MZ_COMPONENT_TESTS(...)                                                                    \
    extern "C" MZ_EXPORT bool MzRunComponentTest(int number, Mz::Kit::TestReport& report) {        \
        static const Mz::Kit::ComponentTest tests[] = {__VA_ARGS__};                               \
        if (number < 0 || number >= static_cast<int>(sizeof tests / sizeof *tests))                \
            return false;                                                                          \
        report.begin(tests[number].name);                                                          \
        tests[number].run(report);                                                                 \
        return true;                                                                               \
    }
