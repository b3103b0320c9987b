// tessella-doctor: tells why a session would not start here, and what helps.

#include <care/finding.h>

#include <algorithm>
#include <cstdio>
#include <exception>
#include <string_view>

#include <nlohmann/json.hpp>

namespace {

constexpr char kHelp[] = R"(Usage: tessella-doctor [--json]

Looks at everything that a program on the console needs: the screen, the console with its keyboard, the mouse,
and the library's own resources. Says in plain words what is wrong and what helps. Changes nothing.

  --json      the same as JSON: an array of objects with "part", "state" ("fine", "limits" or "unusable"),
              "seen" and "mend"
  --help      show this
  --version   show the version

The exit status is 0 if all is fine, 1 if programs run with limits, 2 if they don't run, or if the command
line is wrong.
)";

char const* NameOf(care::Severity severity)
{
    switch (severity) {
    case care::Severity::Fine: return "fine";
    case care::Severity::Limits: return "limits";
    default: return "unusable";
    }
}

void PrintText(care::Findings const& findings)
{
    for (auto const& finding : findings) {
        std::printf("%-10s %-9s %s\n", finding.part, NameOf(finding.severity), finding.seen.c_str());
        if (!finding.mend.empty()) std::printf("%-20s -> %s\n", "", finding.mend.c_str());
    }
}

void PrintJson(care::Findings const& findings)
{
    auto all = nlohmann::json::array();
    for (auto const& finding : findings)
        all.push_back({{"part", finding.part}, {"state", NameOf(finding.severity)}, {"seen", finding.seen},
            {"mend", finding.mend}});
    // Paths may be in any encoding.
    std::puts(all.dump(2, ' ', false, nlohmann::json::error_handler_t::replace).c_str());
}

int Follow(int count, char** words)
{
    std::string_view const word = count > 1 ? words[1] : "";
    if (word == "--help") return std::fputs(kHelp, stdout), 0;
    if (word == "--version") return std::puts("tessella-doctor " TESSELLA_VERSION), 0;
    if (count > 2 || (count == 2 && word != "--json")) {
        std::fprintf(stderr, "tessella-doctor: unknown option '%s' (--help tells more)\n", words[count - 1]);
        return 2;
    }
    care::Findings findings;
    for (auto* const check : {care::CheckScreen, care::CheckConsole, care::CheckMouse, care::CheckResources})
        check(findings);
    word == "--json" ? PrintJson(findings) : PrintText(findings);
    auto const worst = std::ranges::max(findings, {}, &care::Finding::severity).severity;
    return static_cast<int>(worst);
}

}

int main(int count, char** words)
{
    try {
        return Follow(count, words);
    } catch (std::exception const& error) {
        std::fprintf(stderr, "tessella-doctor: failed: %s\n", error.what());
        return 2;
    }
}
