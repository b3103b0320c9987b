#include <file/file.h>

#include <file/posix_dir.h>
#include <support/child_process.h>

#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <sys/stat.h>

namespace {

using std::filesystem::path;

/// A folder that goes away with all that is in it.
struct Folder {
    path name = path(testing::TempDir()) / ("file_test" + std::to_string(getpid()));
    Folder() { std::filesystem::create_directories(name / "folder"); }
    ~Folder() { std::filesystem::remove_all(name); }
};

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
    Folder const folder;
    auto const body = [&] {
        std::filesystem::current_path(folder.name);
        auto const dir = OpenWorkingDir();
        std::filesystem::current_path("/");
        std::ofstream(folder.name / "\xC3\xA4") << "0123456789";
        mkfifo((folder.name / "pipe").c_str(), 0600);
        int wrong = 0;
        for (char const* const encoding : {"C", "no_such.locale", "C.UTF-8"}) {
            setenv("LC_ALL", encoding, 1);
            auto const file = OpenWorkingDir()->Open(u"\u00E4", 0);
            wrong += file == nullptr || file->Size() != 10;
            wrong += dir->Open((folder.name / "\xC3\xA4").u16string(), 0) == nullptr;
        }
        std::u16string_view const names[] = {
            u"", u"none", u"folder", u"pipe", u"\u00E4\xD800", {u"\u00E4\0", 2}, u"\u00E4/"};
        for (auto const name : names)
            wrong += dir->Open(name, 0) != nullptr;
        return wrong + (dir->Open(u"\u00E4", 1) != nullptr);
    };
    EXPECT_EQ(RunChild(body).status, 0);
}

TEST(PosixFile, ReadsUntilItsFirstErrorAndThenStandsStill)
{
    Folder const folder;
    std::ofstream(folder.name / "digits") << "0123456789";
    posix_dir dir(folder.name);
    auto const file = dir.Open(u"digits", 0);
    char text[31] = {};
    std::uint64_t count = 9;
    file->Read(text, 4, count);
    EXPECT_EQ(std::tuple(count, file->Size()), std::tuple(4, 10));
    ReadAll(*file, text + 4, 6);
    file->Read(text, 1, count);
    EXPECT_EQ(count, 0);
    EXPECT_EQ(FailureOf(*file), Failure());
    file->Rewind();
    ReadAll(*file, text + 10, 20);
    EXPECT_STREQ(text, "01234567890123456789");
    EXPECT_EQ(FailureOf(*file), Failure(0x40002, "include/file/file:Read", 27));
    EXPECT_FALSE(file->IOCTL(0, nullptr));
    file->Rewind();
    file->Read(text, 1, count);
    EXPECT_EQ(std::tuple(count, file->Size()), std::tuple(0, 0));
    EXPECT_EQ(FailureOf(*file), Failure(0x40002, "include/file/file:Read", 27));

    // Nothing is mapped at address 0, and negative positions are for devices.
    auto const memory = dir.Open(u"/proc/self/mem", 0);
    ReadAll(*memory, text, 1);
    EXPECT_EQ(FailureOf(*memory), Failure(0x40001, "file/posix_file:Read", EIO));
    auto const sought = dir.Open(u"digits", 0);
    EXPECT_EQ(dynamic_cast<raccess_file&>(*sought).SeekEnd(-11), 0);
    EXPECT_EQ(FailureOf(*sought), Failure(0x40005, "file/posix_file:Move", EINVAL));
    auto const device = dir.Open(u"digits", 0);
    EXPECT_FALSE(device->IOCTL(0, nullptr));
    EXPECT_EQ(FailureOf(*device), Failure(0x4000E, "common/file_object:IOCTL", 28));
}
