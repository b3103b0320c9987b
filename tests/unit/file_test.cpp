#include <file/file.h>

#include <file/posix_dir.h>

#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <sys/stat.h>

namespace {

/// A folder with ten digits in a file, a folder and a pipe.
std::filesystem::path const folder = [] {
    std::filesystem::path const name = testing::TempDir() + "tessella_file_test";
    std::filesystem::create_directories(name / "folder");
    std::ofstream(name / "\xC3\xA4") << "0123456789";
    mkfifo((name / "pipe").c_str(), 0600);
    return name;
}();

/// Code, place, and the system's reason or else the line.
using Failure = std::tuple<unsigned, std::string, unsigned>;

Failure FailureOf(file_object const& file)
{
    auto const* const info = file.error.info;
    if (info == nullptr) return {};
    std::string const place = info->file + (':' + std::string(info->function));
    return {info->code, place, info->reason != nullptr ? info->reason->number : info->line};
}

}

TEST(WorkingDir, IsWhereTheProcessStoodAndOpensRegularFiles)
{
    auto const before = std::filesystem::current_path();
    std::filesystem::current_path(folder);
    auto const dir = OpenWorkingDir();
    std::filesystem::current_path(before);
    EXPECT_NE(dir->Open((folder / "\xC3\xA4").u16string(), 0), nullptr);
    for (char const* const encoding : {"C", "no_such.locale", "C.UTF-8"}) {
        setenv("LC_ALL", encoding, 1);
        EXPECT_NE(OpenWorkingDir()->Open(u"\u00E4", 0), nullptr);
    }
    EXPECT_EQ(dir->Open(u"\u00E4", 1), nullptr);
    std::u16string_view const names[] = {u"", u"no", u"folder", u"pipe", u"\u00E4\xD800", {u"\u00E4\0", 2}};
    for (auto const name : names)
        EXPECT_EQ(dir->Open(name, 0), nullptr);
}

TEST(PosixFile, ReadsUntilItsFirstErrorAndThenStandsStill)
{
    posix_dir dir(folder);
    auto const file = dir.Open(u"\u00E4", 0);
    char text[31] = {};
    std::uint64_t count = 9;
    file->Read(text, 4, count);
    EXPECT_EQ(std::tuple(count, file->Size()), std::tuple(4, 10));
    ReadAll(*file, text + 4, 6);
    file->Read(text, 1, count);
    EXPECT_EQ(std::tuple(count, FailureOf(*file)), std::tuple(0, Failure()));
    file->Rewind();
    ReadAll(*file, text + 10, 20);
    EXPECT_STREQ(text, "01234567890123456789");
    EXPECT_FALSE(file->IOCTL(0, nullptr));
    file->Rewind();
    file->Read(text, 1, count);
    EXPECT_EQ(std::tuple(file->Size(), count), std::tuple(0, 0));
    EXPECT_EQ(FailureOf(*file), Failure(0x40002, "include/file/file:Read", 27));

    // Nothing is mapped at address 0, and negative positions are for devices.
    auto const memory = dir.Open(u"/proc/self/mem", 0), sought = dir.Open(u"\u00E4", 0);
    ReadAll(*memory, text, 1);
    EXPECT_EQ(FailureOf(*memory), Failure(0x40001, "file/posix_file:Read", EIO));
    EXPECT_EQ(dynamic_cast<raccess_file&>(*sought).SeekEnd(-11), 0);
    EXPECT_EQ(FailureOf(*sought), Failure(0x40005, "file/posix_file:Move", EINVAL));
    auto const device = dir.Open(u"\u00E4", 0);
    EXPECT_FALSE(device->IOCTL(0, nullptr));
    EXPECT_EQ(FailureOf(*device), Failure(0x4000E, "common/file_object:IOCTL", 28));
}
