#include <console/virtual_console.h>
#include <support/child_process.h>
#include <tessella.h>
#include <tessella/event_wait_l.h>
#include <tessella/session_state.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <cstring>
#include <thread>

#include <fcntl.h>
#include <sys/mman.h>

// Sessions on the virtual console, each in a process of its own, as there is one session a process.

namespace {

using console::Request;

struct Sizes {
    unsigned width = 1, height = 2, depth = 3;

    bool operator==(Sizes const&) const = default;
};

bool Init(Sizes& sizes) { return GrInit(sizes.width, sizes.height, sizes.depth, 0); }

/// Runs `body` on a console of its own; what it expects is reported by the parent.
template <typename Body>
ChildOutcome OnConsole(char const* mode, char const* format, Body body)
{
    ChildOutcome outcome = RunChild([&] {
        console::Setup setup{*console::ParseMode(mode), {}, {}};
        if (format) setup.format = console::ParseFormat(format);
        console::VirtualConsole screen(setup);
        screen.AttachProcess();
        body(screen);
        return testing::Test::HasFailure() ? 1 : 0;
    });
    EXPECT_EQ(outcome.status, 0) << outcome.out;
    return outcome;
}

bool IsOpen(int fd) { return fcntl(fd, F_GETFD) != -1; }

bool IsMapped(void* memory, std::size_t length)
{
    unsigned char resident[4096];
    return mincore(memory, std::min<std::size_t>(length, sizeof resident), resident) == 0;
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
    };
    for (auto const& c : {Case{"320x200x8", 8, 1}, Case{"320x200x15", 15, 2}, Case{"320x200x16", 16, 2},
             Case{"320x200x24", 24, 3}, Case{"320x200x32", 24, 4}}) {
        SCOPED_TRACE(c.mode);
        auto const outcome = OnConsole(c.mode, nullptr, [&](console::VirtualConsole& screen) {
            Sizes sizes{640, 480, 99};
            ASSERT_TRUE(Init(sizes));
            EXPECT_EQ(sizes, (Sizes{320, 200, c.depth}));
            EXPECT_EQ(GrScreen.bytesPerPixel, c.bytesPerPixel);
            EXPECT_EQ(GrScreen.stride, 320 * c.bytesPerPixel);
            EXPECT_EQ(GrScreen.ditherLine != nullptr, c.bytesPerPixel < 3);
            EXPECT_EQ(screen.Count(Request::PortAccess), 1u);
            EXPECT_EQ(screen.Count(Request::PutColourMap), c.depth == 8 ? 1u : 0u);
            EXPECT_TRUE(initialized && screenVisible);
            EXPECT_TRUE(AllBlack(screen.Screen()));

            Sizes again;
            EXPECT_FALSE(Init(again));
            EXPECT_EQ(again, Sizes());
            bool lockedOut = false;
            std::thread([&] { lockedOut = !grabMutex.try_lock(); }).join();
            EXPECT_TRUE(lockedOut) << "the session belongs to this thread";
            raise(SIGUSR1);  // harmless now

            GrScreen.context->SetForeColor(0xFFFFFF);
            GrScreen.context->DrawPixel(319, 199);
            EXPECT_FALSE(AllBlack(screen.Screen()));
            GrDone();
            EXPECT_TRUE(AllBlack(screen.Screen()));
            EXPECT_FALSE(initialized);
            EXPECT_EQ(GrScreen.context, nullptr);
            EXPECT_EQ(GrScreen.ditherLine, nullptr);
            EXPECT_FALSE(IsOpen(GrScreen.fbFd));
            EXPECT_FALSE(IsMapped(GrScreen.fbMemory, GrScreen.fbLength));
            bool freed = false;
            std::thread([&] { freed = grabMutex.try_lock(); }).join();
            EXPECT_TRUE(freed);
            GrDone();
            EXPECT_FALSE(Init(again)) << "one session a process";
            EXPECT_EQ(again, Sizes());
        });
        EXPECT_EQ(outcome.err,
            "reading /dev/fb0: Bad file descriptor\nTESSELLA: Error reading fixed information\n");
    }
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
        EXPECT_EQ(map.red[255], 0x3F);
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
            Case{"640x480x8", "4:8,8,8", "TESSELLA: unsupported video mode 640x480x4(24).\n"}}) {
        auto const outcome = OnConsole(c.mode, c.format, [](console::VirtualConsole&) {
            Sizes sizes;
            EXPECT_FALSE(Init(sizes));
            EXPECT_EQ(sizes, Sizes());
            EXPECT_TRUE(IsMapped(GrScreen.fbMemory, GrScreen.fbLength)) << "the mapping stays";
            EXPECT_EQ(GrScreen.context, nullptr);
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
        EXPECT_EQ(GrScreen.context->GetPixel(0, 0), 0u);
        GrDone();
    });
    EXPECT_EQ(outcome.err,
        "mapping /dev/fb0: Cannot allocate memory\n"
        "TESSELLA: filed to map frambuffer device to memory.\n");
}

TEST(Session, ChangeOfModeFollowsTheDriver)
{
    auto const outcome = OnConsole("64x48x32", nullptr, [](console::VirtualConsole& screen) {
        Sizes sizes;
        EXPECT_FALSE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 0)) << "before the session";
        EXPECT_EQ(sizes, Sizes());
        ASSERT_TRUE(Init(sizes));
        screen.ChangeMode(*console::ParseMode("32x16x16"));
        ASSERT_TRUE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 7));
        EXPECT_EQ(sizes, (Sizes{32, 16, 16}));
        GrScreen.context->SetForeColor(0xFFFFFF);
        GrScreen.context->FillRegion(GrRect{0, 0, 999, 999});
        for (auto const byte : screen.Screen().bytes)
            ASSERT_EQ(byte, 255);

        screen.SetFault(Request::GetFixedInfo, EIO);
        EXPECT_FALSE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 0));
        EXPECT_EQ(GrScreen.context, nullptr);
        EXPECT_EQ(GrScreen.fbMemory, nullptr);
        screen.SetFault(Request::GetFixedInfo, 0);
        EXPECT_TRUE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 0)) << "a later call may succeed";
        screen.SetFault(Request::GetFixedInfo, EIO);
        EXPECT_FALSE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 0));
        GrDone();
        EXPECT_FALSE(IsOpen(GrScreen.fbFd)) << "the session ends without a screen too";
    });
    EXPECT_EQ(outcome.err,
        "reading /dev/fb0: Bad file descriptor\nTESSELLA: Error reading fixed information\n"
        "reading /dev/fb0: Input/output error\nTESSELLA: Error reading fixed information\n"
        "reading /dev/fb0: Input/output error\nTESSELLA: Error reading fixed information\n");
}

TEST(Session, SmallServices)
{
    EXPECT_FALSE(GrIsDdcSupport());
    EXPECT_FALSE(GrIsRefreshRateValid(1024, 768, 60));
    auto const outcome = RunChild([] {
        GrBeep();
        _exit(0);  // without flushing: the bell has sounded already
        return 0;
    });
    EXPECT_EQ(outcome.out, "\a");
}

}
