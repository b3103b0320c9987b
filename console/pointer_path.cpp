#include <console/pointer_path.h>

#include <algorithm>
#include <cstdlib>

namespace console {

namespace {

constexpr int kFarthest = 127;  // what a report carries, in each direction
constexpr int kSlow = 5;        // what is not accelerated

/// The push against the edge that a coordinate lies at, 0 if it lies at none.
int PushAt(int coordinate, int size)
{
    if (coordinate == 0) return -kFarthest;
    return coordinate == size - 1 ? kFarthest : 0;
}

}

std::optional<PointerPath::Motion> PointerPath::Next(int screenWidth, int screenHeight, int x, int y)
{
    if (screenWidth != width || screenHeight != height) {
        width = screenWidth;
        height = screenHeight;
        cornerPushes = std::max(width, height) / kFarthest + 1;
        atX = atY = 0;
        edge = {-kFarthest, -kFarthest};
    }
    if (cornerPushes > 0) {
        --cornerPushes;
        return Motion{-kFarthest, -kFarthest};
    }
    x = std::clamp(x, 0, width - 1);
    y = std::clamp(y, 0, height - 1);
    if (x != atX || y != atY) {
        int const dx = x - atX;
        int const dy = y - atY;
        int const reports = (std::max(std::abs(dx), std::abs(dy)) + kSlow - 1) / kSlow;
        Motion const step{dx / reports, dy / reports};
        atX += step.dx;
        atY += step.dy;
        return step;
    }
    auto const before = edge;
    edge = {PushAt(x, width), PushAt(y, height)};
    Motion const push{edge.dx == before.dx ? 0 : edge.dx, edge.dy == before.dy ? 0 : edge.dy};
    if (push == Motion()) return std::nullopt;
    return push;
}

}
