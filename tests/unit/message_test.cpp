#include <common/message.h>

#include <common/message_table.h>
#include <common/utf8.h>
#include <common/zipopen.h>
#include <file/file.h>
#include <support/child_process.h>
#include <support/memory_bundle.h>

#include <cerrno>
#include <fstream>
#include <gtest/gtest.h>
#include <map>
#include <memory>

namespace {

std::u16string MessageOf(unsigned key) { return reinterpret_cast<char16_t const*>(GetMessage(key)); }

/// What translators wrote, by keys.
std::map<unsigned, std::u16string> Translations(std::string const& path)
{
    std::map<unsigned, std::u16string> texts;
    unsigned key = 0;
    std::ifstream file(path);
    for (std::string line; std::getline(file, line);) {
        if (line.starts_with("msgctxt")) key = static_cast<unsigned>(std::stoi(line.substr(9)));
        if (key == 0 || !line.starts_with("msgstr")) continue;
        EXPECT_TRUE(Common::DecodeUtf8(texts[key], &line[8], line.size() - 9)) << line;
    }
    return texts;
}

TEST(Messages, FollowTheLanguageAndOldTextsStay)
{
    auto const outcome = RunChild([] {
        EXPECT_EQ(MessageOf(MessageCanceled), u"Canceled.");
        EXPECT_EQ(MessageOf(111), u"");
        EXPECT_EQ(memoryBundle.subscriptions, 2) << "until there is an event";
        memoryBundle.callsBack = true;
        std::map<unsigned short const*, std::u16string> seen;
        std::string german;
        std::ifstream languages(SOURCES "locales");
        for (std::string language; std::getline(languages, language, ',');) {
            if (language == "en") continue;
            std::ifstream file(CATALOGUES + language + "/tessella.msg", std::ios::binary);
            std::string const& bytes = memoryBundle.loaded = {std::istreambuf_iterator(file), {}};
            if (language == "de") german = bytes;
            if (!seen.empty()) memoryBundle.callback();
            auto const translations = Translations(SOURCES "messages/" + language + ".po");
            EXPECT_EQ(translations.size(), 21) << language;
            std::u16string slots, texts;
            for (unsigned key = 0; key < 134; ++key) {
                auto const found = translations.find(key);
                std::u16string const text = found != translations.end() ? found->second : u"";
                errno = 77;
                EXPECT_TRUE(MessageOf(key) == text && errno == 77 && IsInCatalogue(GetMessage(key)))
                    << language << key;
                seen[GetMessage(key)] = text;
                slots += {static_cast<char16_t>(2 * (268 - slots.size() + texts.size())), 0};
                texts += text + u'\0';
            }
            slots = std::u16string{static_cast<char16_t>(bytes.size()), 0, 134, 0} + slots + texts;
            EXPECT_EQ(bytes, std::string(reinterpret_cast<char*>(slots.data()), 2 * slots.size()));
            std::unique_ptr<si_file> const failing(ZipOpen("file"));
            memoryBundle.failing = true;
            EXPECT_EQ(failing->Size(), 0);
            std::u16string told;
            failing->error.info->ops->GetMessage(failing->error.info, told);
            EXPECT_EQ(told, translations.at(MessageReadFailed));
        }
        EXPECT_EQ(memoryBundle.subscriptions, 3);
        EXPECT_EQ(seen.size(), 17 * 134);

        std::pair<std::size_t, std::string> const damages[] = {{0, "\x2A"}, {4, "\x85"}, {9, "\xFF"},
            {8, "\x17"}, {german.size() - 2, "!"}, {german.size() - 1, "!"}};
        std::vector<std::string> refused = {
            "", german.substr(0, 7), german + '\0', std::string("\x09\0\0\0\x86\0\0\0!", 9)};
        for (auto const& [place, byte] : damages)
            refused.push_back(std::string(german).replace(place, 1, byte));
        for (std::string const& bytes : refused) {
            memoryBundle.loaded = german;
            memoryBundle.callback();
            EXPECT_EQ(MessageOf(MessageCanceled), u"Abgebrochen.");
            memoryBundle.loaded = bytes;
            memoryBundle.callback();
            EXPECT_EQ(MessageOf(MessageCanceled), u"Canceled.");
        }
        for (auto const& [text, wanted] : seen)
            EXPECT_EQ(wanted, reinterpret_cast<char16_t const*>(text));
        std::exit(testing::Test::HasFailure());
        return 0;
    });
    EXPECT_EQ(outcome.status, 0) << outcome.out;
    EXPECT_EQ(outcome.out, "closed\nunsubscribed\n");
}

TEST(MessageCompiler, WhatIsWrongIsToldWithItsLine)
{
    auto const folder = testing::TempDir() + "tessella-messages-" + std::to_string(getpid());
    auto const compile = "--output out a.po";
    for (auto const& [edit, words, status, problem] : {std::tuple{"", compile, 0, ""},
             {R"(s/xt "86"/xt "86x"/)", compile, 1, "a.po:66: the context is no key"},
             {R"(s/xt "86"/xt "85"/)", compile, 1, "a.po:62: key 85 has another English"},
             {R"(s/msgstr "Abg.*/msgstr ""/)", compile, 1, "a.po:22: the translation is empty"},
             {R"(s/Abgebrochen."/Abge/)", compile, 1, "a.po:25: end-of-line within string"},
             {"10i #, fuzzy", compile, 1, "a.po:11: the translation is marked"},
             {"61,$d", compile, 1, "a.po: key 85 is missing"},
             {R"(s/ä/\xE4/)", compile, 1, "invalid multibyte sequence"},
             {R"($a msgctxt "9"\nmsgid ""\nmsgstr "x"\nmsgctxt "9"\nmsgid ""\nmsgstr "")", compile, 1,
                 "a.po:97: duplicate message definition\n"},
             {"", "--output out none.po", 1, "none.po: cannot be read"},
             {"", "--output /dev/full a.po", 1, "/dev/full: cannot be written: No space"},
             {"", "a.po --output", 2, "needs the name"}, {"", "--output out", 2, "no translations are given"},
             {"", "a.po b.po", 2, "'b.po' is one"}, {"", "--colour", 2, "unknown option '--colour'"}}) {
        auto const command = "mkdir -p " + folder + " && cd " + folder + " && sed '" + edit +
            "' " SOURCES "messages/de.po >a.po && " MESSAGE_COMPILER " " + words + " 2>&1; s=$?; rm -r " +
            folder + "; exit $s";
        auto const outcome = RunChild([&] { return execl("/bin/sh", "sh", "-c", command.c_str(), nullptr); });
        EXPECT_TRUE(WEXITSTATUS(outcome.status) == status && outcome.out.find(problem) != std::string::npos)
            << edit << words << outcome.out;
    }
}

}
