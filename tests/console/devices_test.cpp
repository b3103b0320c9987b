#include <console/virtual_console.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <cstring>
#include <numeric>

#include <fcntl.h>
#include <poll.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

// The models of the devices, as this process' own device calls see them.

using namespace console;

namespace {

struct Machine : VirtualConsole {
    explicit Machine(char const* mode = "8x8x8") : VirtualConsole({*ParseMode(mode), {}, {}})
    {
        AttachProcess();
    }
};

OwnedFd Open(char const* path, int flags = O_RDWR) { return {open(path, flags), path}; }

/// What a system call failed with, 0 if it didn't.
int ErrorOf(long result) { return result == -1 ? errno : 0; }

std::vector<long> Numbers(auto... numbers) { return {static_cast<long>(numbers)...}; }

TEST(Framebuffer, DriverTellsEachModeAsTheVesaDriverDoesAlsoWhenItChangesUnderAProgram)
{
    Machine screen;
    auto const fd = Open("/dev/fb/0");
    struct {
        char const *mode, *format;
        std::vector<long> told;  // of each field but blue the offset before the length
    } const cases[] = {{"40x30x4", "", {40, 30, 4, 0, 6, 0, 6, 6, 0, 0, FB_VISUAL_PSEUDOCOLOR, 5, 65536}},
        {"40x30x8", "", {40, 30, 8, 0, 8, 0, 8, 8, 0, 8, FB_VISUAL_PSEUDOCOLOR, 40, 2400}},
        {"41x30x15", "", {41, 30, 16, 10, 5, 5, 5, 5, 15, 1, FB_VISUAL_TRUECOLOR, 82, 4920}},
        {"40x31x16", "", {40, 31, 16, 11, 5, 5, 6, 5, 0, 0, FB_VISUAL_TRUECOLOR, 80, 4960}},
        {"40x30x24", "", {40, 30, 24, 16, 8, 8, 8, 8, 0, 0, FB_VISUAL_TRUECOLOR, 120, 7200}},
        {"40x30x32", "", {40, 30, 32, 16, 8, 8, 8, 8, 24, 8, FB_VISUAL_TRUECOLOR, 160, 9600}},
        {"40x30x24", "24:5,6,5", {40, 30, 24, 11, 5, 5, 6, 5, 0, 0, FB_VISUAL_TRUECOLOR, 120, 7200}}};
    for (auto const& [mode, format, expected] : cases) {
        screen.ChangeMode(*ParseMode(mode), ParseFormat(format));
        fb_fix_screeninfo fixed{};
        fb_var_screeninfo told{};
        ASSERT_EQ(
            ioctl(fd.Get(), FBIOGET_FSCREENINFO, &fixed) | ioctl(fd.Get(), FBIOGET_VSCREENINFO, &told), 0);
        EXPECT_EQ(Numbers(told.xres, told.yres, told.bits_per_pixel, told.red.offset, told.red.length,
                      told.green.offset, told.green.length, told.blue.length, told.transp.offset,
                      told.transp.length, fixed.visual, fixed.line_length, fixed.smem_len),
            expected);
    }
}

TEST(Framebuffer, ColourMapTakesRangesAndItsPixelsOutliveTheirDescriptor)
{
    Machine screen("4x1x8");
    auto fd = Open("/dev/fb0", O_RDWR | O_TRUNC);
    std::uint16_t red[] = {0x1234, 0xFFFF}, green[] = {0x0400, 0x003F}, blue[] = {0xFC00, 0x8000};
    fb_cmap map{254, 2, red, green, blue, nullptr};
    ASSERT_EQ(ioctl(fd.Get(), FBIOPUTCMAP, &map), 0);
    EXPECT_EQ(screen.Colours().red[254], 0x1234) << "all sixteen bits are kept";
    map.start = 255;
    EXPECT_EQ(ErrorOf(ioctl(fd.Get(), FBIOPUTCMAP, &map)), EINVAL);
    EXPECT_EQ(ErrorOf(ftruncate(fd.Get(), 0)), EPERM) << "a device's memory cannot be cut";
    void* const pixels = mmap(nullptr, 4, PROT_WRITE, MAP_SHARED, fd.Get(), 0);
    fd.Close();
    std::memcpy(pixels, "\xFE\xFF", 2);
    auto const picture = screen.Screen();  // which doesn't show what lies in the lower bytes
    EXPECT_EQ(Numbers(picture.At(0, 0), picture.At(1, 0), picture.At(2, 0)), Numbers(0x1204FC, 0xFF0080, 0));
}

TEST(Passing, WhatIsNotOurDeviceGoesToTheKernel)
{
    Machine screen;
    screen.SetFault(Request::MapMemory, ENOMEM);
    errno = 77;
    OwnedFd const file(open("/tmp", O_TMPFILE | O_RDWR, 0640), "a file without a name");
    struct stat status {};
    ASSERT_EQ(fstat(file.Get(), &status), 0);
    EXPECT_EQ(status.st_mode & 0777U, 0640U) << "permissions of new files pass";
    EXPECT_EQ(write(file.Get(), "abcdefgh", 8), 8);
    for (int const flags : {MAP_PRIVATE | MAP_ANONYMOUS, MAP_PRIVATE})
        EXPECT_EQ(munmap(mmap(nullptr, 8, PROT_READ, flags, file.Get(), 0), 8), 0);
    EXPECT_EQ(errno, 77) << "nothing has failed";
    fb_var_screeninfo told{};
    EXPECT_EQ(ErrorOf(ioctl(file.Get(), FBIOGET_VSCREENINFO, &told)), ENOTTY);
    EXPECT_EQ(ErrorOf(openat(file.Get(), "dev/fb0", O_RDWR)), ENOTDIR);
}

int signalledTty, releaseAnswer = 1, released, acquired;

/// Answers as a program on a console does: with a request from within the handler.
void OnConsoleSignal(int signal)
{
    ++(signal == SIGUSR1 ? released : acquired);
    ioctl(signalledTty, VT_RELDISP, signal == SIGUSR1 ? releaseAnswer : VT_ACKACQ);
}

struct Tty : testing::Test {
    int Ask(unsigned long number, auto argument) const { return ErrorOf(ioctl(fd.Get(), number, argument)); }
    int TakeControl() const
    {
        signalledTty = fd.Get();
        signal(SIGUSR1, OnConsoleSignal);
        signal(SIGUSR2, OnConsoleSignal);
        vt_mode mode{VT_PROCESS, 0, SIGUSR1, SIGUSR2, 9};
        return Ask(VT_SETMODE, &mode);
    }

    Machine machine;
    OwnedFd fd = Open("/dev/tty0", O_RDONLY | O_NONBLOCK);
};

TEST_F(Tty, KeyBytesComeThroughUnchangedInRawMode)
{
    termios settings = machine.Terminal();
    EXPECT_NE(settings.c_lflag & ICANON, 0U) << "a console begins with lines";
    cfmakeraw(&settings);
    ASSERT_EQ(tcsetattr(fd.Get(), TCSANOW, &settings), 0);
    unsigned char byte = 0;
    EXPECT_EQ(ErrorOf(read(fd.Get(), &byte, 1)), EAGAIN);
    std::array<unsigned char, 256> keys{};
    std::iota(keys.begin(), keys.end(), 0);
    ASSERT_TRUE(machine.TypeKeys(keys));
    pollfd event{fd.Get(), POLLIN, 0};
    for (auto const key : keys)
        ASSERT_TRUE(poll(&event, 1, 5000) == 1 && read(fd.Get(), &byte, 1) == 1 && byte == key);
    fd.Close();
    EXPECT_EQ(machine.Terminal().c_lflag & ICANON, 0U) << "nobody has put the settings back";
}

TEST_F(Tty, KeyboardModesLedsAndConsoleModesAreKeptAndChecked)
{
    struct {
        unsigned long get, set;
        int refused, wanted, before, after;
    } const cases[] = {{KDGKBMODE, KDSKBMODE, 5, K_MEDIUMRAW, K_UNICODE, K_MEDIUMRAW},
        {KDGETMODE, KDSETMODE, 4, KD_GRAPHICS, KD_TEXT, KD_GRAPHICS},
        {KDGETMODE, KDSETMODE, 4, KD_TEXT1, KD_GRAPHICS, KD_TEXT}, {KDGKBLED, KDSKBLED, 8, 0x44, 0, 0x44}};
    for (auto const& c : cases)
        for (int const expected : {c.before, c.after}) {
            int const stored = c.get == KDGKBLED ? 0x11110000 : 0;  // of LEDs only one byte is stored
            int value = stored;
            EXPECT_EQ(Ask(c.get, &value), 0);
            EXPECT_EQ(value, stored | expected);
            EXPECT_EQ(Numbers(Ask(c.set, c.wanted), Ask(c.set, c.refused)), Numbers(0, EINVAL));
        }
}

TEST_F(Tty, ProgramIsAskedBeforeItsConsoleGoesAndToldWhenItIsBack)
{
    EXPECT_EQ(Ask(VT_RELDISP, VT_ACKACQ), EINVAL) << "without control";
    vt_mode mode{};
    ASSERT_TRUE(TakeControl() == 0 && Ask(VT_GETMODE, &mode) == 0);
    EXPECT_EQ(Numbers(mode.mode, mode.relsig, mode.frsig), Numbers(VT_PROCESS, SIGUSR1, 0));
    EXPECT_EQ(Ask(VT_ACTIVATE, 2), 0);
    EXPECT_EQ(machine.Tty().activeConsole, 2);
    EXPECT_TRUE(machine.SwitchTo(3) && machine.SwitchTo(1));  // console 2 has nobody to ask
    EXPECT_EQ(Numbers(released, acquired), Numbers(1, 1));
    releaseAnswer = 0;
    EXPECT_TRUE(machine.SwitchTo(2));
    vt_stat state{};
    ASSERT_EQ(Ask(VT_GETSTATE, &state), 0);
    EXPECT_EQ(state.v_active, 1) << "the program refused";
    EXPECT_EQ(Numbers(Ask(VT_RELDISP, 1), Ask(VT_ACTIVATE, 0)), Numbers(EINVAL, ENXIO)) << "it's over";
    EXPECT_FALSE(machine.SwitchTo(64));
}

TEST_F(Tty, GraphicsHoldTheConsoleUntilTheNextSwitchAfterTheDeathOfWhoControlsIt)
{
    EXPECT_EQ(Ask(KDSETMODE, KD_GRAPHICS), 0);
    EXPECT_TRUE(machine.SwitchTo(2));
    pid_t const child = fork();
    if (child == 0) _exit(TakeControl() + Ask(KDSKBMODE, K_MEDIUMRAW));
    waitpid(child, nullptr, 0);
    for (auto const& expected : {Numbers(1, KD_GRAPHICS, K_MEDIUMRAW, VT_PROCESS, child),
             Numbers(2, KD_TEXT, K_UNICODE, VT_AUTO, 0)}) {
        auto const now = machine.Tty();
        EXPECT_EQ(
            Numbers(now.activeConsole, now.consoleMode, now.keyboardMode, now.vtMode.mode, now.vtProcess),
            expected);
        EXPECT_TRUE(machine.SwitchTo(2));
    }
}

using Bytes = std::vector<unsigned char>;

Bytes const kWheelOn = {0xF3, 200, 0xF3, 100, 0xF3, 80};
Bytes const kExplorerOn = {0xF3, 200, 0xF3, 200, 0xF3, 80};

struct Mouse : testing::Test {
    /// Writes and gives everything that can be read then.
    Bytes Ask(std::vector<Bytes> const& questions) const
    {
        for (auto const& bytes : questions)
            EXPECT_EQ(write(fd.Get(), bytes.data(), bytes.size()), static_cast<ssize_t>(bytes.size()));
        Bytes answer(64);
        answer.resize(static_cast<std::size_t>(std::max(ssize_t{0}, read(fd.Get(), answer.data(), 64))));
        return answer;
    }

    Machine machine;
    OwnedFd fd;
};

TEST_F(Mouse, AnswersReplaceTheOneBeforeAndWheelSequencesHaveNoGaps)
{
    struct {
        std::vector<Bytes> questions;
        Bytes answer;
    } const cases[] = {{{{0xF2}}, {0xFA, 0}}, {{kWheelOn}, {0xFA}}, {{kWheelOn, {0xF2}}, {0xFA, 3}},
        {{{0xF3}, {200}, {0xF3, 100}, {0xF3}, {80}, {0xF2}}, {0xFA, 3}}, {{kExplorerOn, {0xF2}}, {0xFA, 4}},
        {{kWheelOn, kExplorerOn, {0xF2}}, {0xFA, 4}},
        {{{0xF3, 200, 0xF3, 100, 0xF4, 0xF3, 80}, {0xF2}}, {0xFA, 0}},
        {{{0xF3, 200}, kWheelOn, {0xF2}}, {0xFA, 0}}, {{kWheelOn, {0xFF}}, {0xFA, 0xAA, 0}},
        {{kWheelOn, {0xFF}, {0xF2}}, {0xFA, 0}}, {{{0xE9}}, {0xFA, 0x60, 3, 200}}};
    for (auto const& c : cases) {
        fd = Open("/dev/input/mice");  // plain again each time
        EXPECT_EQ(Ask(c.questions), c.answer);
    }
}

TEST_F(Mouse, PacketsHaveTheWheelOnlyWhereItIsOn)
{
    EXPECT_TRUE(machine.MoveMouse(3, 3)) << "nobody listens yet";
    fd = Open("/dev/input/mice", O_RDWR | O_NONBLOCK);
    EXPECT_EQ(Ask({}), Bytes{});
    struct {
        Bytes before;
        int dx, dy, wheel;
        unsigned buttons;
        Bytes packets;
    } const cases[] = {{{}, 10, 5, 0, 0, {0x28, 0x0A, 0xFB}}, {{}, 0, 0, 1, 0, {0x08, 0, 0}},
        {kWheelOn, 10, 5, 9, 0, {0x28, 0x0A, 0xFB, 0xF7}}, {{}, -1, 0, -1, 6, {0x1E, 0xFF, 0, 1}},
        {{}, 300, -128, 0, 1, {0x09, 127, 127, 0, 0x09, 127, 1, 0, 0x09, 46, 0, 0}},
        {kExplorerOn, 0, 0, 9, 0, {0x08, 0, 0, 0x09, 0x08, 0, 0, 0x0E}}};
    for (auto const& c : cases) {
        Ask({c.before});
        machine.MoveMouse(c.dx, c.dy, c.wheel, c.buttons);
        EXPECT_EQ(Ask({}), c.packets);
    }
    EXPECT_EQ(Ask({{0xEB}}), (Bytes{0xFA, 0x08, 0, 0, 0}));
    int kept = 0;
    while (kept < 100000 && machine.MoveMouse(1, 1))
        ++kept;
    EXPECT_LT(kept, 100000) << "who never reads loses packets, but stops nobody";
}

TEST_F(Mouse, DuplicatesAreTheMouseAndReusedNumbersAreNot)
{
    fd = Open("/dev/input/mice", O_RDWR | O_NONBLOCK);
    int const number = fd.Get();
    OwnedFd const twin(dup(number), "a duplicate");
    fd.Close();
    auto const file = Open("/dev/null", O_WRONLY);
    ASSERT_EQ(file.Get(), number);
    unsigned char answer[2];
    for (auto const& [used, expected] : {std::pair{number, -1}, {twin.Get(), 2}}) {
        EXPECT_EQ(write(used, "\xF2", 1), 1);
        EXPECT_EQ(read(twin.Get(), answer, 2), expected);
    }
}

}
