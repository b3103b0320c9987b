#include <tessella/keyboard_l.h>

#include <tessella/console_l.h>
#include <tessella/event.h>
#include <tessella/event_wait_l.h>
#include <tessella/keyboard.h>
#include <tessella/keyboard_device.h>
#include <tessella/session.h>
#include <tessella/thread_l.h>

#include <array>
#include <atomic>
#include <csignal>
#include <cstdio>
#include <mutex>
#include <optional>

#include <fcntl.h>
#include <linux/kd.h>
#include <linux/vt.h>
#include <sys/ioctl.h>
#include <termios.h>
#include <unistd.h>

namespace {

constinit std::mutex keyRingMutex;

/// Bytes of the device that the application has not taken yet. One slot stays free.
class KeyRing {
public:
    bool IsEmpty() const { return head == tail; }
    bool Push(unsigned char byte)
    {
        std::size_t const next = (head + 1) % bytes.size();
        if (next == tail) return false;
        bytes[head] = byte;
        head = next;
        return true;
    }
    unsigned char Pop()
    {
        unsigned char const byte = bytes[tail];
        tail = (tail + 1) % bytes.size();
        return byte;
    }

private:
    std::array<unsigned char, 128> bytes{};
    std::size_t head = 0, tail = 0;
};

KeyRing keyRing;  // guarded by keyRingMutex

std::atomic<int> consoleTty{-1};
std::atomic<int> consoleNumber{0};
std::atomic<int> returnNotice{-1};  // the end of a pipe that is written when the console comes back
static_assert(std::atomic<int>::is_always_lock_free, "signal handlers read it");

/// False if the byte is lost. On the keyboard's thread.
bool GrKeyRingPush(unsigned char byte)
{
    {
        std::scoped_lock const lock(keyRingMutex);
        if (keyRing.Push(byte)) return true;
    }
    BeepAtOnce();
    return false;
}

/// False if there is no byte, or none that means a key: no key has the code 0.
bool GrKeyRingPop(unsigned char* byte)
{
    std::scoped_lock const lock(keyRingMutex);
    if (keyRing.IsEmpty()) return false;
    *byte = keyRing.Pop();
    return *byte != 0;
}

int OpenTty()
{
    for (char const* const path : {"/dev/tty0", "/dev/tty"})
        if (int const tty = open(path, O_RDONLY | O_NONBLOCK); tty != -1) return tty;
    std::fputs("TESSELLA: Filed to open a tty\n", stderr);
    return -1;
}

/// Reads whatever comes, byte by byte, with nothing done to it.
termios RawSettings(termios settings)
{
    settings.c_iflag = IGNBRK | IGNPAR;
    settings.c_oflag = 0;
    settings.c_cflag = CS8 | CREAD;
    settings.c_lflag = 0;
    settings.c_cc[VTIME] = 0;
    settings.c_cc[VMIN] = 1;
    cfsetispeed(&settings, B9600);
    cfsetospeed(&settings, B9600);
    return settings;
}

/// The keyboard of a Linux console. Requests to the tty that fail are passed over.
class GrLinuxKeyboard final : public GrSmartKeyboard {
public:
    unsigned GetLeds() override
    {
        int leds = 0;  // the kernel stores a byte
        ioctl(tty, KDGKBLED, &leds);
        return static_cast<unsigned>(leds);
    }
    void SetLeds(unsigned leds) override { Request(KDSKBLED, leds); }

    bool HasKey() override
    {
        std::scoped_lock const lock(keyRingMutex);
        return !keyRing.IsEmpty();
    }
    void GetKey(GrEvent& event) override
    {
        unsigned char byte = 0;
        if (GrKeyRingPop(&byte)) TranslateScan(event, byte);
    }

    bool SwitchToConsole(int number) override { return Request(VT_ACTIVATE, number); }
    void Resync() override { SyncLockState(); }
    bool Open() override;
    bool Close() override;
    void OnKeyChange(unsigned vk, bool pressed) override;
    void GiveConsoleBack();

private:
    /// A request to the tty with a number; true if it is carried out.
    bool Request(unsigned long request, long number) const { return ioctl(tty, request, number) == 0; }
    void TakeConsole();
    void ReadKey() const;
    void TakeReturnNotice() const;
    static void* ReadKeys(void* keyboard);

    // As they were found. What could not be learned is not sent back.
    std::optional<int> savedKeyboardMode;
    std::optional<termios> savedTerminal;
    std::optional<int> savedConsoleMode;

    int tty = -1;
    vt_mode vtMode{};
    bool hasConsole = false;
    std::array<int, 2> returnPipe{-1, -1};  ///< the end that the thread reads, the end that is written
    InputThread thread;
};

bool GrLinuxKeyboard::Open()
{
    tty = OpenTty();
    if (tty == -1 || !GrSmartKeyboard::Open()) return false;
    TakeConsole();
    thread.Start(ReadKeys, this);
    return true;
}

/// In graphics mode the kernel does not draw over the framebuffer. In process mode it asks before it switches
/// to another console, and tells when ours comes back, by the same signal.
void GrLinuxKeyboard::TakeConsole()
{
    hasConsole = true;
    if (int mode = 0; ioctl(tty, KDGKBMODE, &mode) == 0) savedKeyboardMode = mode;
    if (termios settings{}; tcgetattr(tty, &settings) == 0) savedTerminal = settings;
    Request(KDSKBMODE, K_MEDIUMRAW);
    termios const raw = RawSettings(savedTerminal.value_or(termios{}));
    tcsetattr(tty, TCSANOW, &raw);
    if (int mode = 0; ioctl(tty, KDGETMODE, &mode) == 0) {
        savedConsoleMode = mode;
        Request(KDSETMODE, KD_GRAPHICS);
    }
    ioctl(tty, VT_GETMODE, &vtMode);
    vtMode.mode = VT_PROCESS;
    vtMode.relsig = vtMode.acqsig = SIGUSR2;
    if (vt_stat consoles{}; ioctl(tty, VT_GETSTATE, &consoles) == 0) consoleNumber = consoles.v_active;
    consoleTty = tty;
    if (pipe2(returnPipe.data(), O_NONBLOCK | O_CLOEXEC) == 0) returnNotice = returnPipe[1];
    signal(SIGUSR2, GrConsoleSignal);
    ioctl(tty, VT_SETMODE, &vtMode);
}

void GrLinuxKeyboard::GiveConsoleBack()
{
    if (!hasConsole) return;
    if (savedKeyboardMode) Request(KDSKBMODE, *savedKeyboardMode);
    if (savedConsoleMode) Request(KDSETMODE, *savedConsoleMode);
    vtMode.mode = VT_AUTO;
    ioctl(tty, VT_SETMODE, &vtMode);
    consoleTty = -1;
    if (returnNotice.exchange(-1) != -1)
        for (int const end : returnPipe)
            close(end);
    if (savedTerminal) tcsetattr(tty, TCSANOW, &*savedTerminal);
}

bool GrLinuxKeyboard::Close()
{
    if (thread.WasStarted()) thread.Stop();
    GiveConsoleBack();
    if (tty != -1) close(tty);
    return GrSmartKeyboard::Close();
}

/// The body of the keyboard's thread.
void* GrLinuxKeyboard::ReadKeys(void* keyboard)
{
    auto const& self = *static_cast<GrLinuxKeyboard const*>(keyboard);
    int const devices[] = {self.tty, self.returnPipe[0]};
    for (;;)
        switch (self.thread.WaitForInput(devices, InputThread::PollFailure::Ends)) {
        case 0: self.ReadKey(); break;
        case 1: self.TakeReturnNotice(); break;
        default: return nullptr;
        }
}

void GrLinuxKeyboard::ReadKey() const
{
    unsigned char byte = 0;
    if (read(tty, &byte, 1) == 1 && GrKeyRingPush(byte)) GrPostInputWake();
}

void GrLinuxKeyboard::TakeReturnNotice() const
{
    unsigned char notice = 0;
    if (read(returnPipe[0], &notice, 1) == 1) GrUnfreeze();
}

/// Control with alt or shift, and F1 to F10: these ask for another console, at the release as well.
void GrLinuxKeyboard::OnKeyChange(unsigned vk, bool pressed)
{
    GrSmartKeyboard::OnKeyChange(vk, pressed);
    bool const chorded = (modifiers & GrModControl) && (modifiers & (GrModShift | GrModAlt));
    if (!chorded || vk < GrVkF1 || vk > GrVkF10) return;
    GrBeep();
    SwitchToConsole(static_cast<int>(vk - GrVkF1 + 1));
}

}

void GrKeyboardCreate()
{
    sessionKeyboard = new GrLinuxKeyboard;
    sessionKeyboard->Open();
}

void GrKeyboardDestroy()
{
    sessionKeyboard->Close();
    delete sessionKeyboard;
}

int ConsoleTty() { return consoleTty; }

int ConsoleNumber() { return consoleNumber; }

void GiveConsoleBackAtOnce()
{
    // The session has made no other kind.
    if (ConsoleTty() != -1) static_cast<GrLinuxKeyboard*>(sessionKeyboard)->GiveConsoleBack();
}

void WakeAfterReturn()
{
    // A pipe that is full has enough to wake the pump.
    [[maybe_unused]] ssize_t const written = write(returnNotice, "", 1);
}
