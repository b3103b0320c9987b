#include <console/virtual_console.h>

#include <gtest/gtest.h>

#include <array>
#include <cerrno>
#include <cstring>
#include <memory>

#include <fcntl.h>
#include <linux/fb.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

namespace console {

namespace {

std::unique_ptr<VirtualConsole> Start(char const* mode, unsigned pitch = 0)
{
    Setup setup{*ParseMode(mode), {}, {}};
    if (pitch != 0) setup.mode.pitch = pitch;
    auto made = std::make_unique<VirtualConsole>(setup);
    made->AttachProcess();
    return made;
}

unsigned char* MapScreen(int fd, std::size_t length)
{
    return static_cast<unsigned char*>(mmap(nullptr, length, PROT_READ | PROT_WRITE, MAP_SHARED, fd, 0));
}

TEST(Framebuffer, DriverTellsEachModeAsTheVesaDriverDoes)
{
    struct Case {
        char const* mode;
        unsigned bits, red, redAt, green, greenAt, blue, spare, spareAt, visual, pitch;
    };
    for (auto const& expected : {
             Case{"40x30x8", 8, 8, 0, 8, 0, 8, 8, 0, FB_VISUAL_PSEUDOCOLOR, 40},
             Case{"40x30x15", 16, 5, 10, 5, 5, 5, 1, 15, FB_VISUAL_TRUECOLOR, 80},
             Case{"40x30x16", 16, 5, 11, 6, 5, 5, 0, 0, FB_VISUAL_TRUECOLOR, 80},
             Case{"40x30x24", 24, 8, 16, 8, 8, 8, 0, 0, FB_VISUAL_TRUECOLOR, 120},
             Case{"40x30x32", 32, 8, 16, 8, 8, 8, 8, 24, FB_VISUAL_TRUECOLOR, 160},
         }) {
        SCOPED_TRACE(expected.mode);
        auto const screen = Start(expected.mode);
        OwnedFd const fd(open("/dev/fb/0", O_RDWR), "fb");
        fb_fix_screeninfo fixed{};
        fb_var_screeninfo variable{};
        ASSERT_EQ(ioctl(fd.Get(), FBIOGET_FSCREENINFO, &fixed), 0);
        ASSERT_EQ(ioctl(fd.Get(), FBIOGET_VSCREENINFO, &variable), 0);
        EXPECT_EQ(variable.xres, 40u);
        EXPECT_EQ(variable.yres, 30u);
        EXPECT_EQ(variable.bits_per_pixel, expected.bits);
        EXPECT_EQ(variable.red.length, expected.red);
        EXPECT_EQ(variable.red.offset, expected.redAt);
        EXPECT_EQ(variable.green.length, expected.green);
        EXPECT_EQ(variable.green.offset, expected.greenAt);
        EXPECT_EQ(variable.blue.length, expected.blue);
        EXPECT_EQ(variable.transp.length, expected.spare);
        EXPECT_EQ(variable.transp.offset, expected.spareAt);
        EXPECT_EQ(fixed.visual, expected.visual);
        EXPECT_EQ(fixed.line_length, expected.pitch);
        EXPECT_EQ(fixed.smem_len, expected.pitch * 30 * 2);
        EXPECT_EQ(screen->CountOpens("/dev/fb/0"), 1u);
        EXPECT_EQ(screen->CountOpens("/dev/fb0"), 0u);
    }
}

TEST(Framebuffer, PixelsFollowThePitchAndOutliveTheirDescriptor)
{
    auto const screen = Start("3x2x16", 10);
    unsigned char* pixels = nullptr;
    {
        OwnedFd const fd(open("/dev/fb0", O_RDWR | O_TRUNC), "fb");
        pixels = MapScreen(fd.Get(), 40);
        EXPECT_EQ(ftruncate(fd.Get(), 0), -1) << "a device's memory cannot be cut";
    }
    ASSERT_NE(pixels, MAP_FAILED);
    unsigned char const green[] = {0xE0, 0x07};
    std::memcpy(pixels + 10 + 4, green, sizeof green);
    auto const picture = screen->Screen();
    EXPECT_EQ(picture.At(2, 1), 0x00FF00u);
    EXPECT_EQ(picture.At(1, 1), 0u);
    EXPECT_EQ(picture.At(2, 0), 0u);
    munmap(pixels, 40);
}

TEST(Framebuffer, ColourMapTakesRangesAndRefusesWhatReachesBeyond)
{
    auto const screen = Start("4x1x8");
    OwnedFd const fd(open("/dev/fb0", O_RDWR), "fb");
    std::uint16_t red[] = {0x1234, 0xFFFF}, green[] = {0x0400, 0x003F}, blue[] = {0xFC00, 0x8000};
    fb_cmap map{254, 2, red, green, blue, nullptr};
    ASSERT_EQ(ioctl(fd.Get(), FBIOPUTCMAP, &map), 0);
    auto const colours = screen->Colours();
    EXPECT_EQ(colours.red[254], 0x1234) << "all sixteen bits are kept";
    EXPECT_EQ(colours.green[255], 0x003F);
    EXPECT_EQ(colours.red[253], 0);
    map.start = 255;
    EXPECT_EQ(ioctl(fd.Get(), FBIOPUTCMAP, &map), -1);
    EXPECT_EQ(errno, EINVAL);

    unsigned char* const pixels = MapScreen(fd.Get(), 8);
    pixels[0] = 254;
    pixels[1] = 255;
    auto const picture = screen->Screen();
    EXPECT_EQ(picture.At(0, 0), 0x1204FCu);
    EXPECT_EQ(picture.At(1, 0), 0xFF0080u) << "what lies in the lower byte isn't seen";
    munmap(pixels, 8);
}

TEST(Framebuffer, ModeAndFormatCanChangeUnderAProgram)
{
    auto const screen = Start("8x8x32");
    OwnedFd const fd(open("/dev/fb0", O_RDWR), "fb");
    fb_var_screeninfo variable{};
    screen->ChangeMode(*ParseMode("16x4x24"), ParseFormat("24:5,6,5"));
    ASSERT_EQ(ioctl(fd.Get(), FBIOGET_VSCREENINFO, &variable), 0);
    EXPECT_EQ(variable.xres, 16u);
    EXPECT_EQ(variable.red.length + variable.green.length + variable.blue.length, 16u);
    EXPECT_EQ(screen->Screen().bytes.size(), 16u * 4 * 3);
}

TEST(Faults, EachRequestFailsAloneWithItsErrorAndIsCounted)
{
    auto const screen = Start("8x8x8");
    OwnedFd const fd(open("/dev/fb0", O_RDWR), "fb");
    OwnedFd const tty(open("/dev/tty0", O_RDONLY), "tty");
    std::array<char, 512> argument{};
    for (auto const& info : kRequests) {
        if (info.number == 0) continue;
        SCOPED_TRACE(info.name);
        int const device = info.device == Device::Tty ? tty.Get() : fd.Get();
        screen->SetFault(info.request, ENXIO);
        EXPECT_EQ(ioctl(device, info.number, argument.data()), -1);
        EXPECT_EQ(errno, ENXIO);
        EXPECT_EQ(screen->Count(info.request), 1u);
        screen->SetFault(info.request, 0);
    }
    screen->SetFault(Request::MapMemory, ENOMEM);
    EXPECT_EQ(MapScreen(fd.Get(), 8), MAP_FAILED);
    EXPECT_EQ(errno, ENOMEM);
    OwnedFd const other(open("/dev/zero", O_RDWR), "zero");
    unsigned char* const zeros = MapScreen(other.Get(), 8);
    EXPECT_NE(zeros, MAP_FAILED) << "other files are still mapped";
    munmap(zeros, 8);
    screen->SetPathFault("/dev/fb0", ENODEV);
    EXPECT_EQ(open("/dev/fb0", O_RDWR), -1);
    EXPECT_EQ(errno, ENODEV);
    EXPECT_NE(OwnedFd(open("/devfs/fb/0", O_RDWR), "the other path").Get(), -1);
    screen->SetFault(Request::OpenFramebuffer, EACCES);
    EXPECT_EQ(open("/devfs/fb/0", O_RDWR), -1);
    EXPECT_EQ(errno, EACCES);
}

TEST(Passing, WhatIsNotOurDeviceGoesToTheKernel)
{
    auto const screen = Start("8x8x8");
    errno = 77;
    OwnedFd const null(open("/dev/null", O_RDWR), "null");
    OwnedFd const folder(open("/tmp", O_TMPFILE | O_RDWR, 0640), "a file without a name");
    struct stat status {};
    ASSERT_EQ(fstat(folder.Get(), &status), 0);
    EXPECT_EQ(status.st_mode & 0777u, 0640u) << "permissions of new files pass";
    int pipes[2];
    ASSERT_EQ(pipe(pipes), 0);
    OwnedFd const readEnd(pipes[0], "pipe"), writeEnd(pipes[1], "pipe");
    EXPECT_EQ(write(writeEnd.Get(), "abc", 3), 3);
    int waiting = 0;
    EXPECT_EQ(ioctl(readEnd.Get(), FIONREAD, &waiting), 0);
    EXPECT_EQ(waiting, 3);
    void* const anonymous = mmap(nullptr, 8, PROT_READ, MAP_PRIVATE | MAP_ANONYMOUS, 9999, 0);
    EXPECT_NE(anonymous, MAP_FAILED);
    EXPECT_EQ(munmap(anonymous, 8), 0);
    EXPECT_EQ(errno, 77) << "nothing has failed";
    fb_var_screeninfo variable{};
    EXPECT_EQ(ioctl(null.Get(), FBIOGET_VSCREENINFO, &variable), -1);
    EXPECT_EQ(errno, ENOTTY);
    EXPECT_EQ(write(-1, "a", 1), -1);
    EXPECT_EQ(errno, EBADF);
    EXPECT_EQ(openat(folder.Get(), "dev/fb0", O_RDWR), -1);
    EXPECT_EQ(errno, ENOTDIR);
}

}

}
