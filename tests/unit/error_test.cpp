#include <common/error.h>

#include <common/message.h>
#include <common/mutex.h>
#include <common/utf8.h>
#include <support/child_process.h>

#include <atomic>
#include <gtest/gtest.h>
#include <sstream>
#include <thread>

using namespace Common;
using namespace std::string_literals;

static std::atomic<int> allocationsLeft = -1;  // no limit

void* operator new[](std::size_t size, std::nothrow_t const& /*tag*/) noexcept
{
    return allocationsLeft == 0 ? nullptr : (--allocationsLeft, operator new[](size));
}

namespace {

Error Parse(std::string const& bytes)
{
    std::vector<unsigned char> const exact(bytes.begin(), bytes.end());  // an over-read is seen
    return ParseErrorChain(exact.data(), static_cast<unsigned>(exact.size()));
}

std::string Text(unsigned short const* text)
{
    std::string narrow(text == nullptr ? "-" : "");
    while (text != nullptr && *text != 0)
        narrow += static_cast<char>(*text++);
    return narrow;
}

/// Code, site, message, and of each parameter the value as a number, as 8-bit text and as UTF-16.
std::string Describe(Error const& error)
{
    std::ostringstream out;
    for (ErrorInfo* info = error.info; info != nullptr; info = info->reason) {
        std::u16string message;
        info->ops->GetMessage(info, message);
        out << info->code << ' ' << info->site << ' ' << std::string(message.begin(), message.end()) << ':';
        std::istringstream names(info->ops->GetNames(info));
        for (std::string name; std::getline(names, name, ',');) {
            char const* const ascii = info->ops->GetAscii(info, name.data());
            out << name << '=' << info->ops->GetNumber(info, name.data()) << '/' << (ascii ? ascii : "-")
                << '/' << Text(info->ops->GetWide(info, name.data())) << ';';
        }
    }
    return out.str();
}

}

TEST(ErrorChain, IsRebuiltUpToTheFirstRecordThatIsNotWhole)
{
    // By another type the places are parameters like any other; a comma in a name shifts those behind it.
    std::string const site = "\1\0\0\0\0\0\0\0"s, number = "N\7\0\0\0\0\0\0\0"s, head = "\4\0\0\0"s + site;
    std::pair<std::string, std::string> const records[] = {{head + "first\0\0"s, "4 1 first:"},
        {head + "\0$file\0Af\0$func\0Ag\0$line\0"s + number + "\0"s, "4 1 :"},
        {head + "\xC3\xBC\0a\0Atext\0w\0W\xC3\xA4w\0number\0"s + number + "\0"s,
            "4 1 \xFC:a=0/text/-;w=0/-/\xE4w;number=7/-/-;"},
        {head + "\0$file\0"s + number + "a,b\0"s + number + "c\0W\xC3\xA4\0\0"s,
            "4 1 :$file=7/-/-;a=7/-/-;b=0/-/\xE4;c=0/-/-;"}};
    std::string bytes = "\1", text;
    for (auto const& [record, described] : records) {
        for (std::size_t length = 0; length < record.size(); ++length)
            EXPECT_EQ(Describe(Parse(bytes + record.substr(0, length))), text);
        for (std::string const& bad :
            {"\xFF\0\0"s, "\0n\0X\0\0"s, "\0$line\0n"s + site, "\0w\0W\xC1\x81\0\0"s})
            EXPECT_EQ(Describe(Parse(bytes + head + bad)), text);
        text += described;
        EXPECT_EQ(Describe(Parse((bytes += record) + "\0\0\0\0behind the end"s)), text);
    }
    EXPECT_EQ(Parse("\2" + records[0].first).info, nullptr);
    Error const chain = Parse(bytes);
    ErrorInfo const& located = *chain.info->reason;
    EXPECT_EQ(located.file, InternString("f"s.data()));
    EXPECT_EQ(located.function + std::to_string(located.line), "g7");

    std::string described;
    for (int allocations = 0; described != text; ++allocations) {
        allocationsLeft = allocations;
        Error const shortened = Parse(bytes);
        allocationsLeft = -1;
        described = Describe(shortened);
        std::string const end = "65522 0 :$module=0/tessella_glxa64_3500/-;";
        std::size_t const whole = described.find(end);
        EXPECT_EQ(described, whole == described.npos ? text : text.substr(0, whole) + end);
    }
}

TEST(ErrorRecord, EachKindAnswersForItself)
{
    Error posix;
    AddPosixError(posix, ENOENT);
    EXPECT_EQ(posix.info->function + std::to_string(posix.info->line), "AddPosixError339");
    std::u16string const own = u"own";
    Error const text(9, reinterpret_cast<unsigned short const*>(own.c_str()), {});
    Error const known(9, GetMessage(MessageEndOfFile), {});
    EXPECT_EQ(text.info->size - known.info->size, sizeof u"own");
    std::pair<Error, std::string> const cases[] = {{Error(9, {}), "9 0 :"}, {text, "9 0 own:"},
        {known, "9 0 The end of the file has been reached.:"},
        {posix, "65521 " + std::to_string(posix.info->site) + " No such file or directory:code=2/-/-;"}};
    for (auto const& [error, described] : cases) {
        EXPECT_TRUE(error);
        EXPECT_EQ(Describe(error), described + "$module=0/tessella_glxa64_3500/-;");
        EXPECT_EQ(Describe(error), Describe(Error(error.info->ops->Clone(error.info))));
    }
    EXPECT_TRUE(!Error(0, {}) && !Error());
    EXPECT_EQ(Text(GetMessage(99)) + Text(GetMessage(111)), "Error occurred while writing to the file.");
    EXPECT_TRUE(IsInCatalogue(GetMessage(133)) && !IsInCatalogue(GetMessage(133) + 1));
}

TEST(ErrorRecord, ReasonIsReplacedInPlaceUnlessOthersHoldTheChain)
{
    Error error(9, {});
    ErrorInfo* const head = error.info;
    AddPosixError(AddPosixError(error, ENOENT), EACCES);
    EXPECT_TRUE(error.info == head && head->reason->number == EACCES && head->reason->reason == nullptr);
    Error shared = error;
    allocationsLeft = 1;  // for the reason, not for the clone
    EXPECT_EQ(AddPosixError(shared, EIO).info, head);
    allocationsLeft = -1;
    EXPECT_EQ(AddPosixError(shared, EIO).info->reason->number, EIO);
    EXPECT_TRUE(head->refs == 1 && head->reason->number == EACCES);

    allocationsLeft = 0;
    Error const empty(9, GetMessage(MessageEndOfFile), {});
    AddPosixError(shared, EIO);
    allocationsLeft = -1;
    EXPECT_EQ(shared.info->reason, empty.info);
    EXPECT_EQ(std::tuple(empty.info->code, empty.info->size, empty.info->refs), std::tuple(0xFFF2, 64, 3));
}

TEST(ErrorRecord, HandlesToOneChainLiveOnManyThreads)
{
    Error error(9, {});
    std::vector<std::jthread> threads;
    while (threads.size() < 4)
        threads.emplace_back([error] {
            for (int i = 0; i < 1000; ++i) {
                Error mine = error;
                AddPosixError(mine, i);
                EXPECT_EQ(InternString(std::to_string(i).data()), InternString(std::to_string(i).data()));
            }
        });
    threads.clear();
    EXPECT_TRUE(error.info->refs == 1 && error.info->reason == nullptr);
}

TEST(Utf8, EveryCharacterAndEveryKindOfMistake)
{
    std::u16string out;
    for (std::uint32_t c = 1; c < 0x110000; ++c) {
        std::string bytes;
        for (unsigned i = 0, more = (c > 0x7F) + (c > 0x7FF) + (c > 0xFFFF); i <= more; ++i) {
            unsigned const lead = more == 0 ? 0 : 0xFF00 >> (more + 1) & 0xFF;
            bytes += static_cast<char>(i > 0 ? 0x80 | (c >> 6 * (more - i) & 0x3F) : lead | c >> 6 * more);
        }
        ASSERT_TRUE(DecodeUtf8(out, bytes.data(), bytes.size())) << c;
        ASSERT_EQ(out.size() == 1 ? out[0] : 0x10000 + ((out[0] & 0x3FF) << 10) + (out[1] & 0x3FF), c);
    }
    std::pair<std::string, std::u16string> const mistakes[] = {{"\x80", u"\uFFFD"}, {"\xC3", u"\uFFFD"},
        {"\xE4\xB8z", u"\uFFFD\uFFFDz"}, {"\xF8\x88", u"\uFFFD\uFFFD"}, {"\xC1\xBF", u"\x7F"},
        {"\xE0\x9F\xBF", u"\u07FF"}, {"\xF0\x8F\xBF\xBF", u"\uFFFF"}, {"\xF4\x90\x80\x80y", u"\uFFFDy"}};
    for (auto const& [bytes, text] : mistakes)
        EXPECT_TRUE(!DecodeUtf8(out, bytes.data(), bytes.size()) && out == text) << bytes;
    EXPECT_TRUE(DecodeUtf8(out, "ab\0\xFF", 4) && DecodeUtf8(out, "ab\xFF", 2) && out == u"ab");
}

TEST(Mutex, TellsWhenItIsNotHeld)
{
    auto const unlock = [] {
        setenv("VELLUM_SAFE_ASSERT", "log", 1);
        setenv("VELLUM_SAFE_ASSERT_LOGFILE", "stdout", 1);  // the thread sanitizer writes to the other
        return Mutex().unlock(), 0;
    };
    EXPECT_EQ(RunChild(unlock).out,
        "Assertion failed: ret == 0 && \"Probably unlock from non-owner thread!\", "
        "file " TESSELLA_BUILD_FOLDER "common/unix/mutex_unix.cpp, line 51\n");
}
