#pragma once

#include "plate.h"

namespace gallery {

constexpr int kCursorColumns = 4, kCursorCount = 12;

/// A new cursor for the screen. Of two of the same shape, the first has a mask, the other a soft shadow.
std::unique_ptr<GrCursor> NewCursor(int index);

}
