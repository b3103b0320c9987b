#pragma once

#include <console/screen_watch.h>
#include <console/viewer_input.h>
#include <console/viewer_keys.h>

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

// The library's names.
struct _rfbClientRec;   // NOLINT(bugprone-reserved-identifier)
struct _rfbScreenInfo;  // NOLINT(bugprone-reserved-identifier)

namespace console {

/// What all viewers have in common.
struct ViewerShare {
    ScreenWatch& watch;
    ViewerInput& input;
    KeysymTable keysyms;
    std::string password;  ///< empty for none
};

/// How far a connection has got when its session begins.
enum class RfbGreeting : unsigned char {
    WebSocket,  ///< the header of an upgrade has come as a whole, and is unread
    Version,    ///< `kRfbVersion` is sent, and the viewer's version has come, and is unread
};

inline constexpr char kRfbVersion[] = "RFB 003.008\n";
inline constexpr std::size_t kRfbVersionLength = sizeof kRfbVersion - 1;

/// One viewer's connection, in the protocol that VNC viewers speak. For one thread. The library that speaks
/// it would serve many viewers with one screen, but then they wait for each other; here each has its own.
class RfbSession {
public:
    /// The socket stays the caller's, who follows the screen already. It must not block.
    RfbSession(ViewerShare const& shared, int socket, RfbGreeting greeting);
    /// Lets go of what the viewer held.
    ~RfbSession();
    RfbSession(RfbSession const&) = delete;
    RfbSession& operator=(RfbSession const&) = delete;

    /// False if the viewer has gone, or was hung up on.
    bool IsOpen() const;
    /// True if the viewer is through with the version, the password and the like.
    bool HasGreeted() const;
    int Fd() const;

    /// Reads and obeys what the viewer has sent. Waits for the rest of a message that has begun.
    void TakeMessages();
    /// Sends what has changed on the screen, if the viewer has asked for it.
    void UpdatePicture();

private:
    struct Protocol;  // the library's callbacks
    struct ScreenDeleter {
        void operator()(_rfbScreenInfo* old) const;
    };

    void Connect(int socket, RfbGreeting greeting);
    void TakeFrame(Frame const& frame);
    void Resize(Frame const& frame);
    void AnnounceKeyCodes();
    void OnKey(bool down, std::uint32_t keysym, std::uint32_t scanCode);
    void OnPointer(unsigned buttons, int x, int y);

    ViewerShare const& share;
    std::vector<std::uint32_t> pixels;
    std::uint64_t frameNumber = 0;  // of the frame that they show
    char* passwords[2] = {};        // a list, as the library wants it
    std::unique_ptr<_rfbScreenInfo, ScreenDeleter> screen;
    _rfbClientRec* client = nullptr;
    bool wantsKeyCodes = false;  // and hasn't been told that it gets them
    unsigned wheelButtons = 0;
    Hands hands;
};

}
