#pragma once

#include <string>
#include <string_view>

/// Appends the characters of `bytes` to `out`, up to the first that is none or that XML does not have: those
/// below the space, longer forms than needed, surrogates, U+FFFE and U+FFFF, and beyond U+10FFFF. Result: how
/// many bytes were good.
std::size_t DecodeStrictUtf8(std::u16string& out, std::string_view bytes);

/// Appends one character, at most U+10FFFF, as one unit or two.
void AppendUtf16(std::u16string& out, char32_t character);
