// Saving on systems that can be made to run full, and whose files have links and permissions.
#include "tests/mesh/safeFileFixture.h"

#include "components/componentManager/exceptions.h"

#include <csignal>
#include <sys/resource.h>

using namespace Mz;
using namespace Meshes;

namespace {

/// While it lives, no file of this process grows beyond `size` bytes, as on a medium that is full.
class FullMedium {
  public:
    explicit FullMedium(rlim_t size) {
        std::signal(SIGXFSZ, SIG_IGN); // Writing then fails instead.
        limitFiles(size);
    }
    ~FullMedium() { limitFiles(RLIM_INFINITY); }
    FullMedium(const FullMedium&) = delete;
    FullMedium& operator=(const FullMedium&) = delete;

  private:
    static void limitFiles(rlim_t size) {
        rlimit limit{};
        ::getrlimit(RLIMIT_FSIZE, &limit);
        limit.rlim_cur = size;
        ::setrlimit(RLIMIT_FSIZE, &limit);
    }
};

TEST_F(SafeFile, KeepsTheOldOneWhenTheMediumIsFull) {
    put(file, "old");
    const auto fill = [](std::size_t size) {
        return [size](std::ostream& out) {
            out.write(std::string(size, 'x').data(), static_cast<std::streamsize>(size));
        };
    };
    const FullMedium full(1000);
    saveSafely(file, fill(1000));
    EXPECT_EQ(content().size(), 1000U);
    // Whether it shows when the data is written or only at the end, when the rest of it is.
    for (const std::size_t size : {1001U, 5000U, 100000U}) {
        EXPECT_THROW(saveSafely(file, fill(size)), QrStreamEx::ExWriteError) << size;
        EXPECT_EQ(content(), std::string(1000, 'x'));
        EXPECT_EQ(filesInFolder(), 1U);
    }
}

TEST_F(SafeFile, KeepsSymbolicLinksAndPermissions) {
    const std::filesystem::path link = folder.path() / "link";
    put(file, "old");
    std::filesystem::permissions(file, std::filesystem::perms(0640));
    std::filesystem::create_symlink(file.filename(), link);
    put(link, "new");
    EXPECT_TRUE(std::filesystem::is_symlink(link));
    EXPECT_EQ(content(), "new");
    EXPECT_EQ(std::filesystem::status(file).permissions(), std::filesystem::perms(0640));
}

} // namespace
