#include <console/virtual_console.h>

#include <gtest/gtest.h>

#include <array>
#include <cerrno>
#include <vector>

#include <fcntl.h>
#include <unistd.h>

namespace console {

namespace {

using Bytes = std::vector<unsigned char>;

class Mouse : public testing::Test {
protected:
    Mouse() { machine.AttachProcess(); }

    void Write(Bytes const& bytes) const
    {
        ASSERT_EQ(write(fd.Get(), bytes.data(), bytes.size()), static_cast<ssize_t>(bytes.size()));
    }

    /// Everything that can be read now.
    Bytes Read() const
    {
        fcntl(fd.Get(), F_SETFL, O_NONBLOCK);
        Bytes bytes(64);
        auto const length = read(fd.Get(), bytes.data(), bytes.size());
        fcntl(fd.Get(), F_SETFL, 0);
        bytes.resize(length < 0 ? 0 : static_cast<std::size_t>(length));
        return bytes;
    }

    void Open() { fd = OwnedFd(open("/dev/input/mice", O_RDWR), "the mouse"); }

    VirtualConsole machine{{*ParseMode("8x8x8"), {}, {}}};
    OwnedFd fd;
};

Bytes const kWheelOn = {0xF3, 200, 0xF3, 100, 0xF3, 80};
Bytes const kExplorerOn = {0xF3, 200, 0xF3, 200, 0xF3, 80};

TEST_F(Mouse, AnswerIsThereWhenTheWriteReturnsAndReplacesTheOneBefore)
{
    Open();
    for (int round = 0; round < 1000; ++round) {
        Write(kWheelOn);  // six acknowledgements, of which none is read
        Write({0xF2});
        ASSERT_EQ(Read(), (Bytes{0xFA, 3}));
    }
    Write(kWheelOn);
    EXPECT_EQ(Read(), (Bytes{0xFA}));
    Write({0xFF});
    EXPECT_EQ(Read(), (Bytes{0xFA, 0xAA, 0}));
    Write({0xF2});
    EXPECT_EQ(Read(), (Bytes{0xFA, 0})) << "a reset turns the wheel off";
    Write({0xE9});
    EXPECT_EQ(Read(), (Bytes{0xFA, 0x60, 3, 200}));
}

TEST_F(Mouse, SequencesMayComeInPiecesButNotWithGaps)
{
    struct Case {
        std::vector<Bytes> writes;
        unsigned char id;
    };
    for (auto const& [writes, id] : {
             Case{{}, 0},
             Case{{kWheelOn}, 3},
             Case{{{0xF3}, {200}, {0xF3, 100}, {0xF3}, {80}}, 3},
             Case{{kExplorerOn}, 4},
             Case{{kWheelOn, kExplorerOn}, 4},
             Case{{{0xF3, 200, 0xF3, 100, 0xF4, 0xF3, 80}}, 0},
             Case{{{0xF3, 200}, kWheelOn}, 0},
         }) {
        Open();  // plain again each time
        for (auto const& bytes : writes)
            Write(bytes);
        Write({0xF2});
        EXPECT_EQ(Read(), (Bytes{0xFA, id}));
    }
}

TEST_F(Mouse, PacketsHaveTheWheelOnlyWhereItIsOn)
{
    EXPECT_TRUE(machine.MoveMouse(3, 3)) << "nobody listens yet";
    Open();
    EXPECT_EQ(Read(), Bytes{});
    machine.MoveMouse(10, 5);
    EXPECT_EQ(Read(), (Bytes{0x28, 0x0A, 0xFB})) << "the mouse counts upward";
    machine.MoveMouse(0, 0, 1);
    EXPECT_EQ(Read(), (Bytes{0x08, 0, 0}));
    Write(kWheelOn);
    Read();
    machine.MoveMouse(10, 5);
    machine.MoveMouse(0, 0, 1);
    machine.MoveMouse(0, 0, 0, 1);
    machine.MoveMouse(-1, 0, -1, 6);
    EXPECT_EQ(Read(), (Bytes{0x28, 0x0A, 0xFB, 0, 0x08, 0, 0, 0xFF, 0x09, 0, 0, 0, 0x1E, 0xFF, 0, 1}));
    machine.MoveMouse(300, -128);
    EXPECT_EQ(Read(), (Bytes{0x08, 127, 127, 0, 0x08, 127, 1, 0, 0x08, 46, 0, 0})) << "long ways take more";
    Write({0xEB});
    EXPECT_EQ(Read(), (Bytes{0xFA, 0x08, 0, 0, 0}));
}

TEST_F(Mouse, DuplicatesAreTheMouseAndReusedNumbersAreNot)
{
    Open();
    OwnedFd const twin(dup(fd.Get()), "a duplicate");
    int const number = fd.Get();
    fd.Close();
    OwnedFd const file(open("/dev/null", O_WRONLY), "a file");
    ASSERT_EQ(file.Get(), number);
    unsigned char const getId = 0xF2;
    EXPECT_EQ(write(file.Get(), &getId, 1), 1);
    std::array<unsigned char, 4> bytes{};
    ASSERT_EQ(fcntl(twin.Get(), F_SETFL, O_NONBLOCK), 0);
    EXPECT_EQ(read(twin.Get(), bytes.data(), bytes.size()), -1);
    EXPECT_EQ(errno, EAGAIN);
    EXPECT_EQ(write(twin.Get(), &getId, 1), 1);
    EXPECT_EQ(read(twin.Get(), bytes.data(), bytes.size()), 2);
}

TEST_F(Mouse, ListenerThatNeverReadsLosesPacketsButStopsNobody)
{
    Open();
    bool kept = true;
    for (int i = 0; i < 100000 && kept; ++i)
        kept = machine.MoveMouse(1, 1);
    EXPECT_FALSE(kept);
}

}

}
