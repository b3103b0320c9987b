#include <console/display_mode.h>

#include <console/vga_model.h>

#include <array>
#include <charconv>

namespace console {

namespace {

/// Cuts off and returns what stands before the separator; all of the text if there is none.
std::string_view TakePart(std::string_view& text, char separator)
{
    auto const end = text.find(separator);
    auto const part = text.substr(0, end);
    text.remove_prefix(end == std::string_view::npos ? text.size() : end + 1);
    return part;
}

template <std::size_t count>
std::optional<std::array<unsigned, count>> ParseNumbers(std::string_view text, char separator)
{
    std::array<unsigned, count> numbers{};
    for (std::size_t i = 0; i < count; ++i) {
        bool const last = i + 1 == count;  // takes all that is left, so that nothing may follow
        auto const parsed = ParseNumber(last ? text : TakePart(text, separator));
        if (!parsed) return std::nullopt;
        numbers[i] = *parsed;
    }
    return numbers;
}

}

std::optional<unsigned> ParseNumber(std::string_view text)
{
    unsigned number = 0;
    auto const result = std::from_chars(text.data(), text.data() + text.size(), number);
    if (result.ec != std::errc() || result.ptr != text.data() + text.size()) return std::nullopt;
    return number;
}

unsigned ShortestPitch(unsigned width, unsigned depth)
{
    return depth == 4 ? width / 8 : width * BytesPerPixel(depth);
}

unsigned BytesPerPixel(unsigned depth) { return (depth + 7) / 8; }

PixelFormat FormatOf(unsigned depth)
{
    switch (depth) {
    // The planar driver tells how wide the converter is.
    case 4: return {4, {0, 6}, {0, 6}, {0, 6}, {0, 0}};
    // In a mode with a colour map the kernel's driver gives each field the whole pixel.
    case 8: return {8, {0, 8}, {0, 8}, {0, 8}, {0, 8}};
    case 15: return {16, {10, 5}, {5, 5}, {0, 5}, {15, 1}};
    case 16: return {16, {11, 5}, {5, 6}, {0, 5}, {0, 0}};
    case 24: return {24, {16, 8}, {8, 8}, {0, 8}, {0, 0}};
    default: return {32, {16, 8}, {8, 8}, {0, 8}, {24, 8}};
    }
}

std::optional<DisplayMode> ParseMode(std::string_view text)
{
    auto const numbers = ParseNumbers<3>(text, 'x');
    if (!numbers) return std::nullopt;
    auto const [width, height, depth] = *numbers;
    if (width < 1 || width > kLongestSide || height < 1 || height > kLongestSide) return std::nullopt;
    if (depth == 4 && (width % 8 != 0 || width / 8 * height > VgaModel::kWindow)) return std::nullopt;
    if (depth != 4 && depth != 8 && depth != 15 && depth != 16 && depth != 24 && depth != 32)
        return std::nullopt;
    return DisplayMode{width, height, depth, ShortestPitch(width, depth)};
}

std::optional<PixelFormat> ParseFormat(std::string_view text)
{
    auto const bits = ParseNumber(TakePart(text, ':'));
    auto const lengths = ParseNumbers<3>(text, ',');
    if (!bits || !lengths) return std::nullopt;
    auto const [red, green, blue] = *lengths;
    return PixelFormat{*bits, {blue + green, red}, {blue, green}, {0, blue}, {0, 0}};
}

bool IsPitchValid(DisplayMode const& mode, unsigned pitch)
{
    unsigned const shortest = ShortestPitch(mode.width, mode.depth);
    return mode.depth == 4 ? pitch == shortest : pitch >= shortest && pitch <= kLongestPitch;
}

}
