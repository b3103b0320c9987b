#include <console/picture.h>

#include <console/colour_map.h>

#include <algorithm>
#include <png.h>

namespace console {

namespace {

struct Shown {
    std::uint8_t red, green, blue;
};

/// The bytes of a pixel as a number; the lowest come first.
std::uint32_t ReadPixel(unsigned char const* bytes, unsigned count)
{
    std::uint32_t pixel = 0;
    for (unsigned i = 0; i < count; ++i)
        pixel |= std::uint32_t{bytes[i]} << (8 * i);
    return pixel;
}

using Converter = std::uint8_t (*)(std::uint16_t component);

Shown ShowIndex(ColourMap const& colours, std::uint32_t index, Converter shown)
{
    return {shown(colours.red[index]), shown(colours.green[index]), shown(colours.blue[index])};
}

void Append(Picture& picture, Shown shown)
{
    picture.bytes.insert(picture.bytes.end(), {shown.red, shown.green, shown.blue});
}

std::uint8_t ShowField(std::uint32_t pixel, ColourField field, unsigned depth)
{
    return ShownField(pixel >> field.offset & ((1U << field.length) - 1), field.length, depth);
}

Shown ShowPacked(PixelFormat const& format, unsigned depth, std::uint32_t pixel)
{
    return {ShowField(pixel, format.red, depth), ShowField(pixel, format.green, depth),
        ShowField(pixel, format.blue, depth)};
}

/// Four bytes, one a plane, stand for 8 pixels, the leftmost in the highest bits.
void ShowPlanes(Picture& picture, ColourMap const& colours, std::span<unsigned char const> planes)
{
    for (std::size_t at = 0; at < std::size_t{picture.width} * picture.height; ++at) {
        auto const word = ReadPixel(&planes[at / 8 * 4], 4);
        Append(picture, ShowIndex(colours, VgaModel::PixelOf(word, 7 - at % 8), ShownByNarrowConverter));
    }
}

}

std::uint32_t Picture::At(unsigned x, unsigned y) const
{
    auto const* const pixel = &bytes.at((std::size_t{y} * width + x) * 3);
    return std::uint32_t{pixel[0]} << 16 | std::uint32_t{pixel[1]} << 8 | pixel[2];
}

Picture TakePicture(DisplayMode const& mode, ColourMap const& colours, std::span<unsigned char const> memory)
{
    Picture picture{mode.width, mode.height, {}};
    picture.bytes.reserve(std::size_t{mode.width} * mode.height * 3);
    if (mode.depth == 4) {
        ShowPlanes(picture, colours, memory);
        return picture;
    }
    auto const format = FormatOf(mode.depth);
    unsigned const step = BytesPerPixel(mode.depth);
    for (unsigned y = 0; y < mode.height; ++y) {
        auto const row = memory.subspan(std::size_t{y} * mode.pitch, std::size_t{mode.width} * step);
        for (std::size_t at = 0; at < row.size(); at += step) {
            auto const pixel = ReadPixel(&row[at], step);
            auto const shown = mode.depth == 8 ? ShowIndex(colours, pixel, ShownByConverter)
                                               : ShowPacked(format, mode.depth, pixel);
            Append(picture, shown);
        }
    }
    return picture;
}

std::string SavePicture(Picture const& picture, std::string const& path)
{
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    image.width = picture.width;
    image.height = picture.height;
    image.format = PNG_FORMAT_RGB;
    image.flags = PNG_IMAGE_FLAG_FAST;
    if (png_image_write_to_file(&image, path.c_str(), 0, picture.bytes.data(), 0, nullptr) != 0) return {};
    return image.message;
}

std::variant<Picture, std::string> LoadPicture(std::string const& path)
{
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    if (png_image_begin_read_from_file(&image, path.c_str()) == 0) return image.message;
    image.format = PNG_FORMAT_RGB;
    Picture picture{image.width, image.height, std::vector<std::uint8_t>(PNG_IMAGE_SIZE(image))};
    png_color const behind{};  // what is transparent shows black
    if (png_image_finish_read(&image, &behind, picture.bytes.data(), 0, nullptr) == 0) return image.message;
    return picture;
}

Picture Difference(Picture const& a, Picture const& b)
{
    Picture picture = a;
    for (std::size_t i = 0; i + 3 <= a.bytes.size(); i += 3) {
        auto* const pixel = &picture.bytes[i];
        bool const differs = !std::equal(pixel, pixel + 3, &b.bytes[i]);
        for (int j = 0; j < 3; ++j)
            pixel[j] = static_cast<std::uint8_t>(differs ? (j == 0) * 0xFF : 0xC0 + pixel[j] / 4);
    }
    return picture;
}

}
