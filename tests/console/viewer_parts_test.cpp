#include <console/http_request.h>
#include <console/pointer_path.h>
#include <console/recording.h>
#include <console/viewer_keys.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <random>

#include <unistd.h>

using namespace console;

namespace {

TEST(PointerPath, ReachesEveryPlaceFromWhereverThePointerIs)
{
    std::mt19937 random(7);
    for (int round = 0; round < 300; ++round) {
        PointerPath path;
        int const width = 1 + static_cast<int>(random() % 1400);
        int const height = 1 + static_cast<int>(random() % 1100);
        int x = static_cast<int>(random()) % width;
        int y = static_cast<int>(random()) % height;
        auto const go = [&](int toX, int toY) {
            while (auto const motion = path.Next(width, height, toX, toY)) {
                // As programs do: what is fast goes twice as far.
                x = std::clamp(x + motion->dx * (std::abs(motion->dx) > 5 ? 2 : 1), 0, width - 1);
                y = std::clamp(y + motion->dy * (std::abs(motion->dy) > 5 ? 2 : 1), 0, height - 1);
            }
        };
        for (int i = 0; i < 5; ++i) {
            int const toX = static_cast<int>(random() % static_cast<unsigned>(width));
            int const toY = static_cast<int>(random() % static_cast<unsigned>(height));
            go(toX, toY);
            ASSERT_EQ(std::pair(x, y), std::pair(toX, toY)) << width << "x" << height;
        }
        // Somebody else has moved it: known at the edges again.
        x = std::min(x + 7, width - 1);
        go(width + 9, 0);
        go(width / 2, height / 2);
        EXPECT_EQ(std::pair(x, y), std::pair(width / 2, height / 2));
    }
}

TEST(HttpRequest, OnlyItsOwnPageMayUpgrade)
{
    using enum HttpWish;
    std::string const end = " HTTP/1.1\r\n";
    auto const upgrade = [](std::string const& host, std::string const& origin) {
        return "GET /x HTTP/1.1\r\nHost: " + host + "\r\nUPGRADE:WebSocket \r\nOrigin: " + origin +
            "\r\n\r\n";
    };
    struct {
        HttpWish local, remote;  // without a password and with one
        std::string request;
    } const cases[] = {{Page, Page, "GET /" + end + "\r\n"},
        {Page, Page, "GET /?a=b" + end + "Host: x\r\n\r\n"}, {More, More, "GET /" + end + "Host: x\r\n"},
        {NotFound, NotFound, "GET /favicon.ico" + end + "\r\n"},
        {WrongMethod, WrongMethod, "POST /" + end + "\r\n"}, {Malformed, Malformed, "GET / HTTP/2\r\n\r\n"},
        {Malformed, Malformed, "GET \x01"}, {TooLong, TooLong, "GET /" + std::string(4000, 'a')},
        {WebSocket, WebSocket, upgrade("localhost:6080", "http://localhost:6080")},
        {WebSocket, WebSocket, upgrade("127.0.0.1:1", "http://127.0.0.1:1")},
        {WebSocket, WebSocket, upgrade("[::1]", "https://[::1]")},
        {Forbidden, WebSocket, upgrade("kiosk.example:6080", "http://kiosk.example:6080")},
        {Forbidden, WebSocket, upgrade("127.evil.example", "http://127.evil.example")},
        {Forbidden, Forbidden, upgrade("localhost:6080", "http://localhost:3000")},
        {Forbidden, Forbidden, upgrade("localhost:6080", "http://evil.example")},
        {Forbidden, Forbidden, upgrade("localhost:6080", "null")},
        {Forbidden, Forbidden, "GET /" + end + "Host: localhost\r\nUpgrade: websocket\r\n\r\n"},
        {Malformed, Malformed, upgrade("localhost\r\nHost: x", "http://localhost")}};
    for (auto const& [local, remote, request] : cases) {
        EXPECT_EQ(ReadHttpRequest(request, true), local) << request;
        EXPECT_EQ(ReadHttpRequest(request, false), remote) << request;
    }
    std::mt19937 random(3);
    for (int round = 0; round < 20000; ++round) {
        auto text = cases[random() % std::size(cases)].request;
        for (auto left = random() % 4; left > 0; --left)
            text[random() % text.size()] = "\r\n:/ \0x"[random() % 7];
        ReadHttpRequest(text.substr(0, random() % (text.size() + 1)), random() % 2 != 0);
    }
}

TEST(ViewerKeys, ComeByPlaceOrByCharacter)
{
    auto const scan = [](unsigned code) { return int{CodeOfScanCode(code).value_or(0)}; };
    EXPECT_EQ(
        (std::vector{scan(0x1E), scan(0x58), scan(0x54), scan(0x9D), scan(0xC8), scan(0xDD), scan(0xC6)}),
        (std::vector{30, 88, 99, 97, 103, 127, 119}));
    for (unsigned const unknown : {0u, 0x55u, 0x80u, 0xAAu, 0x13Cu, 0xFFFFFFFFu})
        EXPECT_EQ(scan(unknown), 0) << unknown;
    KeysymTable const table;
    auto const key = [&](unsigned keysym) { return int{table.CodeOf(keysym).value_or(0)}; };
    EXPECT_EQ((std::vector{key('a'), key('A'), key('<'), key(0xFF0D), key(0xFF8D), key(0xFFE1), key(0xE9)}),
        (std::vector{30, 30, 51, 28, 96, 42, 0}));
    EXPECT_EQ(ConsoleOfKeysym(0x1008FE0C), 12u);
    EXPECT_FALSE(ConsoleOfKeysym(0x1008FE0D));
}

TEST(Recording, IsTheScriptOfWhatWasDone)
{
    std::string const path = testing::TempDir() + "recording" + std::to_string(getpid());
    std::mt19937 random(11);
    Script done;
    auto recording = std::make_unique<Recording>(path, "a\tcomment");
    recording->Begin();
    auto const add = [&](StepAction const& action) {
        recording->Add(action);
        done.steps.emplace_back().action = action;
    };
    unsigned buttons = 0;
    for (int i = 0; i < 2000; ++i) {
        unsigned const number = random() >> 8;
        switch (random() % 8) {
        case 0: add(KeyByte{static_cast<unsigned char>(number)}); break;
        case 1: add(MouseReport{0, 0, 0, buttons ^= 1U << number % 3}); break;
        case 2: add(MouseReport{0, 0, number & 1 ? 1 : -1, buttons}); break;
        case 3: add(ConsoleSwitch{1 + number % 63}); break;
        default: add(MouseReport{static_cast<int>(number % 127), -5, 0, buttons});
        }
    }
    auto const written = [&] { return std::get<Script>(ReadScript(path)); };
    recording->OnRead();
    add(KeyByte{0x01});
    recording->Add(KeyByte{0x81});  // which comes too late
    EXPECT_EQ(recording->End(false), "");
    EXPECT_EQ(PrintSteps(written()), PrintSteps(done));

    recording = std::make_unique<Recording>(path, "");
    recording->Begin();
    usleep(30000);
    recording->Add(KeyByte{0x81});
    EXPECT_EQ(recording->End(true), "");
    auto const steps = written().steps;
    ASSERT_EQ(steps.size(), 3u);
    EXPECT_GE(std::get<Pause>(steps[0].action).time.count(), 30);
    EXPECT_TRUE(std::holds_alternative<Quit>(steps[2].action));
    unlink(path.c_str());
    EXPECT_THROW(Recording("/dev/full", ""), std::system_error);
}

}
