// tessella-shot: writes a picture of what the real framebuffer shows now.

#include <care/screen_picture_l.h>

#include <cstdio>
#include <string_view>

namespace {

constexpr char kHelp[] = R"(Usage: tessella-shot FILE.png

Writes what the screen of the console shows now, whatever program draws there. Needs the right to read
/dev/fb0, which members of the group "video" have.

  --help      show this
  --version   show the version

The exit status is 0; 1 if the picture couldn't be taken or written; 2 if the command line is wrong.
)";

int Complain(std::string const& problem, int status)
{
    std::fprintf(stderr, "tessella-shot: %s\n", problem.c_str());
    return status;
}

}

int main(int count, char** words)
{
    std::string_view const word = count > 1 ? words[1] : "";
    if (word == "--help") return std::fputs(kHelp, stdout), 0;
    if (word == "--version") return std::puts("tessella-shot " TESSELLA_VERSION), 0;
    if (count != 2 || word.empty() || word.starts_with('-'))
        return Complain("one file to write must be given (--help tells more)", 2);
    auto const taken = care::TakeScreenPicture();
    if (auto const* const problem = std::get_if<std::string>(&taken)) return Complain(*problem, 1);
    std::string const problem = console::SavePicture(std::get<console::Picture>(taken), words[1]);
    return problem.empty() ? 0 : Complain("cannot write " + std::string(word) + ": " + problem, 1);
}
