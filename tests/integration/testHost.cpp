// SPDX-License-Identifier: BSL-1.0
/// A host program for tests: initialises the manager and prints the builders that it finds.
///
///     testHost [OPTION...] [PATH]   initialises with that search path; without PATH, with null
///
///     --locale NAME    sets the process's locale first
///     --catching       catches exceptions of `initialize`, and reports a call of std::terminate
///     --in-thread      initialises on a thread that ends before the builders are printed
///     --again-at-end   prints the builders again in the destructor of a static object
///
/// Prints one line for each builder, then "done". The line is "made NAME" if the builder's object
/// could be created, else "NAME".
#include "tests/components/testUids.h"

#include <clocale>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <string>
#include <string_view>
#include <thread>

using namespace Mz;
using namespace Mz::Test;

namespace {

class Printer final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription> item) override {
        const QrRef<QrCastable> object = QrGetComponentManager()->createObject(item->getUid());
        const QrPtr<PlainObject> plain = queryCast<PlainObject>(object.get());
        std::string name;
        for (const wchar_t* c = item->getName(); *c; ++c)
            name += static_cast<char>(*c);
        std::printf("%s%s\n", plain ? "made " : "", name.c_str());
        return Continue;
    }
};

void printBuilders() {
    Printer printer;
    QrGetComponentManager()->enumerateBuilders(printer);
}

/// Constructed before the first component is loaded, so destroyed after its static objects.
struct AtEnd {
    ~AtEnd() {
        if (wanted)
            printBuilders();
    }
    bool wanted = false;
} atEnd;

[[noreturn]] void reportTermination() {
    std::puts("terminated");
    std::fflush(stdout);
    std::_Exit(99);
}

void initialize(const wchar_t* path, bool catching) {
    if (!catching) {
        QrGetComponentManager()->initialize(path);
        return;
    }
    std::set_terminate(reportTermination);
    try {
        QrGetComponentManager()->initialize(path);
    } catch (const std::exception&) {
        std::puts("caught");
    }
}

} // namespace

int main(int argc, char** argv) {
    bool catching = false;
    bool inThread = false;
    int next = 1;
    for (; next < argc && std::string_view(argv[next]).starts_with("--"); ++next) {
        const std::string_view option(argv[next]);
        if (option == "--locale")
            std::setlocale(LC_ALL, argv[++next]);
        catching |= option == "--catching";
        inThread |= option == "--in-thread";
        atEnd.wanted |= option == "--again-at-end";
    }
    std::wstring text;
    for (int index = next; index < argc; ++index)
        text += std::filesystem::path(argv[index]).wstring();
    const wchar_t* const path = argc > next ? text.c_str() : nullptr;
    if (inThread)
        std::thread(initialize, path, catching).join();
    else
        initialize(path, catching);
    printBuilders();
    std::puts("done");
}
