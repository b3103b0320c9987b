#include <console/rfb_session.h>

#include <console/owned.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <new>
#include <thread>
#include <utility>

#include <rfb/rfb.h>

#include <fcntl.h>
#include <sys/select.h>
#include <sys/socket.h>
#include <unistd.h>

namespace console {

namespace {

constexpr int kKeyCodesEncoding = -258;  // QEMU's extended key events
constexpr std::uint8_t kKeyCodesMessage = 255;
constexpr std::size_t kKeyCodesLength = 11;  // behind the message's type
constexpr std::chrono::milliseconds kWrongPasswordPause{500};

std::uint32_t ReadBig(unsigned char const* bytes, unsigned count)
{
    std::uint32_t number = 0;
    for (unsigned i = 0; i < count; ++i)
        number = number << 8 | bytes[i];
    return number;
}

}

/// What the library calls; the session is in the screen's data.
struct RfbSession::Protocol {
    static RfbSession& Of(rfbClientPtr client)
    {
        return *static_cast<RfbSession*>(client->screen->screenData);
    }

    static void OnKey(rfbBool down, rfbKeySym keysym, rfbClientPtr client)
    {
        Of(client).OnKey(down != 0, keysym, 0);
    }

    static void OnPointer(int buttons, int x, int y, rfbClientPtr client)
    {
        Of(client).OnPointer(static_cast<unsigned>(buttons), x, y);
    }

    static rfbBool CheckPassword(rfbClientPtr client, char const* response, int length)
    {
        if (rfbCheckPasswordByList(client, response, length) != 0) return TRUE;
        std::this_thread::sleep_for(kWrongPasswordPause);
        return FALSE;
    }

    /// The library holds a lock of all viewers, so nothing is sent from here.
    static rfbBool OnEncoding(rfbClientPtr client, void**, int encoding)
    {
        if (encoding != kKeyCodesEncoding) return FALSE;
        Of(client).wantsKeyCodes = true;
        return TRUE;
    }

    static rfbBool OnMessage(rfbClientPtr client, void*, rfbClientToServerMsg const* message)
    {
        if (message->type != kKeyCodesMessage) return FALSE;
        std::array<unsigned char, kKeyCodesLength> body{};
        if (rfbReadExact(client, reinterpret_cast<char*>(body.data()), body.size()) <= 0 || body[0] != 0)
            return FALSE;  // and the library hangs up
        Of(client).OnKey(ReadBig(&body[1], 2) != 0, ReadBig(&body[3], 4), ReadBig(&body[7], 4));
        return TRUE;
    }

    static rfbProtocolExtension& KeyCodes()
    {
        static int encodings[] = {kKeyCodesEncoding, 0};
        static rfbProtocolExtension extension = {.newClient = nullptr,
            .init = nullptr,
            .pseudoEncodings = encodings,
            .enablePseudoEncoding = OnEncoding,
            .handleMessage = OnMessage,
            .close = nullptr,
            .usage = nullptr,
            .processArgument = nullptr,
            .next = nullptr};
        return extension;
    }

    /// What every session's screen begins as. Screens are not made one by one: with each, the library would
    /// make anew a lock of its own that others may hold.
    static rfbScreenInfo const& Prototype()
    {
        static rfbScreenInfo const* const prototype = [] {
            rfbLogEnable(FALSE);
            rfbRegisterProtocolExtension(&KeyCodes());
            auto* const made = rfbGetScreen(nullptr, nullptr, 4, 4, 8, 3, 4);
            if (made == nullptr) throw std::bad_alloc();
            made->cursor = nullptr;  // the program paints its own
            made->desktopName = "tessella-console";
            made->deferUpdateTime = 0;
            made->alwaysShared = TRUE;
            made->kbdAddEvent = OnKey;
            made->ptrAddEvent = OnPointer;
            made->passwordCheck = CheckPassword;
            return made;
        }();
        return *prototype;
    }

    static rfbScreenInfo* MakeScreen()
    {
        auto const& prototype = Prototype();
        auto* const screen = static_cast<rfbScreenInfo*>(std::malloc(sizeof(rfbScreenInfo)));
        if (screen == nullptr) throw std::bad_alloc();
        std::memcpy(screen, &prototype, sizeof *screen);
        pthread_mutex_init(&screen->cursorMutex, nullptr);
        return screen;
    }
};

void RfbSession::ScreenDeleter::operator()(_rfbScreenInfo* old) const { rfbScreenCleanup(old); }

RfbSession::RfbSession(ViewerShare const& shared, int socket, RfbGreeting greeting)
    : share(shared), screen(Protocol::MakeScreen())
{
    screen->screenData = this;
    if (!share.password.empty()) {
        passwords[0] = const_cast<char*>(share.password.c_str());
        screen->authPasswdData = passwords;
    }
    share.watch.Read([this](Frame const& frame) {
        frameNumber = frame.number;
        Resize(frame);
    });
    Connect(socket, greeting);
}

RfbSession::~RfbSession()
{
    share.input.LetGo(hands);
    if (client == nullptr) return;
    if (IsOpen()) rfbCloseClient(client);
    // The library forgets these.
    while (auto* const extension = client->extensions) {
        client->extensions = extension->next;
        std::free(extension);
    }
    std::free(std::exchange(client->wsctx, nullptr));
    rfbClientConnectionGone(client);
}

/// The library would look for a WebSocket's header, or for encryption, at the start of every connection, and
/// run in circles if less than four bytes come. Therefore it begins with a stand-in, which shows it the start
/// of a version and takes the one that it sends.
void RfbSession::Connect(int socket, RfbGreeting greeting)
{
    int ends[2] = {-1, -1};
    OwnedFd standIn;
    if (greeting == RfbGreeting::Version) {
        Checked(socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, ends), "greeting a viewer");
        standIn = OwnedFd(ends[1], "greeting a viewer");
        Checked(static_cast<int>(write(ends[1], kRfbVersion, kRfbVersionLength)), "greeting a viewer");
    } else {
        ends[0] = Checked(fcntl(socket, F_DUPFD_CLOEXEC, 0), "greeting a viewer");
    }
    if (ends[0] >= FD_SETSIZE) {  // the library could not wait for it
        close(ends[0]);
        return;
    }
    client = rfbNewClient(screen.get(), ends[0]);
    if (client != nullptr && greeting == RfbGreeting::Version && dup3(socket, client->sock, O_CLOEXEC) == -1)
        rfbCloseClient(client);
}

bool RfbSession::IsOpen() const { return client != nullptr && client->sock != RFB_INVALID_SOCKET; }

bool RfbSession::HasGreeted() const { return IsOpen() && client->state == rfbClientRec::RFB_NORMAL; }

int RfbSession::Fd() const { return client->sock; }

void RfbSession::TakeMessages()
{
    // The first version that comes enters the kinds of passwords into a list that all viewers read.
    static std::mutex listMutex;
    static std::atomic<bool> listed{false};
    if (client->state == rfbClientRec::RFB_PROTOCOL_VERSION && !listed) {
        std::lock_guard const lock(listMutex);
        rfbProcessClientMessage(client);
        listed = true;
    } else {
        rfbProcessClientMessage(client);
    }
    while (IsOpen() && client->wsctx != nullptr && webSocketsHasDataInBuffer(client) != 0)
        rfbProcessClientMessage(client);
    if (wantsKeyCodes && HasGreeted()) AnnounceKeyCodes();
}

/// An update of one rectangle, whose encoding is all that it tells.
void RfbSession::AnnounceKeyCodes()
{
    wantsKeyCodes = false;
    client->enableSupportedMessages = FALSE;  // a list of the library's, which would take it back
    std::array<unsigned char, 16> update = {0, 0, 0, 1};
    std::uint32_t const encoding = Swap32IfLE(static_cast<std::uint32_t>(kKeyCodesEncoding));
    std::memcpy(&update[12], &encoding, sizeof encoding);
    if (rfbWriteExact(client, reinterpret_cast<char const*>(update.data()), update.size()) < 0)
        rfbCloseClient(client);
}

void RfbSession::UpdatePicture()
{
    if (!IsOpen()) return;
    share.watch.Read([this](Frame const& frame) { TakeFrame(frame); });
    // Exact pixels, whatever quality the viewer would be content with.
    client->tightQualityLevel = client->turboQualityLevel = -1;
    if (IsOpen()) rfbUpdateClient(client);
}

/// Brings the picture up to date and marks what has changed, in blocks of rows.
void RfbSession::TakeFrame(Frame const& frame)
{
    if (std::exchange(frameNumber, frame.number) == frame.number) return;
    auto const width = static_cast<std::size_t>(screen->width);
    if (frame.width != width || frame.height != static_cast<unsigned>(screen->height)) return Resize(frame);
    std::size_t left = width;
    std::size_t right = 0;
    unsigned top = 0;
    auto const mark = [&](unsigned bottom) {
        if (left < right)
            rfbMarkRectAsModified(screen.get(), static_cast<int>(left), static_cast<int>(top),
                static_cast<int>(right), static_cast<int>(bottom));
        left = width;
        right = 0;
        top = bottom + 1;
    };
    for (unsigned y = 0; y < frame.height; ++y) {
        auto const* const now = frame.Row(y);
        auto* const before = pixels.data() + y * width;
        if (std::memcmp(now, before, width * sizeof *now) == 0) {
            mark(y);
            continue;
        }
        auto const first = static_cast<std::size_t>(std::mismatch(now, now + width, before).first - now);
        std::size_t end = width;
        while (now[end - 1] == before[end - 1])
            --end;
        std::copy(now + first, now + end, before + first);
        left = std::min(left, first);
        right = std::max(right, end);
    }
    mark(frame.height);
}

void RfbSession::Resize(Frame const& frame)
{
    // A viewer that has asked for a smaller picture has one of the old size at the library.
    if (client != nullptr && client->scaledScreen != screen.get()) return rfbCloseClient(client);
    auto before = std::exchange(pixels, frame.pixels);
    rfbNewFramebuffer(screen.get(), reinterpret_cast<char*>(pixels.data()), static_cast<int>(frame.width),
        static_cast<int>(frame.height), 8, 3, 4);
}

void RfbSession::OnKey(bool down, std::uint32_t keysym, std::uint32_t scanCode)
{
    if (auto const console = ConsoleOfKeysym(keysym)) {
        if (down) share.input.SwitchTo(*console);
        return;
    }
    auto const code = scanCode != 0 ? CodeOfScanCode(scanCode) : share.keysyms.CodeOf(keysym);
    if (code) share.input.Key(hands, *code, down);
}

/// Their buttons are, from bit 0: left, middle, right, and the wheel's notches up and down.
void RfbSession::OnPointer(unsigned buttons, int x, int y)
{
    share.input.Point(hands, x, y, (buttons & 1) | (buttons >> 1 & 2) | (buttons << 1 & 4));
    unsigned const turned = buttons & ~std::exchange(wheelButtons, buttons) & 0x18;
    if ((turned & 0x08) != 0) share.input.TurnWheel(1);
    if ((turned & 0x10) != 0) share.input.TurnWheel(-1);
}

}
