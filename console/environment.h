#pragma once

namespace console {

/// The environment variable through which the tool tells the preloaded object the descriptor of the state.
inline constexpr char const* kStateVariable = "TESSELLA_CONSOLE_STATE";

}
