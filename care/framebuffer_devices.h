#pragma once

namespace care {

/// Where the library looks for a framebuffer, in this order.
inline constexpr char const* kFramebufferDevices[] = {"/dev/fb0", "/dev/fb/0", "/devfs/fb/0"};

}
