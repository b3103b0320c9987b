#include <common/bundle_api.h>

#include <common/error.h>

#include <fstream>
#include <gtest/gtest.h>
#include <memory>
#include <sys/mman.h>
#include <thread>

namespace {

std::string Contents(char const* path)
{
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator(file), {}};
}

std::string const root = Contents(ROOT_FILE), german = Contents(DE_FILE), portuguese = Contents(PT_FILE);
std::string const archive = Contents(ARCHIVE);
std::size_t calls = 0;

/// An archive in a file of its own, which may be damaged before.
struct Module {
    int const file = memfd_create("archive", 0);
    std::string const path = "/proc/self/fd/" + std::to_string(file);
    BundleApi::ModuleHandle* handle;

    explicit Module(std::string const& bytes)
    {
        EXPECT_EQ(write(file, bytes.data(), bytes.size()), static_cast<ssize_t>(bytes.size()));
        handle = BundleApi::OpenModule(std::basic_string<unsigned short>(path.begin(), path.end()).c_str());
    }
    ~Module()
    {
        BundleApi::CloseModule(handle);
        close(file);
    }
    std::string Load(char const* name = "text") const
    {
        unsigned size = 0;
        std::unique_ptr<unsigned char[]> const data(BundleApi::LoadFile(handle, name, nullptr, &size));
        return data != nullptr ? std::string(data.get(), data.get() + size) : "none";
    }
};

}

TEST(Bundle, FollowsTheLanguageInForce)
{
    Module const module(archive);
    auto const callback = [] { ++calls; };
    BundleApi::SubscribeLanguageEvents(callback);
    BundleApi::SubscribeLanguageEvents(callback);
    std::pair<char const*, std::string const&> const cases[] = {{"de", german}, {"de_AT.UTF-8", german},
        {"de@euro", german}, {"pt_BR", root}, {"pt_PT", portuguese}, {"es", root}, {"en_US", root},
        {"C", root}, {"", root}, {"d", root}, {"de,pt", root}, {"../de", root}};
    for (auto const& [language, text] : cases) {
        BundleApi::SetLanguage(language);
        EXPECT_EQ(module.Load(), text) << language;
    }
    BundleApi::UnsubscribeLanguageEvents(callback);
    BundleApi::SetLanguage("en");
    EXPECT_EQ(calls, 2 + std::size(cases));  // each is told at once, and of each change once
    EXPECT_EQ(module.Load("empty"), "");
    for (char const* const name : {"", "none", "de/", "text/", "de/none"})
        EXPECT_EQ(module.Load(name), "none") << name;

    std::string found;
    for (char const* const variable : {"LC_ALL=", "LC_MESSAGES=", "LANG=de", "LC_MESSAGES=pt", "LC_ALL=C"}) {
        putenv(const_cast<char*>(variable));
        BundleApi::SetLanguage(nullptr);
        found += module.Load()[2];
    }
    EXPECT_EQ(found.substr(2), std::string() + german[2] + portuguese[2] + root[2]);
}

TEST(Bundle, FilesOutliveTheirModuleAndAreReadOnManyThreads)
{
    auto module = std::make_unique<Module>(archive);
    BundleApi::SetLanguage("en");
    EXPECT_EQ(BundleApi::OpenFile(module->handle, "text", "variant"), nullptr);
    std::vector<std::jthread> threads;
    for (std::string const* const text : {&root, &german, &root, &german}) {
        auto* const file = BundleApi::OpenFile(module->handle, text == &root ? "text" : "de/text", nullptr);
        threads.emplace_back([=] {
            for (unsigned step = 1; step < 5000; step += step / 2 + 1) {
                std::string found(text->size() + step, 0);
                unsigned read = 1;
                for (std::size_t place = 0; read > 0; place += read)
                    EXPECT_TRUE(BundleApi::ReadFile(file, &found[place], step, &read));
                EXPECT_TRUE(found.starts_with(*text) && BundleApi::RewindFile(file));
            }
            BundleApi::CloseFile(file);
        });
    }
    module.reset();
}

TEST(Bundle, DamageIsToldAndNeverDelivered)
{
    BundleApi::SetLanguage("de");
    std::u16string message;
    for (std::size_t place = 0; place < archive.size(); place += 7) {
        std::string bytes = archive;
        bytes[place] ^= 0x10;
        Module const module(bytes);
        std::string const text = module.Load();
        EXPECT_TRUE(text == german || text == root || text == "none") << place;
        auto* const file = BundleApi::OpenFile(module.handle, "text", nullptr);
        std::vector<char> buffer(100000);
        unsigned read = 0, size = 0;
        EXPECT_EQ(BundleApi::ReadFile(file, buffer.data(), 100000, &read), text != "none");
        std::unique_ptr<unsigned char[]> const chain(BundleApi::GetFileError(file, &size));
        Common::Error const error = Common::ParseErrorChain(chain.get(), size);
        ASSERT_EQ(error.info != nullptr, file != nullptr && text == "none");
        if (error) {
            EXPECT_EQ(error.info->ops->GetAscii(error.info, "archive"), module.path);
            error.info->ops->GetMessage(error.info, message);
            EXPECT_EQ(message, u"Beim Lesen der Datei ist ein Fehler aufgetreten.");
            error.info->reason->ops->GetMessage(error.info->reason, message);
            EXPECT_NE(message, u"") << "what the unpacker says";
        }
        BundleApi::CloseFile(file);
    }
    EXPECT_EQ(Module(Contents("/proc/self/exe")).handle, nullptr);
}
