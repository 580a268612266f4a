// SPDX-License-Identifier: BSL-1.0
// An importer for each of the things that an importer can do to its host. A file says which, as
// "PHASE ACT": in `canImport`, in `import`, or while the object is stored. With "careless" as its
// first word the file is read as by an importer that trusts what it reads.
#include "components/componentManager/nativeText.h"
#include "components/componentManager/processControl.h"
#include "tests/guarding/components/acts.h"
#include "tests/guarding/components/parcels.h"
#include "tests/guarding/components/system.h"

#include <chrono>
#include <clocale>
#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

namespace {

using namespace Mz;
using namespace Mz::Test;

using Plain = StoredParcel<parcelUid>;

std::string contentOf(QrBufferedIO& io) {
    std::string content;
    for (int byte = 0; (byte = io.read()) >= 0;)
        content += static_cast<char>(byte);
    return content;
}

/// Uses each byte as an importer that trusts its input would.
QrRef<QrCastable> importCarelessly(const std::string& content) {
    for (const char byte : content) {
        const auto value = static_cast<unsigned char>(byte);
        if (value >= 0xF0)
            std::abort();
        if (value >= 0xE0)
            std::_Exit(value);
        if (value >= 0xC0)
            throw std::out_of_range("a careless index");
        if (value >= 0x80)
            *reinterpret_cast<volatile char*>(static_cast<std::uintptr_t>(value)) = 0;
    }
    const QrPtr<Parcel> parcel = new Plain;
    parcel->text = std::wstring(content.begin(), content.end());
    return QrRef<QrCastable>(parcel.get());
}

/// Returns the results of a controller's functions as text.
std::wstring talk() {
    QrProcessControl& controller = *QrGetProcessController();
    std::wstringstream text;
    controller.message(1, L"a message");
    text << controller.warning(2, L"a warning") << controller.error(3, L"an error");
    text << controller.progress(0.25f, L"a quarter") << controller.progress(1, L"all");
    controller.status(L"a status");
    controller.log(4, L"an entry");
    text << controller.isProgressShown() << controller.isStatusShown() << controller.isErrorShown()
         << controller.isInterrupted() << !controller.getContext();
    text << L' ' << controller.findFile(L"name", L"here;there", nullptr);
    return text.str();
}

/// Reports progress without a pause. Returns how many milliseconds that took.
std::wstring hurry() {
    using Clock = std::chrono::steady_clock;
    const Clock::time_point start = Clock::now();
    QrProcessControl& controller = *QrGetProcessController();
    for (int step = 0; step < 1000 || Clock::now() - start < std::chrono::milliseconds(25);
         ++step) {
        controller.progress(static_cast<float>(step % 1000) / 2000, L"hurrying");
        controller.status(L"hurrying");
    }
    return std::to_wstring(
        std::chrono::duration_cast<std::chrono::milliseconds>(Clock::now() - start).count());
}

/// Returns which of its rights this process has.
std::wstring rights() {
    std::wstring text;
    text += std::ofstream("written by an importer").good() ? L"files " : L"";
    text += changeOwnFile() ? L"attributes " : L"";
    text += openConnection() ? L"network " : L"";
    text += startProcess() ? L"processes " : L"";
    text += endParent() ? L"signals " : L"";
    return text;
}

/// Returns a parcel with what is shared and circles.
QrPtr<Parcel> graph() {
    const QrPtr<Plain> root = new Plain, shared = new Plain, other = new Plain;
    root->text = L"root";
    shared->text = L"shared";
    other->text = L"other \x20AC";
    root->first = shared;
    root->second = other;
    other->first = shared;
    other->second = root;
    return root;
}

QrPtr<Parcel> chain(int length) {
    QrPtr<Parcel> last;
    for (; length > 0; --length) {
        const QrPtr<Plain> next = new Plain;
        next->first = last;
        last = next;
    }
    return last;
}

QrPtr<Parcel> parcelFor(const std::string& phase, const std::string& act) {
    if (act == "graph")
        return graph();
    if (act == "fleeting")
        return new Fleeting;
    if (act == "innerFleeting") {
        const QrPtr<Plain> outer = new Plain;
        outer->first = new Fleeting;
        return outer;
    }
    if (act == "stranger")
        return new StoredParcel<strangerUid>;
    if (act == "fussy")
        return new StoredParcel<fussyUid>;
    if (act == "deep")
        return chain(1000);
    const QrPtr<Plain> parcel = new Plain;
    if (act == "talk")
        parcel->text = talk();
    else if (act == "hurry")
        parcel->text = hurry();
    else if (act == "rights")
        parcel->text = rights();
    else if (act == "large")
        parcel->text = std::wstring(std::size_t{2} << 20, L'x');
    else if (act == "locale")
        parcel->text = *toWide(std::setlocale(LC_ALL, nullptr));
    if (phase == "storing")
        parcel->act = [act] { perform(act); };
    return parcel;
}

class Importer final : public Kit::ImportBuilder<Importer> {
  public:
    Importer()
        : ImportBuilder({.uid = testUid(0x40010), .name = L"hostile", .label = L"Hostile"},
                        {L"act"}) {}

    using ImportBuilder::canImport;
    using ImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        std::istringstream words(contentOf(*io));
        std::string phase, act;
        words >> phase >> act;
        if (phase == "asking")
            perform(act);
        return phase != "refused";
    }

    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t*,
                             const wchar_t*) const override {
        const std::string content = contentOf(*io);
        if (content.starts_with("careless "))
            return importCarelessly(content.substr(9));
        std::istringstream words(content);
        std::string phase, act;
        words >> phase >> act;
        if (phase == "importing")
            perform(act);
        if (act == "null")
            return nullptr;
        return QrRef<QrCastable>(parcelFor(phase, act).get());
    }
};

} // namespace

MZ_COMPONENT(L"Hostile", L"", Kit::builder<Importer>(),
             Kit::builderOf<StoredParcel<parcelUid>>({.uid = parcelUid}),
             Kit::builderOf<StoredParcel<fussyUid>>({.uid = fussyUid}))
