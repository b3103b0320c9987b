#pragma once

#include <optional>

namespace console {

/// The way of a program's pointer to a place on the screen. A mouse tells only how far it was moved, so the
/// way begins with pushes into the top left corner, where every pointer stops, and goes straight to the place
/// in small reports, which no program takes for a fast movement. A pointer that should be at an edge is
/// pushed against it, so that a belief that was wrong comes right again.
class PointerPath {
public:
    struct Motion {
        int dx = 0;
        int dy = 0;

        bool operator==(Motion const&) const = default;
    };

    /// The pointer may be anywhere.
    void Forget() { width = height = 0; }

    /// The next report on the way to a pixel of a screen of this size; nothing if the pointer is there.
    std::optional<Motion> Next(int screenWidth, int screenHeight, int x, int y);

private:
    int width = 0;  // of the screen that the rest is about; 0 if nothing is known
    int height = 0;
    int cornerPushes = 0;  // still to come
    int atX = 0;
    int atY = 0;
    Motion edge;  // against which it was pushed
};

}
