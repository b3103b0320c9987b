#include <console/picture.h>
#include <console/viewer_server.h>

#include <gtest/gtest.h>

#include <chrono>
#include <csignal>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <functional>
#include <random>
#include <sstream>
#include <thread>

#include <arpa/inet.h>
#include <netinet/in.h>
#include <rfb/rfbclient.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

using console::Picture;

namespace {

using namespace std::chrono_literals;

std::string Contents(std::string const& path)
{
    std::ostringstream text;
    text << std::ifstream(path).rdbuf();
    return text.str();
}

bool Await(std::function<bool()> const& isMet)
{
    for (auto const end = std::chrono::steady_clock::now() + 20s; std::chrono::steady_clock::now() < end;) {
        if (isMet()) return true;
        std::this_thread::sleep_for(5ms);
    }
    return false;
}

/// A program on a console with both ports, in a folder of its own.
class Shown {
public:
    explicit Shown(std::string const& words)
    {
        std::filesystem::create_directories(folder);
        auto const command =
            "cd " + folder + "; exec " CONSOLE_TOOL " --web=0 --vnc=0 --mode " + words + " >out 2>err";
        tool = fork();
        if (tool == 0) _exit(execl("/bin/sh", "sh", "-c", command.c_str(), nullptr));
        EXPECT_TRUE(Await([&] { return Contents(folder + "err").find("VNC") != std::string::npos; }))
            << Contents(folder + "err");
        std::istringstream text(Contents(folder + "err"));
        for (std::string line; std::getline(text, line);) {
            if (line.starts_with("tessella-console: the screen is at http://localhost:"))
                web = std::stoi(line.substr(line.rfind(':') + 1));
            if (line.starts_with("tessella-console: VNC viewers"))
                vnc = std::stoi(line.substr(line.rfind(':') + 1));
        }
    }
    ~Shown()
    {
        if (tool != 0) End();
        std::filesystem::remove_all(folder);
    }
    Shown(Shown const&) = delete;
    Shown& operator=(Shown const&) = delete;

    std::string Out() const { return Contents(folder + "out"); }
    bool Prints(std::string const& text) const
    {
        return Await([&] { return Out().find(text) != std::string::npos; });
    }
    /// The tool is asked to end; with a sanitizer it must be content, too.
    void End()
    {
        kill(tool, SIGTERM);
        int status = 0;
        waitpid(std::exchange(tool, 0), &status, 0);
        EXPECT_EQ(WEXITSTATUS(status), 128 + SIGTERM) << Contents(folder + "err");
    }

    std::string const folder = testing::TempDir() + "viewer" + std::to_string(getpid()) + "/";
    int web = 0;
    int vnc = 0;

private:
    pid_t tool = 0;
};

/// Somebody with a VNC viewer.
class User {
public:
    explicit User(int port, char const* password = "") : secret(password)
    {
        rfbEnableClientLogging = FALSE;
        client = rfbGetClient(8, 3, 4);
        std::free(client->serverHost);
        client->serverHost = strdup("127.0.0.1");
        client->serverPort = port;
        client->GetPassword = [](rfbClient* one) {
            return strdup(static_cast<User*>(rfbClientGetClientData(one, nullptr))->secret);
        };
        rfbClientSetClientData(client, nullptr, this);
        if (rfbInitClient(client, nullptr, nullptr) == 0) client = nullptr;
        // The server tells that it takes key codes with the first update.
        if (client != nullptr)
            Await([&] { return Look() && SendExtendedKeyEvent(client, 0, 0, FALSE) != 0; });
    }
    ~User()
    {
        if (client == nullptr) return;
        std::free(client->frameBuffer);
        rfbClientCleanup(client);
    }
    User(User const&) = delete;
    User& operator=(User const&) = delete;

    bool IsIn() const { return client != nullptr; }
    bool Look()
    {
        while (client->buffered > 0 || WaitForMessage(client, 10000) > 0)
            if (HandleRFBServerMessage(client) == 0) return false;
        return true;
    }
    bool Sees(Picture const& wanted)
    {
        return Await([&] {
            Look();
            Picture seen{static_cast<unsigned>(client->width), static_cast<unsigned>(client->height), {}};
            for (int i = 0; i < client->width * client->height; ++i)
                seen.bytes.insert(
                    seen.bytes.end(), client->frameBuffer + 4 * i, client->frameBuffer + 4 * i + 3);
            return seen == wanted;
        });
    }
    void Point(int x, int y, int buttons = 0) { SendPointerEvent(client, x, y, buttons); }
    void Key(unsigned scanCode, bool down) { SendExtendedKeyEvent(client, 0, scanCode, down); }
    void Keysym(unsigned keysym, bool down) { SendKeyEvent(client, keysym, down); }

private:
    char const* secret;
    rfbClient* client = nullptr;
};

/// Somebody with anything else.
class Stranger {
public:
    explicit Stranger(int port) : socket(::socket(AF_INET, SOCK_STREAM, 0))
    {
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_port = htons(static_cast<std::uint16_t>(port));
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        EXPECT_EQ(connect(socket, reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
    }
    ~Stranger() { close(socket); }
    Stranger(Stranger const&) = delete;
    Stranger& operator=(Stranger const&) = delete;

    void Say(std::string const& text) const { send(socket, text.data(), text.size(), MSG_NOSIGNAL); }
    std::string Hear() const
    {
        char text[200] = {};
        return recv(socket, text, sizeof text - 1, 0) > 0 ? text : "";
    }

private:
    int socket;
};

TEST(Viewers, SeeTheVeryPixels)
{
    auto const script = testing::TempDir() + "viewer-script" + std::to_string(getpid());
    std::ofstream(script) << "settle 300\nscreenshot shown.png\n";
    // Lossless, though this viewer would take lossy pictures.
    for (char const* const mode : {"640x480x4", "803x601x8", "640x480x16", "642x480x24"}) {
        Shown shown(std::string(mode).append(" --script ").append(script).append(" -- " DESKTOP));
        User first(shown.vnc), second(shown.vnc);
        ASSERT_TRUE(first.IsIn() && second.IsIn());
        auto const path = shown.folder + "shown.png";
        Picture picture;
        ASSERT_TRUE(Await([&] {
            auto loaded = console::LoadPicture(path);
            if (auto* const whole = std::get_if<Picture>(&loaded)) picture = *whole;
            return !picture.bytes.empty();
        }));
        EXPECT_TRUE(first.Sees(picture) && second.Sees(picture)) << mode;
    }
    unlink(script.c_str());
}

TEST(Viewers, FollowAChangeOfMode)
{
    console::VirtualConsole console({.mode = *console::ParseMode("64x48x8"), .format = {}, .faults = {}});
    console::ViewerOptions options;
    options.vncPort = 0;
    console::ViewerServer server(console, options, "");
    testing::internal::CaptureStderr();
    server.Start();
    auto const said = testing::internal::GetCapturedStderr();
    User user(std::stoi(said.substr(said.rfind(':') + 1)));
    ASSERT_TRUE(user.IsIn() && user.Sees(console.Screen()));
    for (char const* const mode : {"99x101x16", "33x48x32"}) {
        console.ChangeMode(*console::ParseMode(mode));
        EXPECT_TRUE(user.Sees(console.Screen())) << mode;
    }
    console.SwitchTo(2);  // shows a colour
    EXPECT_TRUE(user.Sees(console.Screen()) && console.Screen().At(0, 0) != 0);
}

TEST(Viewers, UseMouseAndKeyboard)
{
    Shown shown("64x480x8 -- " INPUT_PROBE);
    User user(shown.vnc), other(shown.vnc);
    ASSERT_TRUE(user.IsIn() && other.IsIn() && shown.Prints("answers"));
    user.Point(12, 3, 1);
    user.Point(12, 3, 0);
    user.Point(12, 3, 8 | 4);
    user.Point(12, 3, 16);
    user.Key(0x1E, true);
    user.Key(0xC8, true);
    user.Key(0xC8, false);
    user.Keysym('A', true);
    user.Keysym('a', false);
    user.Keysym(0xE9, true);
    // To another console, where nothing reaches the program, and back as the kernel's keys do.
    user.Keysym(0x1008FE02, true);
    ASSERT_TRUE(shown.Prints("released"));
    user.Key(0x30, true);
    user.Key(0x30, false);
    user.Point(50, 50, 1);
    user.Point(50, 50, 0);
    for (unsigned const code : {0x1D, 0x38, 0x3B})
        user.Key(code, true);
    ASSERT_TRUE(shown.Prints("acquired"));
    for (unsigned const code : {0x3B, 0x38, 0x1D})
        user.Key(code, false);
    ASSERT_TRUE(shown.Prints("key 9d\n"));
    std::string const corner = "mouse 18 81 7f 00\nmouse 18 81 7f 00\nmouse 18 81 7f 00\nmouse 18 81 7f 00\n";
    EXPECT_EQ(shown.Out(),
        "mouse answers fa 03\n" + corner +
            "mouse 28 04 ff 00\nmouse 28 04 ff 00\nmouse 28 04 ff 00\nmouse 09 00 00 00\nmouse 08 00 00 00\n"
            "mouse 0a 00 00 00\nmouse 0a 00 00 ff\nmouse 08 00 00 00\nmouse 08 00 00 01\n"
            "key 1e\nkey 67\nkey e7\nkey 1e\nkey 9e\nreleased\nacquired\nkey bb\nkey b8\nkey 9d\n");
    // Two hold the same, and one goes away: it is held until the other one lets go.
    {
        User third(shown.vnc);
        for (User* const one : {&third, &other}) {
            one->Point(0, 0, 1);
            one->Key(0x2C, true);
        }
        third.Key(0x2D, true);
        ASSERT_TRUE(shown.Prints("key 2d\n"));
    }
    ASSERT_TRUE(shown.Prints("key ad\n"));
    EXPECT_EQ(shown.Out().find("key ac\n"), std::string::npos);
    EXPECT_FALSE(shown.Out().ends_with("mouse 08 00 00 00\n"));
    other.Key(0x2C, false);
    other.Point(0, 0, 0);
    EXPECT_TRUE(shown.Prints("key ac\nmouse 08 00 00 00\n"));
}

TEST(Viewers, RecordingShowsTheSameAgain)
{
    Shown shown("640x480x16 --record a.script --screenshot live.png -- " DESKTOP);
    User user(shown.vnc);
    ASSERT_TRUE(user.IsIn());
    user.Point(180, 50);
    user.Point(180, 50, 1);
    for (int i = 0; i < 30; ++i) {
        user.Point(180 + i * 6, 50 + i * 3, 1);
        std::this_thread::sleep_for(8ms);
    }
    user.Point(354, 137, 0);
    user.Point(130, 380, 1);
    user.Point(130, 380, 0);
    for (unsigned const code : {0x14, 0x12, 0x1F}) {
        user.Key(code, true);
        user.Key(code, false);
    }
    ASSERT_TRUE(
        Await([&] { return Contents(shown.folder + "a.script").find("keys 9f") != std::string::npos; }));
    std::this_thread::sleep_for(500ms);
    shown.End();
    auto const replay = "cd " + shown.folder +
        "; " CONSOLE_TOOL " --mode 640x480x16 --script a.script --screenshot again.png -- " DESKTOP
        " && cmp live.png again.png";
    EXPECT_EQ(std::system(replay.c_str()), 0) << Contents(shown.folder + "a.script");
}

TEST(Viewers, NobodyHoldsUpOrHarmsTheOthers)
{
    Shown shown("64x480x8 -- " INPUT_PROBE);
    std::mt19937 random(5);
    std::vector<std::unique_ptr<Stranger>> silent;
    std::string const upgrade =
        "GET / HTTP/1.1\r\nHost: localhost\r\nOrigin: http://localhost\r\nUpgrade: websocket\r\n"
        "Sec-WebSocket-Key: AAAAAAAAAAAAAAAAAAAAAA==\r\nSec-WebSocket-Version: 13\r\n\r\n";
    for (int round = 0; round < 120; ++round) {
        bool const web = round % 3 == 0;
        auto stranger = std::make_unique<Stranger>(web ? shown.web : shown.vnc);
        std::string noise(random() % 300, 0);
        for (auto& byte : noise)
            byte = static_cast<char>(random());
        // Some get further before they turn into fools: to the messages of a viewer.
        if (web) stranger->Say(round % 2 ? upgrade : "GET");
        if (!web && round % 2) stranger->Say("RFB 003.008\n\x01\x01");
        if (round % 5) stranger->Say(noise);
        if (round % 4) silent.push_back(std::move(stranger));
    }
    Stranger outsider(shown.web);
    outsider.Say("GET / HTTP/1.1\r\nHost: localhost\r\nOrigin: http://a\r\nUpgrade: websocket\r\n\r\n");
    EXPECT_TRUE(outsider.Hear().starts_with("HTTP/1.1 403 "));
    Stranger browser(shown.web);
    browser.Say("GET / HTTP/1.1\r\n\r\n");
    EXPECT_TRUE(browser.Hear().find("Content-Length: ") != std::string::npos);
    Stranger socket(shown.web);
    socket.Say(upgrade);
    EXPECT_TRUE(socket.Hear().starts_with("HTTP/1.1 101 "));
    // The one for VNC viewers takes no page's connections.
    Stranger other(shown.vnc);
    other.Say(upgrade);
    EXPECT_EQ(other.Hear(), "RFB 003.008\n");
    EXPECT_EQ(other.Hear(), "");
    User user(shown.vnc);
    ASSERT_TRUE(user.IsIn());
    user.Key(0x15, true);
    EXPECT_TRUE(shown.Prints("key 15\n"));
    shown.End();  // with all of them still there
}

TEST(Viewers, PasswordIsAskedForAndRequiredBeyondThisMachine)
{
    auto const file = testing::TempDir() + "viewer-password" + std::to_string(getpid());
    std::ofstream(file) << "secret\nnot this\n";
    Shown shown("64x480x8 --listen 0.0.0.0 --password-file " + file + " -- " INPUT_PROBE);
    EXPECT_FALSE(User(shown.vnc, "wrong").IsIn());
    EXPECT_TRUE(User(shown.vnc, "secret").IsIn());
    auto const fails = [&](std::string const& words, std::string const& what) {
        auto const err = shown.folder + "refused";
        EXPECT_EQ(WEXITSTATUS(std::system((CONSOLE_TOOL " " + words + " -- true 2>" + err).c_str())), 2)
            << words;
        EXPECT_NE(Contents(err).find(what), std::string::npos) << Contents(err);
    };
    fails("--web=0 --listen 0.0.0.0", "to listen at 0.0.0.0 needs a password, see --password-file");
    fails("--web=0 --password-file /nonexistent", "cannot read a password from /nonexistent");
    fails("--web=0 --password-file /dev/null", "cannot read a password from /dev/null");
    fails("--vnc=" + std::to_string(shown.vnc), "Address already in use");
    fails("--vnc=70000", "the port '70000' isn't a number up to 65535");
    fails("--listen localhost", "--listen needs --web or --vnc");
    fails("--record a", "--record needs --web or --vnc");
    fails("--web=0 --record /nonexistent/a", "cannot write /nonexistent/a: No such file");
    unlink(file.c_str());
}

}
