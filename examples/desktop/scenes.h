#pragma once

#include "look.h"

#include <memory>

namespace desktop {

/// A picture as colours: of a point in a picture of this size.
using Scene = GrColor(Point at, Point size);

Scene Wallpaper;  ///< triangles, from deep blue to pale green
Scene Dusk;       ///< mountains and the sun above a lake
Scene Mosaic;     ///< the same, laid of stones
Scene Spheres;    ///< on a chequered floor
Scene Stones;     ///< small bright triangles

/// A scene in the screen's own format, with the errors diffused where that has few colours, so that painting
/// it is copying.
std::unique_ptr<GrImage> NewScene(Scene scene, Point size);

}
