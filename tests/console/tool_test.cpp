#include <gtest/gtest.h>

#include <csignal>
#include <cstdio>
#include <filesystem>
#include <string>
#include <vector>

#include <png.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

struct Outcome {
    int status = -1;
    std::string text;  // both streams
};

Outcome Shell(std::string const& command)
{
    Outcome outcome;
    FILE* const pipe = popen(("{ " + command + " ; } 2>&1").c_str(), "r");
    for (int c = std::fgetc(pipe); c != EOF; c = std::fgetc(pipe))
        outcome.text += static_cast<char>(c);
    int const status = pclose(pipe);
    outcome.status = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    return outcome;
}

Outcome OnConsole(std::string const& words) { return Shell(CONSOLE_TOOL " " + words); }

std::string Screenshot()
{
    auto const* const test = testing::UnitTest::GetInstance()->current_test_info();
    return testing::TempDir() + "tessella-console-" + test->name() + ".png";
}

struct Png {
    unsigned width = 0;
    unsigned height = 0;
    std::vector<unsigned> pixels;  // 0xRRGGBB
};

Png ReadAndRemove(std::string const& path)
{
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    if (png_image_begin_read_from_file(&image, path.c_str()) == 0) return {};
    image.format = PNG_FORMAT_RGB;
    std::vector<unsigned char> bytes(PNG_IMAGE_SIZE(image));
    png_image_finish_read(&image, nullptr, bytes.data(), 0, nullptr);
    std::filesystem::remove(path);
    Png png{image.width, image.height, {}};
    for (std::size_t i = 0; i + 2 < bytes.size(); i += 3)
        png.pixels.push_back(unsigned{bytes[i]} << 16 | unsigned{bytes[i + 1]} << 8 | bytes[i + 2]);
    return png;
}

TEST(ConsoleTool, ScreenshotShowsThePixelsOfEachMode)
{
    struct Case {
        char const* options;
        char const* pixels;
        std::vector<unsigned> shown;
        unsigned background = 0;
    };
    for (auto const& [options, pixels, shown, background] : {
             // The probe's map: red and blue rise with the index, green falls.
             Case{"--mode 7x3x8", "00 01 80 fe ff", {0x00FF00, 0x01FE01, 0x807F80, 0xFE01FE, 0xFF00FF},
                 0x00FF00},
             Case{"--mode 7x3x15", "7c00 03e0 001f 4210 ffff",
                 {0xF80000, 0x00F800, 0x0000F8, 0x808080, 0xF8F8F8}},
             Case{"--mode=7x3x16", "f800 07e0 001f 8410 0821",
                 {0xFF0000, 0x00FF00, 0x0000FF, 0x848284, 0x080408}},
             Case{"--mode 7x3x24", "ff0000 00ff00 0000ff 123456", {0xFF0000, 0x00FF00, 0x0000FF, 0x123456}},
             Case{"--mode 7x3x32", "ff0000 00ff00 ff0000ff 123456", {0xFF0000, 0x00FF00, 0x0000FF, 0x123456}},
             Case{"--mode 7x3x24 --pitch=32", "ff0000 123456", {0xFF0000, 0x123456}},
         }) {
        SCOPED_TRACE(options);
        auto const outcome = OnConsole(
            std::string(options) + " --screenshot " + Screenshot() + " -- " DEVICE_PROBE " draw " + pixels);
        EXPECT_EQ(outcome.status, 0) << outcome.text;
        auto const png = ReadAndRemove(Screenshot());
        std::vector<unsigned> expected(21, background);
        std::copy(shown.begin(), shown.end(), expected.begin());
        std::copy(shown.begin(), shown.end(), expected.rbegin());
        EXPECT_EQ(png.width, 7u);
        EXPECT_EQ(png.pixels, expected);
    }
}

TEST(ConsoleTool, ScreenshotIsTakenOfAKilledProgram)
{
    auto const outcome =
        OnConsole("--mode 2x1x32 --screenshot " + Screenshot() + " -- " DEVICE_PROBE " die abcdef");
    EXPECT_EQ(outcome.status, 128 + SIGKILL) << outcome.text;
    EXPECT_EQ(ReadAndRemove(Screenshot()).pixels, (std::vector{0xABCDEFu, 0xABCDEFu}));
}

TEST(ConsoleTool, ProgramFindsAllDevices)
{
    std::string const everything =
        "/dev/fb0 ok\nIOPERM ok\nFBIOGET_FSCREENINFO ok\nFBIOGET_VSCREENINFO ok\n"
        "mode 1024x768x32(8,8,8) pitch 4096\nMMAP ok\nFBIOPUTCMAP ok\n"
        "/dev/tty0 ok\nKDGKBLED ok\nKDSKBLED ok\nKDGKBMODE ok\nKDSKBMODE ok\n"
        "KDGETMODE ok\nKDSETMODE ok\nVT_GETMODE ok\nVT_SETMODE ok\nVT_GETSTATE ok\n"
        "VT_ACTIVATE ok\nVT_RELDISP ok\ntermios ok\n"
        "/dev/mice ok\nmouse fa 03\n";
    EXPECT_EQ(OnConsole(DEVICE_PROBE " look").text, everything);
    EXPECT_EQ(OnConsole("-- " CHECKED_DEVICE_PROBE " look 0").text, everything);
    EXPECT_EQ(OnConsole("-- sh -c '" DEVICE_PROBE " look; true'").text, everything)
        << "so do programs of the program";
}

TEST(ConsoleTool, FaultsReachTheProgramWithTheirErrors)
{
    for (std::string const request : {"IOPERM", "FBIOGET_FSCREENINFO", "FBIOGET_VSCREENINFO", "MMAP",
             "FBIOPUTCMAP", "KDGKBLED", "KDSKBLED", "KDGKBMODE", "KDSKBMODE", "KDGETMODE", "KDSETMODE",
             "VT_GETMODE", "VT_SETMODE", "VT_GETSTATE", "VT_ACTIVATE", "VT_RELDISP"}) {
        auto text = OnConsole("--fault " + request + "=EXDEV -- " DEVICE_PROBE " look").text;
        auto const line = "\n" + request + " EXDEV\n";
        auto const at = text.find(line);
        ASSERT_NE(at, std::string::npos) << request << "\n" << text;
        text.erase(at, line.size());
        EXPECT_EQ(text.find("EXDEV"), std::string::npos) << request << " fails alone\n" << text;
    }
    EXPECT_NE(OnConsole("--fault OPEN_FB=ENODEV " DEVICE_PROBE " look")
                  .text.find("/dev/fb0 ENODEV\n/dev/fb/0 ENODEV\n/devfs/fb/0 ENODEV\n"),
        std::string::npos);
    EXPECT_NE(OnConsole("--fault /dev/tty0=13 --fault OPEN_MOUSE=EBUSY " DEVICE_PROBE " look")
                  .text.find("/dev/tty0 EACCES\n/dev/tty ok\n"),
        std::string::npos);
    EXPECT_NE(OnConsole("--mode 640x480x24 --report 24:5,6,5 " DEVICE_PROBE " look")
                  .text.find("mode 640x480x24(5,6,5)"),
        std::string::npos);
}

TEST(ConsoleTool, StatusAndMessageTellWhatWentWrong)
{
    struct Case {
        char const* words;
        int status;
        char const* text;
    };
    for (auto const& [words, status, text] : {
             Case{"", 2, "no program is given"},
             Case{"--mode 8x8x8 --", 2, "no program is given"},
             Case{"--colour -- true", 2, "unknown option '--colour'"},
             Case{"-m -- true", 2, "unknown option '-m'"},
             Case{"--mode", 2, "--mode needs a value"},
             Case{"--mode 640x480x12 -- true", 2, "the mode '640x480x12' isn't supported"},
             Case{"--mode 640x480x4 -- true", 2, "the mode '640x480x4' isn't supported"},
             Case{"--mode 640x480 -- true", 2, "isn't supported"},
             Case{"--mode 0x480x8 -- true", 2, "isn't supported"},
             Case{"--mode 8x9000x8 -- true", 2, "isn't supported"},
             Case{"--mode 8x8x8x -- true", 2, "isn't supported"},
             Case{"--mode 9x9x16 --pitch 17 -- true", 2, "cannot be 17 bytes apart; its pixels need 18"},
             Case{"--pitch 17k -- true", 2, "isn't a number of bytes"},
             Case{"--fault MMAP -- true", 2, "the fault 'MMAP' isn't"},
             Case{"--fault MMAP=EWHAT -- true", 2, "the fault 'MMAP=EWHAT' isn't"},
             Case{"--fault /dev/null=EIO -- true", 2, "the fault '/dev/null=EIO' isn't"},
             Case{"--report 24 -- true", 2, "the report '24' isn't"},
             Case{"--screenshot /nonexistent/a.png -- true", 2, "cannot write /nonexistent/a.png"},
             Case{"-- ./nonexistent", 127, "cannot run ./nonexistent: No such file"},
             Case{"-- /tmp", 127, "cannot run /tmp: Permission denied"},
             Case{"-- sh -c 'exit 77'", 77, ""},
             Case{"-- sh -c 'kill -11 $$'", 128 + SIGSEGV, ""},
             Case{"--help", 0, "Usage: tessella-console"},
         }) {
        SCOPED_TRACE(words);
        auto const outcome = OnConsole(words);
        EXPECT_EQ(outcome.status, status) << outcome.text;
        EXPECT_NE(outcome.text.find(text), std::string::npos) << outcome.text;
        EXPECT_EQ(outcome.text.empty(), *text == '\0') << outcome.text;
    }
}

TEST(ConsoleTool, ProgramEndsWithTheTool)
{
    // The tool hands on a request to end; its sudden death takes the program along.
    for (auto const& [signal, status] : {std::pair{"TERM", "143"}, {"HUP", "129"}, {"KILL", "137"}}) {
        auto const outcome = Shell("exec 3>&1; " CONSOLE_TOOL " -- sh -c 'echo $$; exec " DEVICE_PROBE
                                   " wait' >/tmp/tessella-console-$$ & tool=$!;"
                                   "until grep -q ready /tmp/tessella-console-$$; do sleep 0.05; done;"
                                   "read program </tmp/tessella-console-$$; rm /tmp/tessella-console-$$;"
                                   "kill -" +
            std::string(signal) +
            " $tool; wait $tool; echo status $?;"
            "alive() { grep -qs 'State:.[RSD]' /proc/$program/status; };"
            "for i in 1 2 3 4 5 6 7 8 9 10; do alive || break; sleep 0.1; done;"
            "alive && echo survives || echo gone");
        EXPECT_NE(outcome.text.find(std::string("status ") + status + "\n"), std::string::npos)
            << outcome.text;
        EXPECT_NE(outcome.text.find("gone"), std::string::npos) << outcome.text;
    }
}

TEST(ConsoleTool, ChattyProgramIsNotHeldUpByItsTty)
{
    EXPECT_EQ(OnConsole("-- sh -c 'head -c 300000 /dev/zero >/dev/tty0 && echo done'").text, "done\n");
}

}
