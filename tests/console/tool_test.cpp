#include <support/child_process.h>

#include <gtest/gtest.h>

#include <csignal>
#include <sstream>
#include <vector>

#include <png.h>

namespace {

/// What a shell does and prints, both streams being one.
ChildOutcome Shell(std::string const& command)
{
    auto const all = "{ " + command + " ; } 2>&1";
    auto outcome = RunChild([&] { return execl("/bin/sh", "sh", "-c", all.c_str(), nullptr); });
    outcome.status = WEXITSTATUS(outcome.status);
    return outcome;
}

ChildOutcome OnConsole(std::string const& words) { return Shell(CONSOLE_TOOL " " + words); }

/// From the top left, as 0xRRGGBB; none if there is no such picture.
std::vector<unsigned> ReadPicture(std::string const& path)
{
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    if (png_image_begin_read_from_file(&image, path.c_str()) == 0) return {};
    image.format = PNG_FORMAT_BGRA;
    std::vector<unsigned> pixels(std::size_t{image.width} * image.height);
    png_image_finish_read(&image, nullptr, pixels.data(), 0, nullptr);
    for (unsigned& pixel : pixels)
        pixel &= 0xFFFFFF;
    return pixels;
}

std::string const kScreenshot = testing::TempDir() + "tessella-console-" + std::to_string(getpid()) + ".png";

TEST(ConsoleTool, ScreenshotShowsThePixelsOfEachModeEvenOfAKilledProgram)
{
    struct {
        char const *options, *pixels;
        std::vector<unsigned> shown;
        int status = 0;
    } const cases[] = {
        // The probe's map: red and blue rise with the index, green falls.
        {"--mode 7x3x8", "00 01 80 fe ff", {0x00FF00, 0x01FE01, 0x807F80, 0xFE01FE, 0xFF00FF}},
        {"--mode 7x3x15", "7c00 03e0 001f 4210 ffff", {0xF80000, 0x00F800, 0x0000F8, 0x808080, 0xF8F8F8}},
        {"--mode=7x3x16", "f800 07e0 001f 8410 0821", {0xFF0000, 0x00FF00, 0x0000FF, 0x848284, 0x080408}},
        {"--mode 7x3x24", "ff0000 00ff00 0000ff 123456", {0xFF0000, 0x00FF00, 0x0000FF, 0x123456}},
        {"--mode 7x3x32", "ff0000 00ff00 ff0000ff 123456", {0xFF0000, 0x00FF00, 0x0000FF, 0x123456}},
        {"--mode 7x3x24 --pitch=32", "ff0000 123456; kill -9 $$", {0xFF0000, 0x123456}, 128 + SIGKILL},
    };
    for (auto const& c : cases) {
        auto const outcome = OnConsole(std::string(c.options) + " --screenshot " + kScreenshot +
            " -- sh -c '" DEVICE_PROBE " 0 " + c.pixels + "'");
        EXPECT_EQ(outcome.status, c.status) << outcome.out;
        std::vector<unsigned> expected(21, &c == cases ? 0x00FF00 : 0);
        std::copy(c.shown.begin(), c.shown.end(), expected.begin());
        std::copy(c.shown.begin(), c.shown.end(), expected.rbegin());
        EXPECT_EQ(ReadPicture(kScreenshot), expected) << c.options;
        unlink(kScreenshot.c_str());
    }
}

TEST(ConsoleTool, ProgramFindsAllDevicesAndTheirFaults)
{
    std::string const found =
        "/dev/fb0 ok\nIOPERM ok\nFBIOGET_FSCREENINFO ok\nFBIOGET_VSCREENINFO ok\n"
        "mode 1024x768x32(8,8,8) pitch 4096\nMMAP ok\nFBIOPUTCMAP ok\n"
        "/dev/tty0 ok\nKDGKBLED ok\nKDSKBLED ok\nKDGKBMODE ok\nKDSKBMODE ok\nKDGETMODE ok\nKDSETMODE ok\n"
        "VT_GETMODE ok\nVT_SETMODE ok\nVT_GETSTATE ok\nVT_ACTIVATE ok\nVT_WAITACTIVE ok\nVT_RELDISP ok\n"
        "/dev/mice ok\nmouse fa 03\n";
    EXPECT_EQ(OnConsole("-- " CHECKED_DEVICE_PROBE " 0").out, found);
    // All requests fail at once, each with an error of its own.
    std::string words, failed;
    int error = 0;
    std::istringstream lines(found);
    for (std::string name, rest; lines >> name && std::getline(lines, rest); failed += name + rest + "\n") {
        if (name == "mode") rest = " 0x0x0(0,0,0) pitch 0";
        if (name[0] == '/' || rest != " ok") continue;
        words += "--fault " + name + "=" + std::to_string(++error) + " ";
        rest = std::string(" ") + strerrorname_np(error);
    }
    EXPECT_EQ(OnConsole(words + DEVICE_PROBE " 0").out, failed);
}

TEST(ConsoleTool, StatusAndMessageTellWhatWentWrong)
{
    struct {
        int status;
        char const *words, *text;
    } const cases[] = {{2, "", "no program is given"}, {2, "--colour -- true", "unknown option '--colour'"},
        {2, "--mode", "--mode needs a value"},
        {2, "--mode 640x480x12 -- true", "the mode '640x480x12' isn't supported"},
        {2, "--mode 0x480x8 -- true", "isn't supported"}, {2, "--mode 8x9000x8 -- true", "isn't supported"},
        {2, "--mode 8x8x8x -- true", "isn't supported"}, {2, "--mode 644x480x4 -- true", "isn't supported"},
        {2, "--mode 1024x768x4 -- true", "isn't supported"},
        {2, "--mode 9x9x16 --pitch 17 -- true", "cannot be 17 bytes apart; its pixels need 18"},
        {2, "--pitch 17k -- true", "isn't a number of bytes"},
        {2, "--fault MMAP=EWHAT -- true", "the fault 'MMAP=EWHAT' isn't"},
        {2, "--fault /dev/null=EIO -- true", "the fault '/dev/null=EIO' isn't"},
        {2, "--report 24 -- true", "the report '24' isn't"},
        {2, "--screenshot /nonexistent/a.png -- true", "cannot write /nonexistent/a.png"},
        {127, "-- ./nonexistent", "cannot run ./nonexistent: No such file"}, {77, "-- sh -c 'exit 77'", ""},
        {0, "--help", "Usage: tessella-console"}, {0, "--report 24:5,6,5 " DEVICE_PROBE " 0", "x24(5,6,5)"},
        {0, "--fault OPEN_FB=ENODEV " DEVICE_PROBE " 0", "/dev/fb0 ENODEV"},
        {0, "--fault /dev/tty0=EACCES " DEVICE_PROBE " 0", "/dev/tty0 EACCES"},
        {0, "--fault=OPEN_MOUSE=EBUSY " DEVICE_PROBE " 0", "/dev/mice EBUSY"},
        {0, "-- sh -c 'head -c 300000 /dev/zero >/dev/tty0 && echo not held up'", "not held up\n"}};
    for (auto const& [status, words, text] : cases) {
        auto const outcome = OnConsole(words);
        EXPECT_EQ(outcome.status, status) << words;
        EXPECT_TRUE(*text ? outcome.out.find(text) != std::string::npos : outcome.out.empty()) << outcome.out;
    }
}

TEST(ConsoleTool, ExpectedPicturesAreWaitedForComparedAndBlessed)
{
    std::string const folder = testing::TempDir() + "expect" + std::to_string(getpid());
    auto const run = [&](std::string const& options, std::string const& pixels) {
        return Shell("mkdir -p " + folder + "/beside; cd " + folder +
            "; echo 'expect a.png 300\nquit' >beside/script; " CONSOLE_TOOL " --script beside/script " +
            options + " -- sh -c 'exec >/dev/null; " DEVICE_PROBE " 0; sleep 0.1; " DEVICE_PROBE " 0 " +
            pixels + "; sleep 9'");
    };
    struct {
        char const *options, *pixels, *text;
        int status;
    } const cases[] = {{"--mode 9x3x32", "ff", "beside/script:1: cannot read beside/a.png: ", 2},
        {"--mode 9x3x32 --bless", "ff 2 3", "", 0}, {"--mode 9x3x32", "ff 2 3", "", 0},
        {"--mode 9x3x32", "ff ff00", "not as in beside/a.png, see a.actual.png, see a.difference.png\n", 1},
        {"--mode 8x3x32", "ff", "see a.actual.png; it is 8x3, and not 9x3\n", 1}};
    for (auto const& [options, pixels, text, status] : cases) {
        auto const outcome = run(options, pixels);
        EXPECT_EQ(outcome.status, status) << outcome.out;
        EXPECT_NE(outcome.out.find(text), std::string::npos) << outcome.out;
    }
    auto const difference = ReadPicture(folder + "/a.difference.png");
    EXPECT_EQ(std::vector(difference.begin(), difference.begin() + 4),
        (std::vector{0xC0C0FFu, 0xFF0000u, 0xFF0000u, 0xC0C0C0u}));
    EXPECT_EQ(ReadPicture(folder + "/a.actual.png").size(), 24u);
    Shell("rm -r " + folder);
}

TEST(ConsoleTool, ScriptPlaysBesideTheProgram)
{
    auto const played = [](std::string const& script, std::string const& words) {
        return Shell("printf '" + script + "' | " CONSOLE_TOOL " --script /dev/stdin " + words);
    };
    auto const whole = played("move 3 -2\\nclick right\\nwheel up\\ntype a\\nswitch 2\\ntype b\\nswitch 1\\n"
                              "settle 50\\nscreenshot " +
            kScreenshot + "\\nquit",
        INPUT_PROBE);
    EXPECT_EQ(whole.status, 0);
    EXPECT_EQ(whole.out,
        "mouse answers fa 03\nmouse 08 03 02 00\nmouse 0a 00 00 00\nmouse 08 00 00 00\n"
        "mouse 08 00 00 ff\nkey 1e\nkey 9e\nreleased\nacquired\n");
    EXPECT_EQ(unlink(kScreenshot.c_str()), 0);
    struct {
        int status;
        char const *script, *words, *text;
    } const cases[] = {
        {2, "quit\\nquit", "-- echo started", "console: /dev/stdin:2: a command after 'quit'\n"},
        {2, "", "--print-steps --script= -- true", "--script needs the name of a file"},
        {2, "", "--script /nonexistent -- true", "cannot read /nonexistent: No such file"},
        {2, "", "--script / -- true", "cannot read /: Is a directory"},
        {0, "click", "--print-steps", "press left\nrelease left\n"}, {0, "quit", "-- sleep 60", ""},
        {5, "wait 300\\nquit", "-- sh -c \"trap 'exit 5' TERM; sleep 2 & wait\"", ""},
        {0, "wait 1", "-- sleep 0.2", ""},
        {3, "wait 60000", "-- sh -c 'exit 3'", "stdin:1: the program ended"},
        {2, "\\nclick", "-- sleep 0.1", "/dev/stdin:2: the program ended before this was done\n"},
        {2, "screenshot /nonexistent/a.png", INPUT_PROBE, "stdin:1: cannot write /nonexistent/a.png"},
        {2, "settle 300 900",
            "--mode 7x3x32 -- sh -c 'while :; do " DEVICE_PROBE " 0 $((i+=1)) >/dev/null; done'",
            "stdin:1: the screen did not stand still for 300 ms within 900 ms"}};
    for (auto const& [status, script, words, text] : cases) {
        auto const outcome = played(script, words);
        EXPECT_EQ(outcome.status, status) << script;
        EXPECT_TRUE(*text ? outcome.out.find(text) != std::string::npos : outcome.out.empty()) << outcome.out;
    }
}

TEST(ConsoleTool, ScriptDoesNotWaitForEver)
{
    // Both at once, since each takes its time.
    auto const outcome =
        Shell("printf 'wait 300\\nquit' >" + kScreenshot + "; " CONSOLE_TOOL " --script " + kScreenshot +
            " -- sh -c \"trap '' TERM; while :; do sleep 1; done\" & "
            "echo click | " CONSOLE_TOOL " --script /dev/stdin -- sleep 60; echo $?; wait $!; echo $?");
    EXPECT_EQ(outcome.out,
        "tessella-console: /dev/stdin:1: the program has not opened the mouse and read its answers within "
        "10000 ms\n2\n137\n");
    unlink(kScreenshot.c_str());
}

TEST(ConsoleTool, ProgramEndsWithTheTool)
{
    // The tool hands on a request to end; its sudden death takes the program along.
    for (std::string const signal : {"TERM", "HUP", "KILL"})
        EXPECT_EQ(Shell("signal=" + signal +
                      "; exec 2>/dev/null; file=/tmp/tessella-console-$$;" CONSOLE_TOOL
                      " -- sh -c 'echo $$; exec sleep 60' >$file & tool=$!;"
                      "until [ -s $file ]; do sleep 0.05; done; read program <$file; rm $file;"
                      "kill -$signal $tool; wait $tool; kill -l $?; for i in 1 2 3 4 5 6 7 8 9 10; do"
                      " grep -q 'State:.[RSD]' /proc/$program/status || exec echo gone; sleep 0.1; done")
                      .out,
            signal + "\ngone\n");
}

}
