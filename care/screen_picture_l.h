#pragma once

#include <console/picture.h>

#include <string>
#include <variant>

namespace care {

/// What the framebuffer's device shows now, whoever draws on it. Gives what stands in the way, in one
/// sentence, if that can't be had.
std::variant<console::Picture, std::string> TakeScreenPicture();

}
