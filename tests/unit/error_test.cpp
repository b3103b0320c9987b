#include <common/error.h>

#include <common/message.h>
#include <common/mutex.h>
#include <common/utf8.h>
#include <support/chain_bytes.h>
#include <support/child_process.h>

#include <atomic>
#include <gtest/gtest.h>
#include <new>
#include <random>
#include <thread>

using namespace Common;

static std::atomic<int> allocationsLeft = -1;  // no limit

void* operator new[](std::size_t size, std::nothrow_t const& /*tag*/) noexcept
{
    return allocationsLeft == 0 ? nullptr : (--allocationsLeft, operator new[](size));
}

namespace {

constexpr Location kHere = LocationOf("here", "Test", 7);

std::u16string MessageOf(ErrorInfo const* info)
{
    std::u16string text;
    info->ops->GetMessage(info, text);
    return text;
}

std::u16string Wide(std::string const& text) { return {text.begin(), text.end()}; }

std::u16string Text(unsigned short const* text)
{
    std::u16string copy;
    while (text != nullptr && *text != 0)
        copy += static_cast<char16_t>(*text++);
    return copy;
}

Error Parse(std::string const& bytes)
{
    std::vector<unsigned char> const exact(bytes.begin(), bytes.end());  // an over-read is seen
    return ParseErrorChain(exact.data(), static_cast<unsigned>(exact.size()));
}

/// Compares a parsed chain with the first `count` records of the model.
void ExpectChain(Error const& error, std::vector<ChainRecord> const& model, std::size_t count)
{
    ErrorInfo const* info = error.info;
    for (std::size_t i = 0; i < count; ++i, info = info->reason) {
        ASSERT_NE(info, nullptr);
        EXPECT_EQ(MessageOf(info), Wide(model[i].message));
        std::string names;
        std::uint64_t line = 0;
        for (auto const& p : model[i].parameters) {
            if (p.name == "$line" && p.type == 'N') line = p.number;
            if (p.name[0] == '$' && p.name != "$other") continue;
            names += (names.empty() ? "" : ",") + p.name;
            char const* const ascii = info->ops->GetAscii(info, p.name.data());
            EXPECT_EQ(info->ops->GetNumber(info, p.name.data()), p.type == 'N' ? p.number : 0);
            EXPECT_EQ(ascii == nullptr ? "" : ascii, p.type == 'A' ? p.text : "");
            EXPECT_EQ(Text(info->ops->GetWide(info, p.name.data())), Wide(p.type == 'W' ? p.text : ""));
        }
        EXPECT_EQ(info->ops->GetNames(info), names);
        EXPECT_EQ(std::tuple(info->code, info->site, info->line, info->refs),
            std::tuple(model[i].code, model[i].site, static_cast<std::uint32_t>(line), 1));
    }
    EXPECT_EQ(info, nullptr);
}

}

TEST(ErrorChain, IsRebuiltUpToTheFirstRecordThatIsNotWhole)
{
    std::mt19937 random(5);
    for (int round = 0; round < 200; ++round) {
        std::vector<ChainRecord> model(random() % 4);
        std::vector<std::size_t> ends = {1};
        for (auto& record : model) {
            auto const text = [&] {
                return std::string(random() % 40, static_cast<char>('a' + random() % 26));
            };
            record = {static_cast<std::uint32_t>(random() | 1), random() * 0x100000001ULL, text(), {}};
            for (unsigned i = 0, count = random() % 5; i < count; ++i)
                record.parameters.push_back(
                    {text() + std::to_string(i), "NWA"[random() % 3], text(), random()});
            if (random() % 2) record.parameters.push_back({"$line", 'N', "", random() * 3ULL});
            ends.push_back(ChainBytes({record}).size() - 1 + ends.back());
        }
        std::string const bytes = ChainBytes(model);
        ExpectChain(Parse(bytes + std::string(4, 0) + "behind the end"), model, model.size());
        for (std::size_t length = 0, whole = 0; length < bytes.size(); ++length) {
            whole += whole < model.size() && ends[whole + 1] <= length;
            ExpectChain(Parse(bytes.substr(0, length)), model, whole);
        }
    }
}

TEST(ErrorChain, OddParametersAndStops)
{
    std::vector<ChainRecord> const good = {{2, 3, "first", {{"$file", 'A', "f", 0}, {"$func", 'A', "g", 0}}}};
    Error const located = Parse(ChainBytes(good));
    EXPECT_EQ(located.info->file, InternString(std::string("f").data()));
    EXPECT_STREQ(located.info->function, "g");
    EXPECT_EQ(Parse("\2" + ChainBytes(good).substr(1)).info, nullptr);

    for (ChainRecord::Parameter const& bad :
        {ChainRecord::Parameter{"n", 'X', "", 0}, {"$line", 'A' + 32, "", 0}, {"w", 'W', "\xC1\x81", 0}}) {
        std::vector<ChainRecord> chain = {good[0], {4, 5, "", {bad}}};
        ExpectChain(Parse(ChainBytes(chain)), good, 1);
    }
    ExpectChain(Parse(ChainBytes({good[0], {4, 5, "\xFF", {}}})), good, 1);

    // By another type they are parameters like any other; a comma in a name shifts the names behind it.
    Error const odd = Parse(
        ChainBytes({{4, 5, "", {{"$file", 'N', "", 8}, {"a,b", 'N', "", 9}, {"c", 'W', "\xC3\xA4", 0}}}}));
    ErrorOps const& ops = *odd.info->ops;
    EXPECT_STREQ(ops.GetNames(odd.info), "$file,a,b,c");
    EXPECT_EQ(odd.info->file, nullptr);
    EXPECT_EQ(ops.GetNumber(odd.info, "$file"), 8);
    EXPECT_EQ(ops.GetNumber(odd.info, "a"), 9);
    EXPECT_EQ(Text(ops.GetWide(odd.info, "b")), u"\u00E4");
    EXPECT_EQ(ops.GetWide(odd.info, "c"), nullptr);

    ErrorInfo* const clone = ops.Clone(located.info);
    EXPECT_EQ(MessageOf(clone), u"first");
    Release(clone);
}

TEST(ErrorRecord, EachKindAnswersForItself)
{
    std::u16string const own = u"own";
    Error const plain(9, kHere), none(0, kHere);
    Error const text(9, reinterpret_cast<unsigned short const*>(own.c_str()), kHere);
    Error const catalogue(9, GetMessage(MessageEndOfFile), kHere);
    Error posix;
    AddPosixError(posix, ENOENT);
    EXPECT_EQ(none.info, nullptr);
    std::tuple<Error, std::u16string, unsigned, char const*> const cases[] = {{plain, u"", 0, "$module"},
        {text, u"own", 0, "$module"}, {catalogue, u"The end of the file has been reached.", 0, "$module"},
        {posix, u"No such file or directory", ENOENT, "code,$module"}};
    for (auto const& [error, message, number, names] : cases) {
        ErrorInfo* const clone = error.info->ops->Clone(error.info);
        for (ErrorInfo const* info : {error.info, clone}) {
            EXPECT_EQ(MessageOf(info), message);
            EXPECT_EQ(info->ops->GetNumber(info, "code"), number);
            EXPECT_STREQ(info->ops->GetAscii(info, "$module"), "tessella_glxa64_3500");
            EXPECT_EQ(info->ops->GetAscii(info, "code"), nullptr);
            EXPECT_EQ(info->ops->GetWide(info, "$module"), nullptr);
            EXPECT_STREQ(info->ops->GetNames(info), names);
        }
        Release(clone);
    }
    EXPECT_EQ(text.info->size - catalogue.info->size, sizeof u"own");
    EXPECT_TRUE(plain && !none && !Error());
    EXPECT_EQ(LocationOf("here", "", 9).site - kHere.site, 2);
    EXPECT_EQ(std::tuple(posix.info->code, posix.info->line), std::tuple(0xFFF1, 339));
    EXPECT_STREQ(posix.info->function, "AddPosixError");
}

TEST(ErrorRecord, ReasonIsReplacedInPlaceUnlessOthersHoldTheChain)
{
    Error error(9, kHere);
    ErrorInfo* const head = error.info;
    EXPECT_EQ(&AddPosixError(AddPosixError(error, ENOENT), EACCES), &error);
    EXPECT_EQ(error.info, head);
    EXPECT_EQ(head->reason->number, EACCES);
    EXPECT_EQ(head->reason->reason, nullptr);

    Error shared = error;
    allocationsLeft = 1;  // for the reason, not for the clone
    EXPECT_EQ(AddPosixError(shared, EIO).info, head);
    allocationsLeft = -1;
    EXPECT_EQ(AddPosixError(shared, EIO).info->reason->number, EIO);
    EXPECT_EQ(head->reason->number, EACCES);
    EXPECT_EQ(head->refs, 1);

    allocationsLeft = 0;
    Error const empty(9, GetMessage(MessageEndOfFile), kHere);
    AddPosixError(shared, EIO);
    allocationsLeft = -1;
    EXPECT_EQ(shared.info->reason, empty.info);
    EXPECT_EQ(std::tuple(empty.info->code, empty.info->size, empty.info->refs), std::tuple(0xFFF2, 64, 3));
    ExpectChain(Parse(ChainBytes({{1, 2, "x", {}}})), {{1, 2, "x", {}}}, 1);
}

TEST(ErrorRecord, HandlesToOneChainLiveOnManyThreads)
{
    Error error(9, kHere);
    AddPosixError(error, EIO);
    {
        std::vector<std::jthread> threads;
        while (threads.size() < 4)
            threads.emplace_back([error] {
                for (int i = 0; i < 1000; ++i) {
                    Error mine = error;
                    AddPosixError(mine, i);
                    EXPECT_EQ(InternString(std::to_string(i).data()), InternString(std::to_string(i).data()));
                }
            });
    }
    EXPECT_EQ(error.info->refs, 1);
    EXPECT_EQ(error.info->reason->number, EIO);
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
        EXPECT_TRUE(DecodeUtf8(out, bytes.data(), bytes.size())) << c;
        std::uint32_t const found =
            out.size() == 1 ? out[0] : 0x10000 + ((out[0] & 0x3FF) << 10) + (out[1] & 0x3FF);
        ASSERT_EQ(found, c);
    }
    std::pair<std::string, std::u16string> const mistakes[] = {{"\x80", u"\uFFFD"}, {"\xC3", u"\uFFFD"},
        {"\xE4\xB8z", u"\uFFFD\uFFFDz"}, {"\xF8\x88", u"\uFFFD\uFFFD"}, {"\xC1\xBF", u"\x7F"},
        {"\xE0\x9F\xBF", u"\u07FF"}, {"\xF0\x8F\xBF\xBF", u"\uFFFF"}, {"\xF4\x90\x80\x80y", u"\uFFFDy"}};
    for (auto const& [bytes, text] : mistakes) {
        EXPECT_FALSE(DecodeUtf8(out, bytes.data(), bytes.size()));
        EXPECT_EQ(out, text);
    }
    EXPECT_TRUE(DecodeUtf8(out, "ab\0\xFF", 4) && DecodeUtf8(out, "ab\xFF", 2));
    EXPECT_EQ(out, u"ab");
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

TEST(Messages, StandInTheBuiltInTableAndLeaveErrnoAlone)
{
    errno = EDOM;
    EXPECT_EQ(Text(GetMessage(MessageAccessDenied)), u"Access to the file is denied.");
    EXPECT_EQ(Text(GetMessage(MessageWriteFailed)), u"Error occurred while writing to the file.");
    EXPECT_EQ(Text(GetMessage(111)), u"");
    EXPECT_TRUE(IsInCatalogue(GetMessage(133)) && !IsInCatalogue(GetMessage(133) + 1));
    EXPECT_EQ(errno, EDOM);
}
