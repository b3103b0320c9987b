#pragma once

#include "look.h"

#include <memory>

namespace desktop {

/// The shapes of the pointer.
enum class Pointer { Arrow, Hand, Beam, Cross, Wait, Move, Count };
constexpr int kPointerCount = static_cast<int>(Pointer::Count);
constexpr int kPointerSide = 26;  ///< of the pictures

/// Makes the shapes; there must be a session.
void LoadPointers();
/// Before the session ends.
void FreePointers();

/// Has the pointer take a shape.
void ShowPointer(Pointer shape);
/// A shape as a picture, with alpha.
GrImage const& PictureOf(Pointer shape);

}
