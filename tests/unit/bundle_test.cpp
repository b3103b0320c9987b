#include <common/bundle_api.h>

#include <common/error.h>
#include <support/child_process.h>

#include <fcntl.h>
#include <fstream>
#include <gtest/gtest.h>
#include <memory>
#include <random>
#include <thread>

namespace {

std::string Contents(char const* path)
{
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator(file), {}};
}

std::string const root = Contents(ROOT_FILE), german = Contents(DE_FILE), portuguese = Contents(PT_FILE);

/// An archive in a file of its own, which may be damaged before.
struct Module {
    int const file = memfd_create("archive", 0);
    std::string const path = "/proc/self/fd/" + std::to_string(file);
    BundleApi::ModuleHandle* handle;

    explicit Module(std::string const& bytes)
    {
        EXPECT_EQ(write(file, bytes.data(), bytes.size()), static_cast<ssize_t>(bytes.size()));
        std::basic_string<unsigned short> const units(path.begin(), path.end());
        handle = BundleApi::OpenModule(units.c_str());
    }
    ~Module()
    {
        BundleApi::CloseModule(handle);
        close(file);
    }
    std::string Load(char const* name) const
    {
        unsigned size = 0;
        std::unique_ptr<unsigned char[]> const data(BundleApi::LoadFile(handle, name, nullptr, &size));
        return data != nullptr ? std::string(data.get(), data.get() + size) : "none";
    }
};

struct CloseFile {
    void operator()(BundleApi::FileHandle* file) const { BundleApi::CloseFile(file); }
};
using File = std::unique_ptr<BundleApi::FileHandle, CloseFile>;

std::string const archive = Contents(ARCHIVE);

int calls = 0;

}

TEST(Bundle, LanguageIsTheEnvironmentsUntilOneIsSet)
{
    Module const module(archive);
    std::pair<char const*, std::string const&> const cases[] = {{"de", german}, {"de_AT.UTF-8", german},
        {"de@euro", german}, {"pt_BR", root}, {"pt_BR.UTF-8", root}, {"pt_PT", portuguese},
        {"pt", portuguese}, {"es", root}, {"en_US", root}, {"C", root}, {"", root}, {"d", root},
        {"de,pt", root}, {"../de", root}};
    for (auto const& [language, text] : cases) {
        BundleApi::SetLanguage(language);
        EXPECT_EQ(module.Load("text"), text) << language;
        auto const body = [&, name = language, &expected = text] {
            setenv("LC_ALL", "", 1);
            setenv("LC_MESSAGES", name, 1);
            setenv("LANG", *name != 0 ? "de" : "", 1);
            BundleApi::SetLanguage(nullptr);
            bool const second = module.Load("text") == expected;
            setenv("LC_ALL", "pt", 1);
            bool const kept = module.Load("text") == expected;
            BundleApi::SetLanguage(nullptr);
            return second && kept && module.Load("text") == portuguese ? 0 : 1;
        };
        EXPECT_EQ(RunChild(body).status, 0) << language;
    }
}

TEST(Bundle, SubscribersAreCalledAtOnceAndAtChanges)
{
    auto const callback = [] { ++calls; };
    BundleApi::SubscribeLanguageEvents(callback);
    BundleApi::SubscribeLanguageEvents(callback);
    EXPECT_EQ(calls, 2);
    BundleApi::SetLanguage("de");
    EXPECT_EQ(calls, 3);
    BundleApi::UnsubscribeLanguageEvents(callback);
    BundleApi::SetLanguage("en");
    EXPECT_EQ(calls, 3);
}

TEST(Bundle, FilesOfOneArchiveAreReadOnManyThreads)
{
    auto module = std::make_unique<Module>(archive);
    BundleApi::SetLanguage("en");
    EXPECT_EQ(module->Load("empty"), "");
    for (char const* const name : {"", "none", "de/", "text/", "de/none"})
        EXPECT_EQ(BundleApi::OpenFile(module->handle, name, nullptr), nullptr) << name;
    EXPECT_EQ(BundleApi::OpenFile(module->handle, "text", "variant"), nullptr);
    EXPECT_EQ(BundleApi::OpenFile(nullptr, "text", nullptr), nullptr);
    EXPECT_EQ(BundleApi::OpenModule(nullptr), nullptr);

    std::vector<std::jthread> threads;
    for (unsigned seed = 0; seed < 4; ++seed) {
        bool const translated = seed % 2 != 0;
        auto* const opened = BundleApi::OpenFile(module->handle, translated ? "de/text" : "text", nullptr);
        threads.emplace_back([=, file = File(opened)] {
            std::mt19937 random(seed);
            std::string const& text = translated ? german : root;
            unsigned long long size = 0;
            EXPECT_TRUE(BundleApi::GetFileSize(file.get(), &size) && size == text.size());
            for (int round = 0; round < 20; ++round) {
                std::string found;
                char buffer[5000];
                for (unsigned got = 1, wanted = 1; got > 0 || wanted == 0; found.append(buffer, got)) {
                    wanted = random() % sizeof buffer;
                    EXPECT_TRUE(BundleApi::ReadFile(file.get(), buffer, wanted, &got));
                }
                EXPECT_EQ(found, text);
                EXPECT_TRUE(BundleApi::RewindFile(file.get()));
            }
            unsigned errorSize = 0;
            EXPECT_EQ(BundleApi::GetFileError(file.get(), &errorSize), nullptr);
        });
    }
    module.reset();  // the files stay
}

TEST(Bundle, DamageIsRefusedOrToldAndNeverDelivered)
{
    BundleApi::SetLanguage("de");
    std::mt19937 random(7);
    unsigned told = 0;
    for (int round = 0; round < 3000; ++round) {
        std::string bytes = archive;
        std::size_t const place = random() % bytes.size();
        if (round % 3 == 0)
            bytes.resize(place);
        else
            for (unsigned i = 0; i < (round % 3 == 1 ? 1U : 9U); ++i)
                bytes[(place + i) % bytes.size()] = static_cast<char>(random());
        Module const module(bytes);
        std::string const text = module.Load("text");
        EXPECT_TRUE(text == german || text == root || text == "none") << round;
        File const file(BundleApi::OpenFile(module.handle, "text", nullptr));
        if (text != "none" || file == nullptr) continue;
        std::vector<char> buffer(german.size() + root.size());
        unsigned read = 0, size = 0;
        EXPECT_FALSE(
            BundleApi::ReadFile(file.get(), buffer.data(), static_cast<unsigned>(buffer.size()), &read));
        std::unique_ptr<unsigned char[]> const chain(BundleApi::GetFileError(file.get(), &size));
        Common::Error const error = Common::ParseErrorChain(chain.get(), size);
        ASSERT_EQ(error.info->code, 0x40001U);
        EXPECT_STREQ(error.info->ops->GetAscii(error.info, "archive"), module.path.data());
        EXPECT_STREQ(error.info->ops->GetAscii(error.info, "entry"), "de/text");
        ++told;
    }
    EXPECT_GT(told, 100U);
    EXPECT_EQ(Module("").handle, nullptr);
    EXPECT_EQ(Module(Contents("/proc/self/exe")).handle, nullptr);
}
