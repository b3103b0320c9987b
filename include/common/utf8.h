#pragma once

#include <string>

namespace Common {

/// Puts up to `size` bytes of UTF-8, or those before a 0, into `out` as UTF-16. False if there was a byte
/// that is no UTF-8, which becomes U+FFFD, or a character longer than it should be; `out` has the text even
/// so.
bool DecodeUtf8(std::u16string& out, char const* bytes, std::size_t size);

}
