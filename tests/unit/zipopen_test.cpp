#include <common/zipopen.h>

#include <common/library_path.h>
#include <file/file.h>
#include <support/child_process.h>
#include <support/memory_bundle.h>

#include <gtest/gtest.h>
#include <memory>
#include <thread>
#include <vector>

// The loader tells a program's file by its first argument, whatever that says.
TEST(Zip, OneModuleOfThePathInBytesServesAllThreadsUntilTheProcessExits)
{
    auto const again = [] { return execl("/proc/self/exe", "/\xC3\xA4", "--gtest_filter=*Path*", nullptr); };
    if (GetLibraryPath() != std::string("/\xC3\xA4")) {
        ChildOutcome const outcome = RunChild(again);
        EXPECT_EQ(outcome.status, 0) << outcome.out;
        EXPECT_TRUE(outcome.out.ends_with("closed\n"));
        return;
    }
    unsigned size = 9;
    memoryBundle.hasArchive = false;
    EXPECT_TRUE(ZipOpen("file") == nullptr && ZipLoad("file", &size) == nullptr && size == 9);
    memoryBundle.hasArchive = true;
    std::vector<std::jthread> threads;
    while (threads.size() < 8)
        threads.emplace_back([] { delete ZipOpen("file"); });
    threads.clear();
    std::unique_ptr<unsigned char[]> const data(ZipLoad("file", &size));
    EXPECT_TRUE(data != nullptr && size == 4 && ZipOpen("none") == nullptr);
    EXPECT_TRUE(memoryBundle.modules == 1 && memoryBundle.openFiles == 0);
    EXPECT_EQ(memoryBundle.path, u"/\u00C3\u00A4");
}

TEST(Zip, FirstFailureOfAFileStays)
{
    std::string const told("\1\7\0\0\0........told\0", 19);
    for (std::string const& chain : {std::string(), told})
        for (unsigned const line : {74, 59, 66}) {
            memoryBundle.failing = false;
            std::unique_ptr<si_file> const file(ZipOpen("file"));
            char text[4];
            std::uint64_t count = 9;
            ReadAll(*file, text, 4);
            file->Rewind();
            EXPECT_TRUE(!file->error && file->Size() == 4);

            memoryBundle.failing = true;
            memoryBundle.failure = chain;
            if (line == 59) file->Rewind();
            if (line == 74) file->Read(text, 4, count);
            EXPECT_EQ(line == 66 ? file->Size() : 0, 0);
            EXPECT_EQ(count, line == 74 ? 1 : 9);
            Common::ErrorInfo const* const info = file->error.info;
            std::u16string message;
            info->ops->GetMessage(info, message);
            if (chain.empty()) {
                EXPECT_EQ(
                    std::tuple(info->code, info->line), std::tuple(line == 59 ? 0x40005 : 0x40001, line));
                EXPECT_EQ(message.substr(21), line == 59 ? u"searching in the file." : u"reading the file.");
                EXPECT_STREQ(info->file, "common/zipopen");
            } else {
                EXPECT_EQ(std::tuple(info->code, message), std::tuple(7, u"told"));
            }
            int const calls = memoryBundle.calls;
            file->Rewind();
            file->Read(text, 4, count);
            EXPECT_EQ(std::tuple(file->Size(), count, memoryBundle.calls.load()), std::tuple(0, 0, calls));
            EXPECT_EQ(file->error.info, info);
        }
}
