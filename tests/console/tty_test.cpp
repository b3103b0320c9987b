#include <console/virtual_console.h>

#include <gtest/gtest.h>

#include <array>
#include <cerrno>
#include <csignal>

#include <fcntl.h>
#include <linux/kd.h>
#include <linux/vt.h>
#include <poll.h>
#include <sys/ioctl.h>
#include <sys/wait.h>
#include <unistd.h>

namespace console {

namespace {

int signalledTty = -1;
int releaseAnswer = 1;
int released = 0;
int acquired = 0;

/// Answers as a program on a console does: with a request from within the handler.
void OnConsoleSignal(int signal)
{
    if (signal == SIGUSR1) {
        ++released;
        ioctl(signalledTty, VT_RELDISP, releaseAnswer);
    } else {
        ++acquired;
        ioctl(signalledTty, VT_RELDISP, VT_ACKACQ);
    }
}

class Tty : public testing::Test {
protected:
    Tty()
    {
        machine.AttachProcess();
        fd = OwnedFd(open("/dev/tty0", O_RDONLY | O_NONBLOCK), "the tty");
        signalledTty = fd.Get();
        releaseAnswer = 1;
        released = acquired = 0;
        signal(SIGUSR1, OnConsoleSignal);
        signal(SIGUSR2, OnConsoleSignal);
    }

    int Ask(unsigned long number, unsigned long argument) const { return ioctl(fd.Get(), number, argument); }
    void TakeControl() const
    {
        vt_mode mode{VT_PROCESS, 0, SIGUSR1, SIGUSR2, 9};
        ASSERT_EQ(ioctl(fd.Get(), VT_SETMODE, &mode), 0);
    }

    VirtualConsole machine{{*ParseMode("8x8x8"), {}, {}}};
    OwnedFd fd;
};

TEST_F(Tty, KeyBytesComeThroughUnchangedInRawMode)
{
    termios settings{};
    ASSERT_EQ(tcgetattr(fd.Get(), &settings), 0);
    EXPECT_NE(settings.c_lflag & ICANON, 0u) << "a console begins with lines";
    settings.c_iflag = IGNBRK | IGNPAR;
    settings.c_oflag = 0;
    settings.c_cflag = CS8 | CREAD;
    settings.c_lflag = 0;
    settings.c_cc[VTIME] = 0;
    settings.c_cc[VMIN] = 1;
    cfsetispeed(&settings, B9600);
    cfsetospeed(&settings, B9600);
    ASSERT_EQ(tcsetattr(fd.Get(), TCSANOW, &settings), 0);
    EXPECT_EQ(machine.Terminal().c_lflag, 0u);
    EXPECT_EQ(machine.Terminal().c_iflag, tcflag_t{IGNBRK | IGNPAR});

    unsigned char byte = 0;
    EXPECT_EQ(read(fd.Get(), &byte, 1), -1);
    EXPECT_EQ(errno, EAGAIN);
    std::array<unsigned char, 256> keys{};
    for (unsigned i = 0; i < keys.size(); ++i)
        keys[i] = static_cast<unsigned char>(i);
    ASSERT_TRUE(machine.TypeKeys(keys));
    for (unsigned i = 0; i < keys.size(); ++i) {
        pollfd event{fd.Get(), POLLIN, 0};
        ASSERT_EQ(poll(&event, 1, 5000), 1);
        ASSERT_EQ(read(fd.Get(), &byte, 1), 1);
        EXPECT_EQ(byte, i);
    }
    fd.Close();
    EXPECT_EQ(machine.Terminal().c_lflag, 0u) << "nobody has put the settings back";
}

TEST_F(Tty, KeyboardModesLedsAndConsoleModesAreKeptAndChecked)
{
    int value = -1;
    EXPECT_EQ(ioctl(fd.Get(), KDGKBMODE, &value), 0);
    EXPECT_EQ(value, K_UNICODE);
    EXPECT_EQ(Ask(KDSKBMODE, K_MEDIUMRAW), 0);
    EXPECT_EQ(ioctl(fd.Get(), KDGKBMODE, &value), 0);
    EXPECT_EQ(value, K_MEDIUMRAW);
    EXPECT_EQ(ioctl(fd.Get(), KDGETMODE, &value), 0);
    EXPECT_EQ(value, KD_TEXT);
    EXPECT_EQ(Ask(KDSETMODE, KD_GRAPHICS), 0);
    EXPECT_EQ(machine.Tty().consoleMode, KD_GRAPHICS);
    EXPECT_EQ(Ask(KDSKBLED, LED_CAP | LED_NUM << 4), 0);
    value = 0x11110000;
    EXPECT_EQ(ioctl(fd.Get(), KDGKBLED, &value), 0);
    EXPECT_EQ(value, 0x11110000 | LED_CAP | LED_NUM << 4) << "one byte is stored";
    for (auto const& [number, argument] : {std::pair{KDSKBMODE, 5}, {KDSETMODE, 4}, {KDSKBLED, 8}}) {
        EXPECT_EQ(Ask(static_cast<unsigned long>(number), static_cast<unsigned long>(argument)), -1);
        EXPECT_EQ(errno, EINVAL);
    }
    auto const state = machine.Tty();
    EXPECT_EQ(state.keyboardMode, K_MEDIUMRAW);
    EXPECT_EQ(state.consoleMode, KD_GRAPHICS);
    EXPECT_EQ(state.leds, unsigned{LED_CAP | LED_NUM << 4});
}

TEST_F(Tty, ProgramIsAskedBeforeItsConsoleGoesAndToldWhenItIsBack)
{
    TakeControl();
    vt_mode mode{};
    ASSERT_EQ(ioctl(fd.Get(), VT_GETMODE, &mode), 0);
    EXPECT_EQ(mode.mode, VT_PROCESS);
    EXPECT_EQ(mode.relsig, SIGUSR1);
    EXPECT_EQ(mode.frsig, 0) << "the kernel ignores it";

    EXPECT_EQ(Ask(VT_ACTIVATE, 2), 0);
    EXPECT_EQ(released, 1);
    EXPECT_EQ(machine.Tty().activeConsole, 2);
    EXPECT_TRUE(machine.SwitchTo(3));
    EXPECT_EQ(released, 1) << "console 2 has nobody to ask";
    EXPECT_TRUE(machine.SwitchTo(1));
    EXPECT_EQ(acquired, 1);
    vt_stat state{};
    ASSERT_EQ(ioctl(fd.Get(), VT_GETSTATE, &state), 0);
    EXPECT_EQ(state.v_active, 1);

    releaseAnswer = 0;
    EXPECT_TRUE(machine.SwitchTo(2));
    EXPECT_EQ(machine.Tty().activeConsole, 1) << "the program refused";
    EXPECT_EQ(Ask(VT_RELDISP, 1), -1) << "nothing to release any more";
    EXPECT_EQ(errno, EINVAL);
    EXPECT_EQ(Ask(VT_ACTIVATE, 0), -1);
    EXPECT_EQ(errno, ENXIO);
    EXPECT_FALSE(machine.SwitchTo(64));
}

TEST_F(Tty, GraphicsWithoutControlHoldsTheConsoleAndTextDoesNot)
{
    EXPECT_EQ(Ask(VT_RELDISP, VT_ACKACQ), -1);
    EXPECT_EQ(errno, EINVAL);
    Ask(KDSETMODE, KD_GRAPHICS);
    EXPECT_TRUE(machine.SwitchTo(2));
    EXPECT_EQ(machine.Tty().activeConsole, 1);
    Ask(KDSETMODE, KD_TEXT);
    EXPECT_TRUE(machine.SwitchTo(2));
    EXPECT_EQ(machine.Tty().activeConsole, 2);
}

TEST_F(Tty, ConsoleOfADeadProgramIsResetByTheNextSwitch)
{
    pid_t const child = fork();
    if (child == 0) {
        TakeControl();
        Ask(KDSETMODE, KD_GRAPHICS);
        Ask(KDSKBMODE, K_MEDIUMRAW);
        _exit(0);
    }
    waitpid(child, nullptr, 0);
    EXPECT_EQ(machine.Tty().consoleMode, KD_GRAPHICS) << "what it leaves behind can be seen";
    EXPECT_EQ(machine.Tty().vtProcess, child);
    EXPECT_TRUE(machine.SwitchTo(2));
    auto const state = machine.Tty();
    EXPECT_EQ(state.activeConsole, 2);
    EXPECT_EQ(state.consoleMode, KD_TEXT);
    EXPECT_EQ(state.keyboardMode, K_UNICODE);
    EXPECT_EQ(state.vtMode.mode, VT_AUTO);
}

}

}
