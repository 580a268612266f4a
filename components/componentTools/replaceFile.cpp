#include "components/componentTools/replaceFile.h"

#include "components/componentManager/exceptions.h"
#include "components/componentTools/platform/system.h"
#include "components/platform/platform.h"

#include <atomic>
#include <chrono>
#include <fstream>
#include <system_error>
#include <thread>

namespace Mz::Tools {

namespace {

constexpr const char* source = "components/componentTools/replaceFile";

std::filesystem::path temporaryName(const std::filesystem::path& file) {
    static std::atomic<unsigned int> counter{0};
    std::filesystem::path name = file;
    name += ".new-" + std::to_string(System::processNumber()) + "-" + std::to_string(++counter);
    return name;
}

/// Where a link leads, whether there is anything yet or not; else the file itself.
std::filesystem::path targetOf(const std::filesystem::path& file) {
    std::error_code failure;
    if (!std::filesystem::is_symlink(std::filesystem::symlink_status(file, failure)))
        return file;
    const std::filesystem::path target = std::filesystem::weakly_canonical(file, failure);
    return failure || target.empty() ? file : target;
}

/// Repeats `attempt` for half a second until it succeeds or `hopeless` says that it never will.
template <class Attempt, class Hopeless>
bool patiently(Attempt attempt, Hopeless hopeless) {
    constexpr int attempts = 50;
    for (int count = 0; count < attempts; ++count) {
        if (attempt())
            return true;
        if (hopeless())
            return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    return false;
}

/// Where an open file cannot be replaced, a reader makes us wait for a moment.
bool moveOver(const std::filesystem::path& from, const std::filesystem::path& to) {
    std::error_code failure;
    return patiently(
        [&] {
            std::filesystem::rename(from, to, failure);
            return !failure;
        },
        [&] { return std::filesystem::is_directory(to); });
}

} // namespace

void replaceFile(const std::filesystem::path& file, std::string_view content) {
    const std::string name = System::encode(System::displayName(file), 2);
    std::error_code ignored;
    const std::filesystem::file_status old = std::filesystem::status(file, ignored);
    if (std::filesystem::exists(old) && !std::filesystem::is_regular_file(old))
        throw QrStreamEx::ExWriteOpen(source, __LINE__, name.c_str());
    const std::filesystem::path target = targetOf(file);
    const std::filesystem::path temporary = temporaryName(target);
    {
        std::ofstream output(temporary, std::ios::binary | std::ios::trunc);
        if (!output)
            throw QrStreamEx::ExWriteOpen(source, __LINE__, name.c_str());
        if (std::filesystem::exists(old))
            std::filesystem::permissions(temporary, old.permissions(), ignored);
        output.write(content.data(), static_cast<std::streamsize>(content.size()));
        output.close();
        if (output && moveOver(temporary, target))
            return;
    }
    // Some systems keep what must not be written.
    std::filesystem::permissions(temporary, std::filesystem::perms::owner_all, ignored);
    std::filesystem::remove(temporary, ignored);
    throw QrStreamEx::ExWriteError(source, __LINE__, name.c_str());
}

bool openPatiently(std::ifstream& stream, const std::filesystem::path& file) {
    std::optional<platform::FileStatus> status;
    return patiently(
        [&] {
            stream.clear();
            status = platform::queryFile(file.native());
            return status && status->regular && platform::openForReading(stream, file.native());
        },
        [&] { return !status || !status->regular; });
}

} // namespace Mz::Tools
