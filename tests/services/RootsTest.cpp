#include "storage/Roots.h"

#include "state/Trees.h"
#include "storage.h"
#include "vconf.h"

#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <cstdlib>

#include <sys/stat.h>

namespace {

using platform::resolveCardRoot;
using platform::resolveDeviceRoot;
using platform::resolvePrivateRoot;

class RootsTest : public testing::Test {
protected:
    RootsTest()
    {
        ::setenv("HOME", home().c_str(), 1);
        ::setenv("XDG_CONFIG_HOME", _directory.file("config").c_str(), 1);
        ::setenv("XDG_DATA_HOME", _directory.file("data").c_str(), 1);
        std::filesystem::create_directories(home());
    }
    ~RootsTest() override
    {
        for (const char* name : {"MEWLO_DEVICE_ROOT", "MEWLO_CARD_ROOT", "MEWLO_PRIVATE_ROOT", "MEWLO_FREE_BYTES_CARD"})
            ::unsetenv(name);
    }
    [[nodiscard]] std::string home() const { return _directory.file("home"); }
    void writeUserDirs(const std::string& line)
    {
        support::writeFile(_directory.file("config/user-dirs.dirs"), line + "\n");
    }

    support::TempDir _directory;
};

TEST_F(RootsTest, DeviceRootIsVariableThenMusicDirectory)
{
    if (std::filesystem::exists("/opt/usr/media"))
        GTEST_SKIP() << "the fixed root exists here";
    EXPECT_EQ(home() + "/Music", resolveDeviceRoot());
    writeUserDirs("XDG_MUSIC_DIR=\"$HOME/Musik\"");
    EXPECT_EQ(home() + "/Musik", resolveDeviceRoot());
    EXPECT_TRUE(std::filesystem::is_directory(home() + "/Musik"));
    writeUserDirs("XDG_MUSIC_DIR=\"" + _directory.file("elsewhere") + "/\"");
    EXPECT_EQ(_directory.file("elsewhere"), resolveDeviceRoot());
    for (const char* none : {"XDG_MUSIC_DIR=\"$HOME/\"", "XDG_MUSIC_DIR=\"relative\"", "XDG_MUSIC_DIR=\"open"}) {
        writeUserDirs(none);
        EXPECT_EQ(home() + "/Music", resolveDeviceRoot()) << none;
    }
    ::setenv("MEWLO_DEVICE_ROOT", (_directory.file("made/root") + "/").c_str(), 1);
    EXPECT_EQ(_directory.file("made/root"), resolveDeviceRoot());
    EXPECT_TRUE(std::filesystem::is_directory(_directory.file("made/root")));
    ::setenv("MEWLO_DEVICE_ROOT", "not/absolute", 1);
    EXPECT_EQ(home() + "/Music", resolveDeviceRoot());
}

TEST_F(RootsTest, CardRootFollowsTheMount)
{
    if (std::filesystem::exists("/opt/storage/sdcard"))
        GTEST_SKIP() << "the fixed root exists here";
    struct statvfs size = {};
    EXPECT_EQ("/opt/storage/sdcard", resolveCardRoot());
    EXPECT_NE(0, storage_get_external_memory_size(&size));
    vconf_set_str("memory/storage/card_path", _directory.path().c_str());
    EXPECT_EQ("/opt/storage/sdcard", resolveCardRoot());
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 1);
    EXPECT_EQ(_directory.path(), resolveCardRoot());
    EXPECT_STREQ(_directory.path().c_str(), storage_card_root());
    EXPECT_EQ(0, storage_get_external_memory_size(&size));
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 2);
    EXPECT_EQ("/opt/storage/sdcard", resolveCardRoot());
    ::setenv("MEWLO_CARD_ROOT", _directory.file("card").c_str(), 1);
    EXPECT_EQ(_directory.file("card"), resolveCardRoot());
}

TEST_F(RootsTest, PrivateRootIsPrivateAndApartFromTheDevice)
{
    if (std::filesystem::exists("/opt/storage/PrivateStorage"))
        GTEST_SKIP() << "the fixed root exists here";
    const std::string device = _directory.file("device");
    std::filesystem::create_directories(device);
    const std::string own = _directory.file("data/mewlo-lite/PrivateStorage");
    EXPECT_EQ(own, resolvePrivateRoot(device));
    struct stat info = {};
    ASSERT_EQ(0, ::stat(own.c_str(), &info));
    EXPECT_EQ(0700U, info.st_mode & 0777U);

    ::setenv("MEWLO_PRIVATE_ROOT", _directory.file("private").c_str(), 1);
    EXPECT_EQ(_directory.file("private"), resolvePrivateRoot(device));
    std::filesystem::create_directory_symlink(device, _directory.file("link"));
    for (const std::string& inside :
        {device, device + "/private", _directory.file("link/private"), _directory.path()}) {
        ::setenv("MEWLO_PRIVATE_ROOT", inside.c_str(), 1);
        EXPECT_EQ(own, resolvePrivateRoot(device)) << inside;
    }
    // Not even the own place is apart: then there is no private area.
    EXPECT_EQ("/opt/storage/PrivateStorage", resolvePrivateRoot(_directory.path()));
}

TEST_F(RootsTest, CapsFreeBytesExactly)
{
    ::setenv("MEWLO_CARD_ROOT", _directory.path().c_str(), 1);
    struct statvfs size = {};
    ASSERT_EQ(0, storage_get_external_memory_size(&size));
    const double real = static_cast<double>(size.f_bsize) * static_cast<double>(size.f_bavail);
    EXPECT_GT(real, 107521.0);
    for (const char* cap : {"0", "107520", "107521"}) {
        ::setenv("MEWLO_FREE_BYTES_CARD", cap, 1);
        ASSERT_EQ(0, storage_get_external_memory_size(&size));
        EXPECT_EQ(std::stod(cap), static_cast<double>(size.f_bsize) * static_cast<double>(size.f_bavail));
    }
    for (const char* useless : {"", "many", "9223372036854775807"}) {
        ::setenv("MEWLO_FREE_BYTES_CARD", useless, 1);
        ASSERT_EQ(0, storage_get_external_memory_size(&size));
        EXPECT_GT(static_cast<double>(size.f_bsize) * static_cast<double>(size.f_bavail), 107521.0) << useless;
    }
    EXPECT_NE(0, storage_get_external_memory_size(nullptr));
}

}
