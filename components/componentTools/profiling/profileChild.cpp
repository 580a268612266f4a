// SPDX-License-Identifier: BSL-1.0
/// Either takes the steps of a start one by one, or lets the component manager take them all.
///
/// A library that ended an earlier process must not be loaded by the manager, either. As in a scan,
/// a record without builders sees to that: the manager does not load a file that has one and is
/// unchanged.
#include "components/componentTools/profiling/profileChild.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/persistant.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/probing/fatalFaults.h"
#include "components/componentTools/profiling/librarySteps.h"
#include "components/componentTools/profiling/profileMessages.h"
#include "components/componentTools/profiling/startFiles.h"

#include <clocale>
#include <cstdlib>
#include <exception>
#include <fstream>
#include <memory>
#include <sstream>

namespace Mz::Tools {

namespace {

using Clock = std::chrono::steady_clock;

constexpr int usageStatus = 2;

/// The start that is measured.
struct Start {
    ProfileTask task;
    std::filesystem::path list;
    std::wstring searchPath;
};

std::vector<StartFile> filesOf(const Start& start, const RecordedLibraries& recorded) {
    std::vector<StartFile> files = listStartFiles(start.searchPath);
    findRecords(files, recorded);
    return files;
}

RecordedLibraries recordedIn(const std::filesystem::path& list) {
    return list.empty() ? RecordedLibraries() : readRecordedList(list).libraries;
}

/// Returns the list with records that keep the manager from loading the excluded candidates. All
/// candidates get a record, because the manager counts the records of equal names.
std::string listWithExclusions(const Start& start) {
    const RecordedLibraries recorded = recordedIn(start.list);
    RecordedLibraries libraries;
    const std::vector<StartFile> files = filesOf(start, recorded);
    for (std::size_t index = 0; index < files.size(); ++index) {
        RecordedLibrary record;
        record.size = -1; // No file has it, so the manager loads the library.
        if (files[index].record)
            record = *files[index].record;
        record.directory = files[index].directory;
        record.fileName = files[index].fileName;
        const auto status = platform::queryFile(files[index].openingPath());
        if (status && start.task.excluded.contains(index)) {
            record.time = status->time;
            record.size = status->size;
            record.builders.clear();
        }
        libraries.push_back(std::move(record));
    }
    std::ostringstream bytes;
    writeRecordedList(bytes, libraries);
    return bytes.str();
}

/// Reads a list into the manager, as hosts do.
void readIntoManager(std::istream& in) {
    QrInBuffer buffer(&in);
    QrBinaryStream stream(&buffer);
    QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()))->read(stream);
}

/// Reads the list from its file. With exclusions it comes from memory, so that opening and reading
/// the file is not included.
void readList(const Start& start, const std::string& changed) {
    if (start.task.excluded.empty()) {
        std::ifstream in(start.list, std::ios::binary);
        readIntoManager(in);
    } else {
        std::istringstream in(changed);
        readIntoManager(in);
    }
}

void measureWhole(const Start& start, System::AnswerPipe& pipe) {
    const bool excluding = !start.task.excluded.empty();
    const std::string changed = excluding ? listWithExclusions(start) : std::string();
    std::optional<std::chrono::nanoseconds> reading;
    if (excluding || !start.list.empty()) {
        const Clock::time_point begin = Clock::now();
        readList(start, changed);
        reading = Clock::now() - begin;
    }
    if (start.list.empty())
        reading.reset();
    const Clock::time_point begin = Clock::now();
    QrGetComponentManager()->initialize(start.searchPath.c_str());
    const std::string message = encodeWhole(reading, Clock::now() - begin);
    pipe.write(message.data(), message.size());
}

void measureSteps(const Start& start, System::AnswerPipe& pipe) {
    const auto send = [&](const std::string& message) {
        pipe.write(message.data(), message.size());
    };
    const RecordedLibraries recorded = recordedIn(start.list);
    const Clock::time_point begin = Clock::now();
    std::vector<StartFile> files = listStartFiles(start.searchPath);
    const std::chrono::nanoseconds listing = Clock::now() - begin;
    if (files.size() != start.task.candidates)
        return send(encodeOtherFolders());
    findRecords(files, recorded);
    StartSteps(files, start.task.excluded, send).run();
    send(encodeListing(listing));
}

} // namespace

int runProfileChild(const std::vector<std::string>& arguments) {
    if (arguments.size() < 5)
        return usageStatus;
    Start start;
    try {
        start.task = decodeProfileTask(arguments[2]);
    } catch (const std::exception&) {
        return usageStatus;
    }
    System::AnswerPipe pipe;
    System::confine(std::strtoull(arguments[1].c_str(), nullptr, 10));
    std::setlocale(LC_ALL, "");
    reportFatalFaults(pipe, encodeProfileFault);
    start.list = System::pathOfArgument(arguments[3]);
    std::vector<std::filesystem::path> folders;
    for (std::size_t index = 4; index < arguments.size(); ++index)
        folders.push_back(System::pathOfArgument(arguments[index]));
    start.searchPath = searchPathOf(folders);
    if (start.task.whole)
        measureWhole(start, pipe);
    else
        measureSteps(start, pipe);
    System::endProcess(0);
}

} // namespace Mz::Tools
