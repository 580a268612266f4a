/// The command that shows what is in a file: show.
#include "tools/mzcomponents/host.h"
#include "tools/mzcomponents/output.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/persistant.h"
#include "components/componentTools/discovery.h"
#include "components/objectIO/objectIO.h"

#include <fstream>
#include <iostream>

namespace Mz::Commands {

namespace {

/// One object of a stream.
struct Frame {
    int64 begin = -1, end = -1;
    int depth = 0;
    std::wstring what;
};

/// Notes where each object begins and ends while it is read.
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
        // A number alone stands for an object that was stored before.
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
    printLine(L"recorded list, " + std::to_wstring(libraries.size()) + L" libraries");
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

/// Only components know what their objects hold, so the stream is read through them.
int showObjects(const Common& common, const std::filesystem::path& file) {
    Host host(common);
    if (host.interrupted())
        return subjectIsWrong;
    std::ifstream input(file, std::ios::binary);
    QrInBuffer bytes(&input);
    QrObjectInBuffer objects(&bytes);
    FrameNotes notes(&objects);
    std::wstring failure;
    {
        QrBinaryStream stream(&notes);
        try {
            while (input.peek() != std::ifstream::traits_type::eof())
                stream.readObject(nullptr, nullptr, nullptr);
        } catch (const std::exception& error) {
            const std::string what = error.what();
            failure.assign(what.begin(), what.end());
        }
    }
    if (!failure.empty() && notes.frames.size() <= 1)
        failure = L"neither a recorded list nor objects that these components know: " + failure;
    showFrames(common, notes.frames);
    if (!failure.empty())
        host.console().error(0, (Tools::displayName(file) + L": " + failure).c_str());
    return failure.empty() ? good : subjectIsWrong;
}

} // namespace

int show(const Common& common, const std::string& argument) {
    const std::filesystem::path file = Tools::pathOf(argument);
    const Tools::ListReading reading = Tools::readRecordedList(file);
    if (reading.state == Tools::ListReading::State::good) {
        showList(common, reading.libraries);
        return good;
    }
    if (!std::filesystem::is_regular_file(file)) {
        std::cerr << "mzcomponents: " << argument << ": there is no such file\n";
        return subjectIsWrong;
    }
    return showObjects(common, file);
}

} // namespace Mz::Commands
