/// A host to be run by tests: initialises the manager and prints what it found.
///
///     testHost PATH      initialises with that search path
///     testHost           initialises with null
///     testHost --locale NAME [PATH]   the same in that locale
///
/// One line for each builder, then "done"; a line "made NAME" instead where an object could be
/// made.
#include "tests/components/testUids.h"

#include <clocale>
#include <cstdio>
#include <filesystem>
#include <string>
#include <string_view>

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

} // namespace

int main(int argc, char** argv) {
    int first = 1;
    if (argc > 2 && std::string_view(argv[1]) == "--locale") {
        std::setlocale(LC_ALL, argv[2]);
        first = 3;
    }
    std::wstring path;
    for (int index = first; index < argc; ++index)
        path += std::filesystem::path(argv[index]).wstring();
    QrGetComponentManager()->initialize(argc > first ? path.c_str() : nullptr);
    Printer printer;
    QrGetComponentManager()->enumerateBuilders(printer);
    std::puts("done");
}
