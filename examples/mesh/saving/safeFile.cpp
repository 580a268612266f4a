/// Writes to a new file in the same folder and renames it: a rename within one folder is atomic, so
/// other programs see the old content or the new one. A symlink is resolved first, because the
/// rename would otherwise replace the link.
#include "safeFile.h"

#include "examples/mesh/system/system.h"

#include "components/componentManager/exceptions.h"

#include <fstream>
#include <random>

using Mz::QrStreamEx;

namespace Meshes {

namespace {

constexpr const char* source = "examples/mesh/saving/safeFile";

[[noreturn]] void failToOpen(int line, const std::filesystem::path& file,
                             const std::error_code& reason) {
    throw QrStreamEx::ExWriteOpen(source, line, file.string().c_str(), reason.message().c_str());
}

/// A new file beside `target`. The destructor removes it, unless it has replaced the target.
class TemporaryFile {
  public:
    explicit TemporaryFile(const std::filesystem::path& target) : target(target) {
        std::random_device random;
        std::error_code failure;
        do {
            path = target;
            path += ".saving-" + std::to_string(random());
            failure = system::createNew(path);
        } while (failure == std::errc::file_exists);
        if (failure)
            failToOpen(__LINE__, target, failure);
    }
    ~TemporaryFile() {
        std::error_code ignored;
        if (!path.empty())
            std::filesystem::remove(path, ignored);
    }
    TemporaryFile(const TemporaryFile&) = delete;
    TemporaryFile& operator=(const TemporaryFile&) = delete;

    void write(const std::function<void(std::ostream&)>& work) {
        std::ofstream stream(path, std::ios::binary);
        if (stream)
            work(stream);
        stream.close();
        if (!stream)
            throw QrStreamEx::ExWriteError(source, __LINE__, target.string().c_str());
    }

    void takePlace() {
        std::error_code ignored;
        const std::filesystem::file_status old = std::filesystem::status(target, ignored);
        if (std::filesystem::is_regular_file(old))
            std::filesystem::permissions(path, old.permissions(), ignored);
        if (const std::error_code failure = system::moveSafely(path, target))
            failToOpen(__LINE__, target, failure);
        path.clear();
    }

  private:
    const std::filesystem::path& target;
    std::filesystem::path path;
};

} // namespace

void saveSafely(const std::filesystem::path& file,
                const std::function<void(std::ostream&)>& write) {
    std::error_code ignored;
    const bool isLink = std::filesystem::is_symlink(std::filesystem::symlink_status(file, ignored));
    const std::filesystem::path target =
        isLink ? std::filesystem::weakly_canonical(file, ignored) : file;
    TemporaryFile temporary(target.empty() ? file : target);
    temporary.write(write);
    temporary.takePlace();
}

} // namespace Meshes
