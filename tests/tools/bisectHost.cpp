// SPDX-License-Identifier: BSL-1.0
/// A host that makes an object of each builder, for searches: bisectHost LIST FOLDER [COUNTER].
///
/// With COUNTER, the number in that file is increased by each start. Components that fail sometimes
/// find it in MZ_TEST_START.
#include "components/componentKit/hostKit.h"
#include "tests/support/testSystem.h"

#include <clocale>
#include <cstdio>
#include <fstream>

/// Lets a crash end the process by its signal under the sanitizers too.
extern "C" MZ_EXPORT const char* __asan_default_options() {
    return "handle_segv=0";
}

namespace {

int countStart(const std::filesystem::path& counter) {
    int number = 0;
    std::ifstream(counter) >> number;
    std::ofstream(counter) << number + 1;
    return number;
}

} // namespace

int main(int count, char** arguments) {
    std::setlocale(LC_ALL, "");
    if (count < 3)
        return 64;
    if (count > 3)
        Mz::Test::setEnvironment("MZ_TEST_START", std::to_string(countStart(arguments[3])));
    const auto list = Mz::Kit::listFromEnvironment(arguments[1]);
    Mz::Kit::readList(list);
    Mz::Kit::initialize(arguments[2]);
    int made = 0;
    Mz::Kit::forEachBuilder([&](const Mz::QrBuilderDescription& description) {
        const auto builder = description.getBuilder();
        made += builder && const_cast<Mz::QrComponentBuilder&>(*builder).createObject();
    });
    std::printf("%d made\n", made);
    Mz::Kit::writeList(list);
}
