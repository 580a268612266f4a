// SPDX-License-Identifier: BSL-1.0
/// The command that shows the content of a file: show. It first tries to read the file as a
/// recorded list, which needs no component. Otherwise the components read the objects, and a
/// forwarding IO records where each begins and ends.
#include "components/componentTools/consoleText.h"
#include "components/componentTools/uidText.h"
#include "tools/mzcomponents/exitGuard.h"
#include "tools/mzcomponents/host.h"
#include "tools/mzcomponents/inputFile.h"
#include "tools/mzcomponents/output.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/exceptions.h"
#include "components/componentManager/persistant.h"
#include "components/componentTools/discovery.h"
#include "components/objectIO/objectIO.h"

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <system_error>
#include <utility>
#include <vector>

namespace Mz::Commands {

namespace {

/// The position of one object in a stream, and its description.
struct Frame {
    int64 begin = -1, end = -1;
    int depth = 0;
    std::wstring what;
};

/// An IO that records where each object begins and ends while it is read.
class FrameNotes final : public QrCastImpl<FrameNotes, QrForwardingIO, const FrameNotes&> {
  public:
    explicit FrameNotes(QrCastable* io) : QrCastImpl(io) {}

    QrRef<QrCastable> readObject(QrStream& s, const QrUid* id, const wchar_t* a,
                                 const wchar_t* b) override {
        const std::size_t index = frames.size();
        frames.push_back({tell(), -1, depth, L"unfinished"});
        ++depth;
        const QrRef<QrCastable> object = inner().readObject(s, id, a, b);
        --depth;
        frames[index].end = tell();
        frames[index].what = describe(object, frames[index]);
        return object;
    }

    std::vector<Frame> frames;

  private:
    static std::wstring describe(const QrRef<QrCastable>& object, const Frame& frame) {
        if (!object)
            return L"null";
        const auto persistant = queryCast<QrPersistant>(object.get());
        const std::wstring name =
            persistant ? L"class " + Tools::textOf(*persistant->getClassUid()) + L", version " +
                             std::to_wstring(persistant->getVersion())
                       : std::wstring(L"an object");
        // Four bytes are a number alone: a reference to an object that was stored before.
        return frame.end - frame.begin == 4 ? L"again: " + name : name;
    }

    int depth = 0;
};

void showList(const Common& common, const Tools::RecordedLibraries& libraries) {
    if (common.json) {
        Json all = Json::array();
        for (const Tools::RecordedLibrary& library : libraries)
            all.push_back(jsonOf(library));
        printJson({{"kind", "recordedList"}, {"libraries", all}});
        return;
    }
    printLine(L"recorded list, " + counted(libraries.size(), L"library", L"libraries"));
    for (const Tools::RecordedLibrary& library : libraries) {
        printLine(std::to_wstring(library.position) + L"  " + library.directory + L"\\" +
                  library.fileName + L"  time " + std::to_wstring(library.time) + L"  size " +
                  std::to_wstring(library.size) + L"  builders " +
                  std::to_wstring(library.builders.size()));
        for (const Tools::RecordedBuilder& builder : library.builders)
            printLine(L"  " + std::to_wstring(builder.position) + L"  " +
                      Tools::textOf(builder.uid) + L"  \"" + builder.name + L"\"  \"" +
                      builder.label + L"\"  \"" + builder.text + L"\"  number " +
                      std::to_wstring(builder.number) + (builder.flag ? L"  flag" : L""));
    }
}

void showFrames(const Common& common, const std::vector<Frame>& frames) {
    Json all = Json::array();
    for (const Frame& frame : frames)
        if (common.json)
            all.push_back({{"begin", frame.begin},
                           {"end", frame.end},
                           {"depth", frame.depth},
                           {"object", utf8(frame.what)}});
        else
            printLine(std::wstring(static_cast<std::size_t>(frame.depth) * 2, L' ') +
                      std::to_wstring(frame.begin) + L"-" +
                      (frame.end < 0 ? L"?" : std::to_wstring(frame.end)) + L"  " + frame.what);
    if (common.json)
        printJson({{"kind", "objectStream"}, {"objects", all}});
}

struct Objects {
    std::vector<Frame> frames;
    std::wstring failure; ///< why the rest could not be read; empty if all was read
};

Objects readObjects(std::istream& input) {
    QrInBuffer bytes(&input);
    QrObjectInBuffer objects(&bytes);
    FrameNotes notes(&objects);
    Objects result;
    {
        QrBinaryStream stream(&notes);
        try {
            while (input.peek() != std::istream::traits_type::eof())
                stream.readObject(nullptr, nullptr, nullptr);
        } catch (...) {
            result.failure = exceptionText();
        }
    }
    if (result.failure.empty() && input.bad())
        result.failure = L"the file cannot be read";
    result.frames = std::move(notes.frames);
    return result;
}

/// Returns whether the file may contain objects: they are numbered from 1, and null is 0.
bool beginsWithAnObject(std::istream& input) {
    QrInBuffer bytes(&input);
    QrBinaryStream stream(&bytes);
    std::uint32_t number = 0;
    try {
        stream >> number;
    } catch (const QrStreamEx&) {
        return false;
    }
    input.clear();
    input.seekg(0);
    return number <= 1;
}

/// Shows the objects of a stream. The components must read them, because only they know the format.
int showObjects(const Common& common, const std::filesystem::path& file, std::istream& input,
                const std::wstring& whyNoList, const ProbeArguments& probe) {
    Host host(common, probe);
    if (host.interrupted())
        return exitFailure;
    const Activity activity(L"the objects of " + Tools::displayName(file) + L" were read");
    Objects objects = readObjects(input);
    const bool nothing = !objects.failure.empty() && objects.frames.size() <= 1;
    if (nothing)
        objects.frames.clear();
    showFrames(common, objects.frames);
    if (objects.failure.empty())
        return host.status();
    std::wstring failure = objects.failure;
    if (nothing)
        failure = L"neither a recorded list (" + whyNoList +
                  L") nor objects that these components know (" + failure + L")";
    host.console().error(0, (shown(file) + L": " + failure).c_str());
    return exitFailure;
}

/// Opens `input` and returns an empty text; or returns why the file cannot be read as objects.
std::wstring obstacle(const std::filesystem::path& file, std::ifstream& input,
                      const std::wstring& whyNoList) {
    std::wstring wrong = obstacleTo(file);
    if (!wrong.empty())
        return wrong;
    std::error_code failure;
    if (std::filesystem::file_size(file, failure) == 0 && !failure)
        return L"the file is empty";
    input.open(file, std::ios::binary);
    if (!input || input.peek() == std::ifstream::traits_type::eof())
        return L"the file cannot be read";
    if (!beginsWithAnObject(input))
        return L"neither a recorded list (" + whyNoList + L") nor stored objects";
    return {};
}

} // namespace

int show(const Common& common, const std::string& argument, const ProbeArguments& probe) {
    const std::filesystem::path file = Tools::pathOf(argument);
    const Tools::ListReading reading = Tools::readRecordedList(file);
    if (reading.state == Tools::ListReading::State::good) {
        showList(common, reading.libraries);
        return exitSuccess;
    }
    std::vector<char> memory(64 * 1024); // Few system calls; the default on Windows has 512 bytes.
    std::ifstream input;
    input.rdbuf()->pubsetbuf(memory.data(), static_cast<std::streamsize>(memory.size()));
    const std::wstring wrong = obstacle(file, input, reading.reason);
    if (wrong.empty())
        return showObjects(common, file, input, reading.reason, probe);
    printError(toWide(argument) + L": " + wrong);
    return exitFailure;
}

} // namespace Mz::Commands
