// SPDX-License-Identifier: BSL-1.0
/// The host: imports the files that it is given, through whatever import builders there are.
#include "settings.h"

#include "components/componentKit/hostKit.h"

#include <iostream>

using namespace Mz;

namespace {

/// Counts the errors that builders report. `Kit::Controller` has shown them already.
class Reporter final : public Kit::Controller {
  public:
    bool error(int code, const wchar_t* text) override {
        ++errors;
        return Controller::error(code, text);
    }

    int errors = 0;
};

void print(const Settings& settings) {
    for (const Settings::Entry& entry : settings.entries())
        std::cout << "  [" << entry.section << "] " << entry.key << " = " << entry.value << '\n';
}

} // namespace

int main(int argc, char** argv) {
    Kit::initialize(Kit::programFolder() / "components");
    Reporter reporter;
    const Kit::ControllerScope installed(reporter);
    const auto importer = Kit::newImporter<SETTINGS_BUILDERS>();
    std::cout << "File types: " << toNarrow(importer->getFileTypes(), '?') << '\n';

    for (int index = 1; index < argc; ++index) {
        const std::wstring name = Kit::wideName(argv[index]);
        const int errorsBefore = reporter.errors;
        bool found = false;
        const auto object = importer->import(name.c_str(), nullptr, found);
        if (const auto settings = queryCast<Settings>(object.get())) {
            std::cout << argv[index] << ":\n";
            print(*settings);
        } else if (!found) {
            reporter.error(0, (name + L": there is no such file").c_str());
        } else if (reporter.errors == errorsBefore) { // No builder has given a reason.
            reporter.error(0, (name + L": no builder reads this file").c_str());
        }
    }
    return reporter.errors == 0 ? 0 : 1;
}
