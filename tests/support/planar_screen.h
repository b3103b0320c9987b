#pragma once

#include <console/vga_trap.h>
#include <console/virtual_console.h>
#include <tessella/screen.h>

#include <gtest/gtest.h>

#include <array>
#include <cstdio>
#include <string>
#include <utility>
#include <vector>

#include <sys/mman.h>

/// A 4-plane screen of this process, eight pixels a byte, with a record of all that reaches its controller.
class PlanarScreen {
public:
    explicit PlanarScreen(unsigned bytesPerRow)
    {
        console.AttachProcess();  // which answers requests for ports
        vga.portsAllowed = true;
        console::TrapVga(window, &model);
        GrScreen.fbMemory = window;
        GrScreen.fbLength = console::VgaModel::kWindow;
        GrScreen.stride = bytesPerRow;
        GrScreen.ditherLine = errors.data();
        GrScreen.depth = 4;
        GrScreen.bytesPerPixel = 1;
    }
    ~PlanarScreen()
    {
        console::TrapVga(nullptr, nullptr);
        munmap(window, console::VgaModel::kWindow);
        GrScreen = {};
    }
    PlanarScreen(PlanarScreen const&) = delete;
    PlanarScreen& operator=(PlanarScreen const&) = delete;

    /// What has come since the last call: words, OFFSET=BYTE for a store, OFFSET? for a load.
    std::string Told()
    {
        std::string told;
        for (auto const& [kind, value, offset] : Events()) {
            char text[32];
            if (kind == console::VgaEvent::Kind::Port)
                std::snprintf(text, sizeof text, "%04x ", value);
            else if (kind == console::VgaEvent::Kind::Store)
                std::snprintf(text, sizeof text, "%u=%02x ", offset, value);
            else
                std::snprintf(text, sizeof text, "%u? ", offset);
            told += text;
        }
        return told;
    }

    /// Gives each pixel that stores since the last call have let through its colour, one byte a pixel. Those
    /// that they have held back keep theirs, and inverting is with the pixel, not with the latches: what the
    /// adapter does not promise.
    void Follow(std::vector<unsigned char>& pixels, unsigned pixelsPerRow)
    {
        for (auto const& [kind, value, offset] : Events()) {
            if (kind == console::VgaEvent::Kind::Port) registers[value & 0xFF] = value >> 8;
            if (kind != console::VgaEvent::Kind::Store) continue;
            ASSERT_EQ(registers[5], 2) << "write mode";
            for (unsigned x = 0; x < 8; ++x) {
                if ((registers[8] >> (7 - x) & 1) == 0) continue;
                auto& pixel =
                    pixels.at(offset / GrScreen.stride * pixelsPerRow + offset % GrScreen.stride * 8 + x);
                pixel = static_cast<unsigned char>((registers[3] == 0x18 ? pixel ^ value : value) & 15);
            }
        }
        ASSERT_EQ(registers[3], 0) << "stores replace again";
    }

    std::vector<std::uint32_t> planes = std::vector<std::uint32_t>(console::VgaModel::kWindow);

private:
    std::span<console::VgaEvent const> Events()
    {
        EXPECT_LE(record.count, room.size());
        return {room.data(), std::exchange(record.count, 0)};
    }

    console::VirtualConsole console{{*console::ParseMode("8x8x8"), {}, {}}};
    console::VgaState vga;
    std::vector<console::VgaEvent> room = std::vector<console::VgaEvent>(1 << 16);
    console::VgaRecord record{room, 0};
    console::VgaModel model{vga, planes.data(), &record};
    unsigned char* const window = static_cast<unsigned char*>(
        mmap(nullptr, console::VgaModel::kWindow, PROT_NONE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0));
    std::vector<std::int32_t> errors = std::vector<std::int32_t>(3 * 8 * 80);
    std::array<int, 9> registers{};
};
