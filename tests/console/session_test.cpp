#include <support/on_console.h>
#include <tessella.h>
#include <tessella/event_wait_l.h>
#include <tessella/screen_guard.h>
#include <tessella/session_state.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstring>
#include <fstream>
#include <future>
#include <thread>

#include <fcntl.h>
#include <linux/fb.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <unistd.h>

// Sessions on the virtual console, each in a process of its own, as there is one session a process.

namespace {

using console::Request;

bool IsOpen(int fd) { return fcntl(fd, F_GETFD) != -1; }

/// The framebuffer's memory, as often as this process has it mapped for writing.
int Mappings()
{
    int count = 0;
    std::ifstream maps("/proc/self/maps");
    for (std::string line; std::getline(maps, line);)
        if (line.find("tessella-console-fb") != std::string::npos && line.find(" rw-s ") != std::string::npos)
            ++count;
    return count;
}

/// Writes all over the video memory, as whoever had the screen before.
void Soil()
{
    int const fd = open("/dev/fb0", O_RDWR);
    fb_fix_screeninfo fixed{};
    ioctl(fd, FBIOGET_FSCREENINFO, &fixed);
    void* const memory = mmap(nullptr, fixed.smem_len, PROT_READ | PROT_WRITE, MAP_SHARED, fd, 0);
    std::memset(memory, 0x5A, fixed.smem_len);
    munmap(memory, fixed.smem_len);
    close(fd);
}

bool AllBlack(console::Picture const& picture)
{
    for (auto const& byte : picture.bytes)
        if (byte != 0) return false;
    return true;
}

TEST(Session, ReportsTheModeThatTheDriverHasAndGivesEverythingBack)
{
    struct Case {
        char const* mode;
        unsigned depth, bytesPerPixel;
        std::uint32_t shown;  // of 0x4080C0, red being lowest
    };
    for (auto const& c : {Case{"320x200x8", 8, 1, 0xCC9933}, Case{"320x200x15", 15, 2, 0xC08040},
             Case{"320x200x16", 16, 2, 0xC68242}, Case{"320x200x24", 24, 3, 0xC08040},
             Case{"320x200x32", 24, 4, 0xC08040}}) {
        SCOPED_TRACE(c.mode);
        auto const outcome = OnConsole(c.mode, nullptr, [&](console::VirtualConsole& screen) {
            Soil();
            ASSERT_EQ(AllBlack(screen.Screen()), c.depth == 8) << "no colours are loaded yet in 8 bits";
            Sizes sizes{640, 480, 99};
            ASSERT_TRUE(Init(sizes));
            EXPECT_TRUE(AllBlack(screen.Screen()));
            EXPECT_EQ(sizes, (Sizes{320, 200, c.depth}));
            EXPECT_EQ(GrScreen.bytesPerPixel, c.bytesPerPixel);
            EXPECT_EQ(GrScreen.stride, 320 * c.bytesPerPixel);
            EXPECT_EQ(GrScreen.fbLength, 2 * 200 * GrScreen.stride) << "all the memory there is";
            EXPECT_EQ(GrScreen.ditherLine != nullptr, c.bytesPerPixel < 3);
            if (GrScreen.ditherLine) GrScreen.ditherLine[320 * 3 - 1] = 1;
            EXPECT_EQ(screen.CountOpens("/dev/fb/0"), 0u);
            EXPECT_EQ(screen.Count(Request::PortAccess), 1u);
            EXPECT_EQ(screen.Count(Request::OpenTty), 1u);
            EXPECT_EQ(screen.Count(Request::SetKeyboardMode), 0u) << "this program carries no layouts";
            EXPECT_EQ(screen.Count(Request::PutColourMap), c.depth == 8 ? 1u : 0u);
            EXPECT_TRUE(initialized && screenVisible);
            EXPECT_TRUE(pthread_equal(sessionThread, pthread_self()));

            GrScreen.context->SetForeColor(0x4080C0);
            GrScreen.context->DrawPixel(319, 199);
            EXPECT_EQ(screen.Screen().At(319, 199), c.shown);
            EXPECT_EQ(std::unique_ptr<GrContext>(GrImage(2, 2, 0).GetContext())->GetPixel(0, 0), 0u);

            Sizes again;
            EXPECT_FALSE(Init(again));
            EXPECT_EQ(again, Sizes());
            bool lockedOut = false;
            std::thread([&] { lockedOut = !grabMutex.try_lock(); }).join();
            EXPECT_TRUE(lockedOut) << "the session belongs to this thread";
            struct sigaction action;
            sigaction(SIGUSR1, nullptr, &action);
            EXPECT_TRUE(action.sa_handler != SIG_DFL && action.sa_handler != SIG_IGN);
            raise(SIGUSR1);  // harmless now

            std::unique_ptr<GrContext> const survivor(GrScreen.createScreenContext(GrRect{0, 0, 9, 9}, 0, 0));
            GrDone();
            survivor->FillRegion(GrRect{0, 0, 9, 9});
            EXPECT_TRUE(AllBlack(screen.Screen()));
            EXPECT_FALSE(initialized);
            EXPECT_EQ(GrScreen.context, nullptr);
            EXPECT_EQ(GrScreen.ditherLine, nullptr);
            EXPECT_FALSE(IsOpen(GrScreen.fbFd));
            EXPECT_EQ(Mappings(), 0);
            bool freed = false;
            std::thread([&] { freed = grabMutex.try_lock(); }).join();
            EXPECT_TRUE(freed);
            GrDone();
            EXPECT_FALSE(Init(again)) << "one session a process";
            EXPECT_EQ(again, Sizes());
        });
        EXPECT_EQ(outcome.err,
            "reading /dev/fb0: Inappropriate ioctl for device\n"  // the descriptor is the next tty's
            "TESSELLA: Error reading fixed information\n");
    }
}

TEST(Session, RowsAreAsFarApartAsTheDriverSays)
{
    EXPECT_EQ(RunChild([] {
        console::Setup setup{*console::ParseMode("40x30x16"), {}, {}};
        setup.mode.pitch = 128;
        console::VirtualConsole screen(setup);
        screen.AttachProcess();
        Sizes sizes;
        if (!Init(sizes) || GrScreen.stride != 128) return 1;
        GrScreen.context->SetForeColor(0xFFFFFF);
        GrScreen.context->FillRegion(GrRect{3, 7, 4, 9});
        auto const shown = screen.Screen();
        for (unsigned y = 0; y < 30; ++y)
            for (unsigned x = 0; x < 40; ++x)
                if ((shown.At(x, y) != 0) != (x == 3 && (y == 7 || y == 8))) return 2;
        return 0;
    }).status,
        0);
}

TEST(Session, LoadsTheColourCubeInPalettedModes)
{
    OnConsole("32x20x8", nullptr, [](console::VirtualConsole& screen) {
        Sizes sizes;
        ASSERT_TRUE(Init(sizes));
        auto const map = screen.Colours();
        EXPECT_EQ(map.red[25], 0xFF00);
        EXPECT_EQ(map.green[25] | map.blue[25], 0);
        EXPECT_EQ(map.blue[235], 0xFF00);
        EXPECT_EQ(map.red[255] & map.green[255] & map.blue[255], 0x3F) << "next to black in 16 bits";
    });
    OnConsole("32x20x8", nullptr, [](console::VirtualConsole& screen) {
        screen.SetFault(Request::PutColourMap, EINVAL);
        Sizes sizes;
        EXPECT_TRUE(Init(sizes)) << "other colours are no reason to fail";
    });
}

TEST(Session, TriesEachDeviceAndStaysSilentWithoutOne)
{
    OnConsole("32x20x16", nullptr, [](console::VirtualConsole& screen) {
        screen.SetPathFault("/dev/fb0", ENOENT);
        screen.SetPathFault("/dev/fb/0", EACCES);
        Sizes sizes;
        EXPECT_TRUE(Init(sizes));
        EXPECT_EQ(screen.CountOpens("/devfs/fb/0"), 1u);
    });
    auto const outcome = OnConsole("32x20x16", nullptr, [](console::VirtualConsole& screen) {
        screen.SetFault(Request::OpenFramebuffer, ENODEV);
        Sizes sizes;
        EXPECT_FALSE(Init(sizes));
        EXPECT_EQ(sizes, Sizes());
        EXPECT_EQ(screen.Count(Request::OpenFramebuffer), 3u);
        EXPECT_EQ(screen.Count(Request::PortAccess), 0u);
        EXPECT_EQ(GrScreen.fbFd, -1);
        screen.SetFault(Request::OpenFramebuffer, 0);
        EXPECT_TRUE(Init(sizes)) << "nothing was left behind";
    });
    EXPECT_EQ(outcome.err, "");
}

TEST(Session, FailuresOfTheDriverAreToldAndLeaveTheDeviceOpen)
{
    struct Case {
        Request request;
        char const* text;
    };
    for (auto const& c :
        {Case{Request::GetFixedInfo,
             "reading /dev/fb0: Input/output error\nTESSELLA: Error reading fixed information\n"},
            Case{Request::GetVariableInfo,
                "reading /dev/fb0 : Input/output error\nTESSELLA: Error reading variable information\n"}}) {
        auto const outcome = OnConsole("32x20x16", nullptr, [&](console::VirtualConsole& screen) {
            screen.SetFault(c.request, EIO);
            Sizes sizes;
            EXPECT_FALSE(Init(sizes));
            EXPECT_EQ(sizes, Sizes());
            EXPECT_TRUE(IsOpen(GrScreen.fbFd));
            EXPECT_EQ(screen.Count(Request::MapMemory), 0u);
            GrDone();
            EXPECT_TRUE(IsOpen(GrScreen.fbFd)) << "there is no session to end";
        });
        EXPECT_EQ(outcome.err, c.text);
    }
}

TEST(Session, UnsupportedModesAreRefusedWithTheirNumbers)
{
    struct Case {
        char const* mode;
        char const* format;
        char const* text;
    };
    for (auto const& c :
        {Case{"640x480x24", "24:5,6,5", "TESSELLA: unsupported video mode 640x480x24(16).\n"},
            Case{"640x480x32", "32:10,10,10", "TESSELLA: unsupported video mode 640x480x32(30).\n"},
            Case{"640x480x8", "2:8,8,8", "TESSELLA: unsupported video mode 640x480x2(24).\n"}}) {
        auto const outcome = OnConsole(c.mode, c.format, [](console::VirtualConsole&) {
            Sizes sizes;
            EXPECT_FALSE(Init(sizes));
            EXPECT_EQ(sizes, Sizes());
            EXPECT_EQ(Mappings(), 1) << "the mapping stays";
            EXPECT_EQ(GrScreen.context, nullptr);
            GrDone();
            EXPECT_TRUE(IsOpen(GrScreen.fbFd)) << "there is no session to end";
        });
        EXPECT_EQ(outcome.err, c.text);
    }
}

TEST(Session, GoesOnWithoutAMapping)
{
    auto const outcome = OnConsole("32x20x16", nullptr, [](console::VirtualConsole& screen) {
        screen.SetFault(Request::MapMemory, ENOMEM);
        Sizes sizes;
        ASSERT_TRUE(Init(sizes));
        EXPECT_EQ(sizes, (Sizes{32, 20, 16}));
        EXPECT_EQ(GrScreen.fbMemory, MAP_FAILED);
        GrScreen.context->FillRegion(GrRect{0, 0, 32, 20});
        GrScreen.context->DrawPixel(0, 0);
        EXPECT_EQ(GrScreen.context->GetPixel(0, 0), 0u);
        GrDone();
    });
    EXPECT_EQ(outcome.err,
        "mapping /dev/fb0: Cannot allocate memory\n"
        "TESSELLA: filed to map frambuffer device to memory.\n");
}

TEST(Session, ChangeOfModeFollowsTheDriver)
{
    auto const change = [](Sizes& sizes) { return GrChangeMode(sizes.width, sizes.height, sizes.depth, 7); };
    auto const outcome = OnConsole("64x48x32", nullptr, [&](console::VirtualConsole& screen) {
        Sizes sizes;
        EXPECT_FALSE(change(sizes)) << "before the session";
        EXPECT_EQ(sizes, Sizes());
        ASSERT_TRUE(Init(sizes));
        screen.ChangeMode(*console::ParseMode("32x16x8"));
        ASSERT_TRUE(change(sizes));
        EXPECT_EQ(sizes, (Sizes{32, 16, 8}));
        EXPECT_EQ(screen.Count(Request::PutColourMap), 1u);
        EXPECT_EQ(Mappings(), 1);
        GrScreen.context->SetForeColor(0xFFFFFF);
        GrScreen.context->FillRegion(GrRect{0, 0, 999, 999});
        for (auto const byte : screen.Screen().bytes)
            ASSERT_EQ(byte, 255);

        for (Request const request : {Request::GetFixedInfo, Request::GetVariableInfo}) {
            screen.SetFault(request, EIO);
            EXPECT_FALSE(change(sizes));
            EXPECT_EQ(GrScreen.context, nullptr);
            EXPECT_EQ(GrScreen.fbMemory, nullptr);
            EXPECT_EQ(Mappings(), 0);
            screen.SetFault(request, 0);
        }
        screen.ChangeMode(*console::ParseMode("16x8x16"), console::ParseFormat("16:4,4,4"));
        EXPECT_FALSE(change(sizes));
        EXPECT_EQ(sizes, (Sizes{32, 16, 8}));
        EXPECT_EQ(Mappings(), 1) << "the memory of the refused mode";
        screen.ChangeMode(*console::ParseMode("16x8x16"));
        EXPECT_TRUE(change(sizes)) << "a later call may succeed";
        EXPECT_EQ(Mappings(), 1);
        screen.SetFault(Request::GetFixedInfo, EIO);
        EXPECT_FALSE(change(sizes));
        GrDone();
        EXPECT_FALSE(IsOpen(GrScreen.fbFd)) << "the session ends without a screen too";
    });
    std::string const fixed = "TESSELLA: Error reading fixed information\n";
    EXPECT_EQ(outcome.err,
        "reading /dev/fb0: Bad file descriptor\n" + fixed + "reading /dev/fb0: Input/output error\n" + fixed +
            "reading /dev/fb0 : Input/output error\nTESSELLA: Error reading variable information\n"
            "TESSELLA: unsupported video mode 16x8x16(12).\nreading /dev/fb0: Input/output error\n" +
            fixed);
}

TEST(Session, ChangeOfModeWaitsForTheScreen)
{
    OnConsole("64x48x32", nullptr, [](console::VirtualConsole&) {
        Sizes sizes;
        ASSERT_TRUE(Init(sizes));
        hideCount = 0;  // the pointer is in use
        std::promise<void> mayEnd;
        std::promise<void> holds;
        std::thread mouse([&] {
            std::scoped_lock const lock(screenMutex);
            holds.set_value();
            mayEnd.get_future().wait();
            EXPECT_NE(GrScreen.fbMemory, nullptr);
        });
        holds.get_future().wait();
        std::thread release([&] {
            std::this_thread::sleep_for(std::chrono::milliseconds(20));
            EXPECT_NE(GrScreen.context, nullptr) << "nothing has been changed meanwhile";
            mayEnd.set_value();
        });
        EXPECT_TRUE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 0));
        EXPECT_EQ(hideCount, 0u);
        mouse.join();
        release.join();
    });
}

TEST(Session, SmallServices)
{
    EXPECT_FALSE(GrIsDdcSupport());
    EXPECT_FALSE(GrIsRefreshRateValid(1024, 768, 60) || GrIsRefreshRateValid(0, 0, 0));
    auto const outcome = RunChild([] {
        GrBeep();
        _exit(0);  // without flushing: the bell has sounded already
        return 0;
    });
    EXPECT_EQ(outcome.out, "\a");
}

}
