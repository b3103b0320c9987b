#include <console/recording.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <system_error>

#include <fcntl.h>
#include <unistd.h>

namespace console {

namespace {

using std::chrono::milliseconds;

constexpr milliseconds kShortestPause{20};
constexpr milliseconds kLongestPause{3600000};  // that a script may have
constexpr std::size_t kLongestLine = 100;
constexpr std::string_view kMove = "move";

bool IsRelease(StepAction const& action, std::string const& line)
{
    auto const* const key = std::get_if<KeyByte>(&action);
    return key != nullptr ? (key->code & KeyByte::kReleased) != 0 : line.starts_with("release");
}

}

Recording::Recording(std::string const& path, std::string const& comment)
    : name(path), file(open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666),
                      ("cannot write " + path).c_str())
{
    Write("# " + comment);
    if (error != 0) throw std::system_error(error, std::generic_category(), "cannot write " + path);
}

void Recording::Add(StepAction const& action)
{
    auto const line = printer.Print(action);
    if (line.starts_with(kMove)) {
        AddPause();
        auto const pair = line.substr(kMove.size());
        if (moves.size() + pair.size() > kLongestLine) WriteMoves();
        moves += moves.empty() ? line : pair;
        unreadReleases.reset();
        return;
    }
    WriteMoves();
    if (!IsRelease(action, line))
        unreadReleases.reset();
    else if (!unreadReleases)
        unreadReleases = lseek(file.Get(), 0, SEEK_CUR);
    AddPause();
    Write(line);
}

void Recording::OnRead()
{
    doneAt = Clock::now();
    unreadReleases.reset();
}

/// With a pause the row of moves is over.
void Recording::OnIdle()
{
    if (Clock::now() - doneAt + owed >= kShortestPause) WriteMoves();
}

/// A program that ends by itself does so before the keys that ended it are let go of. A script that wanted to
/// let go of them would come too late.
std::string Recording::End(bool asked)
{
    if (asked) {
        Add(Quit());
    } else {
        WriteMoves();
        if (unreadReleases && ftruncate(file.Get(), *unreadReleases) == -1 && error == 0) error = errno;
    }
    return error == 0 ? std::string() : "cannot write " + name + ": " + std::strerror(error);
}

void Recording::AddPause()
{
    auto const now = Clock::now();
    owed += now - doneAt;
    doneAt = now;
    if (owed < kShortestPause) return;
    WriteMoves();
    Write(printer.Print(Pause{std::min(std::chrono::floor<milliseconds>(owed), kLongestPause)}));
    owed = {};
}

void Recording::WriteMoves()
{
    if (!moves.empty()) Write(moves);
    moves.clear();
}

void Recording::Write(std::string const& line)
{
    auto const text = line + "\n";
    for (std::size_t at = 0; at < text.size() && error == 0;) {
        auto const written = write(file.Get(), text.data() + at, text.size() - at);
        if (written == -1 && errno != EINTR) error = errno;
        if (written > 0) at += static_cast<std::size_t>(written);
    }
}

}
