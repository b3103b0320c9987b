#include <common/assert_settings.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <optional>
#include <string_view>
#include <unistd.h>

namespace {

struct Word {
    std::string_view text;
    AssertFlags flag;
};

constexpr Word kWords[] = {
    {"break", AssertBreak},
    {"debug", AssertDebug},
    {"log", AssertLog},
    {"event", AssertEvent},
    {"msgbox", AssertMsgBox},
    {"abort", AssertAbort},
    {"stack", AssertStack},
};

constexpr std::size_t kMaxWordsLength = 127;

AssertFlags FlagOf(std::string_view text)
{
    for (Word const& word : kWords) {
        if (word.text == text) return word.flag;
    }
    return AssertOff;
}

/// Hexadecimal, as strtoull reads it. The prefix is looked for anywhere, but it is two characters at the
/// start that are left out: "10x4" is no number, "zz0x4" is one.
std::optional<std::uint64_t> ReadNumber(char const* value)
{
    if (std::strstr(value, "0x") || std::strstr(value, "0X")) value += 2;
    char* end = nullptr;
    std::uint64_t const number = std::strtoull(value, &end, 16);
    if (*end != 0 || number == 0) return std::nullopt;
    return number;
}

void ReadLogTarget(AssertSettings& settings)
{
    char const* const path = std::getenv("VELLUM_SAFE_ASSERT_LOGFILE");
    if (path == nullptr) return;
    std::string_view const target = path;
    if (target == "stdout") {
        settings.logTarget = AssertLogTarget::Stdout;
    } else if (target == "stderr") {
        settings.logTarget = AssertLogTarget::Stderr;
    } else if (settings.logFile == -1) {
        settings.logFile = open(path, O_WRONLY | O_APPEND | O_CREAT | O_CLOEXEC | O_NOCTTY, 0666);
        if (settings.logFile != -1) settings.logTarget = AssertLogTarget::File;
    }
}

void ReadWords(std::string_view value, AssertSettings& settings)
{
    value = value.substr(0, kMaxWordsLength);
    settings.flags = 0;
    for (std::size_t start = 0; start < value.size();) {
        std::size_t const end = std::min(value.find(' ', start), value.size());
        std::string_view const text = value.substr(start, end - start);
        start = end + 1;
        if (text.empty()) continue;
        AssertFlags const flag = FlagOf(text);
        settings.flags |= flag;
        if (flag == AssertLog) ReadLogTarget(settings);
    }
}

}

AssertSettings ReadAssertSettings()
{
    AssertSettings settings;
    char const* const value = std::getenv("VELLUM_SAFE_ASSERT");
    if (value == nullptr || *value == 0) return settings;
    if (auto const number = ReadNumber(value)) {
        settings.flags = *number;
        if ((settings.flags & AssertLog) != 0) ReadLogTarget(settings);
    } else {
        ReadWords(value, settings);
    }
    return settings;
}
