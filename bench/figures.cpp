#include <bench/rows.h>
#include <bench/shapes.h>
#include <bench/surfaces.h>

#include <SDL.h>
#include <benchmark/benchmark.h>
#include <pixman.h>

#include <array>
#include <complex>
#include <cstring>
#include <functional>
#include <memory>
#include <numbers>
#include <vector>

// Lines and ellipses in one colour, on images as wide as the screen or 16 pixels wider: a pitch of 4,096
// bytes sends all rows of a column to one cache set. SDL's lines are those of its software renderer. Neither
// peer has ellipses. Their users draw polygons of 64 corners; or, in rows of their own, they find out
// themselves which rows or points to paint, as fast as can be, and have them painted in one call an ellipse.

namespace {

using SharedSurface = std::shared_ptr<Surface const>;

/// What is drawn in one pass: a line from `x1`, `y1` to `x2`, `y2`, both painted, or an ellipse that fills
/// the rectangle.
using Places = std::vector<GrRect>;

using DrawAll = std::function<void(Places const&)>;

constexpr int kPlaces = 64;

struct RendererDeleter {
    void operator()(SDL_Renderer* renderer) const { SDL_DestroyRenderer(renderer); }
};

/// SDL's software renderer on a surface, with the colour set.
struct Renderer {
    SdlSurface target;
    std::unique_ptr<SDL_Renderer, RendererDeleter> renderer;

    explicit Renderer(Surface const& surface)
        : target(surface.NewSdlSurface()), renderer(SDL_CreateSoftwareRenderer(target.get()))
    {
        SDL_SetRenderDrawColor(renderer.get(), 32, 96, 160, 255);
    }
};

DrawAll LinesOurs(Surface const& surface)
{
    std::shared_ptr<GrContext> const context = surface.NewContext();
    return [context](Places const& places) {
        for (auto const& [x1, y1, x2, y2] : places)
            context->DrawLine(x1, y1, x2, y2);
    };
}

DrawAll LinesSdl(Surface const& surface)
{
    auto const sdl = std::make_shared<Renderer>(surface);
    return [sdl](Places const& places) {
        for (auto const& [x1, y1, x2, y2] : places)
            SDL_RenderDrawLine(sdl->renderer.get(), x1, y1, x2, y2);
        SDL_RenderFlush(sdl->renderer.get());
    };
}

DrawAll FilledOurs(Surface const& surface)
{
    std::shared_ptr<GrContext> const context = surface.NewContext();
    return [context](Places const& places) {
        for (auto const& [x1, y1, x2, y2] : places)
            context->FillArc(x1 - 1, y1 - 1, x2 - x1 + 1, y2 - y1 + 1, 0, 23040);
    };
}

DrawAll OutlinedOurs(Surface const& surface)
{
    std::shared_ptr<GrContext> const context = surface.NewContext();
    return [context](Places const& places) {
        for (auto const& [x1, y1, x2, y2] : places)
            context->DrawArc(x1, y1, x2 - x1 - 1, y2 - y1 - 1, 0, 23040);
    };
}

/// Walks along a quarter of the ellipse, from its middle row outward: `visit` gets how far from the sides,
/// and from the middle row or rows, each of its points is, until it returns false.
template <typename Visit>
void WalkEllipse(std::int64_t w, std::int64_t h, Visit visit)
{
    bool const odd = h % 2 != 0;
    std::int64_t span = w * h * h;
    std::int64_t row = w * w * (odd ? 1 : 2);
    std::int64_t decision = ((2 * w - 1) * h * h - (odd ? 0 : w * w)) / 4 - row;
    for (int inset = 0, rise = 0; 2 * inset < w;) {
        if (!visit(inset, rise)) return;
        if (decision < 0) {
            span -= 2 * h * h;
            decision += span;
            ++inset;
        }
        if (decision >= 0) {
            row += 2 * w * w;
            decision -= row;
            ++rise;
        }
    }
}

/// The rows of the ellipse as boxes of `{x1, y1, x2, y2}`.
template <typename Box>
void AddRowsOf(GrRect const& r, std::vector<Box>& boxes)
{
    int const upper = r.y1 + (r.y2 - r.y1 - 1) / 2;
    int const lower = r.y1 + (r.y2 - r.y1) / 2;
    int next = 0;
    WalkEllipse(r.x2 - r.x1, r.y2 - r.y1, [&](int inset, int rise) {
        if (rise != next) return true;
        if (upper - rise < r.y1) return false;
        ++next;
        boxes.push_back({r.x1 + inset, upper - rise, r.x2 - inset, upper - rise + 1});
        if (lower + rise != upper - rise)
            boxes.push_back({r.x1 + inset, lower + rise, r.x2 - inset, lower + rise + 1});
        return true;
    });
}

/// The points of the outline, as `make(x, y)`.
template <typename Point, typename Make>
void AddPointsOf(GrRect const& r, std::vector<Point>& points, Make make)
{
    int const upper = r.y1 + (r.y2 - r.y1 - 1) / 2;
    int const lower = r.y1 + (r.y2 - r.y1) / 2;
    WalkEllipse(r.x2 - r.x1, r.y2 - r.y1, [&](int inset, int rise) {
        for (int const x : {r.x1 + inset, r.x2 - 1 - inset})
            for (int const y : {upper - rise, lower + rise})
                points.push_back(make(x, y));
        return r.x2 - r.x1 - 2 * inset > 2;
    });
}

DrawAll FilledSdl(Surface const& surface)
{
    std::shared_ptr<SDL_Surface> const target = surface.NewSdlSurface();
    return [target, pixel = surface.Pixel()](Places const& places) {
        std::vector<GrRect> rows;
        for (GrRect const& place : places) {
            rows.clear();
            AddRowsOf(place, rows);
            for (auto& [x1, y1, x2, y2] : rows) {
                x2 -= x1;
                y2 -= y1;
            }
            static_assert(sizeof(GrRect) == sizeof(SDL_Rect));
            SDL_FillRects(target.get(), reinterpret_cast<SDL_Rect const*>(rows.data()),
                static_cast<int>(rows.size()), pixel);
        }
    };
}

/// Its alpha goes into the byte that the others leave 0.
constexpr pixman_color_t kPixmanColor{0x2020, 0x6060, 0xA0A0, 0};

DrawAll FilledPixman(Surface const& surface)
{
    std::shared_ptr<pixman_image> const image = surface.NewPixmanImage();
    return [image](Places const& places) {
        std::vector<pixman_box32_t> rows;
        for (GrRect const& place : places) {
            rows.clear();
            AddRowsOf(place, rows);
            pixman_image_fill_boxes(
                PIXMAN_OP_SRC, image.get(), &kPixmanColor, static_cast<int>(rows.size()), rows.data());
        }
    };
}

DrawAll OutlinedSdl(Surface const& surface)
{
    auto const sdl = std::make_shared<Renderer>(surface);
    return [sdl](Places const& places) {
        std::vector<SDL_Point> points;
        for (GrRect const& place : places) {
            points.clear();
            AddPointsOf(place, points, [](int x, int y) { return SDL_Point{x, y}; });
            SDL_RenderDrawPoints(sdl->renderer.get(), points.data(), static_cast<int>(points.size()));
        }
        SDL_RenderFlush(sdl->renderer.get());
    };
}

DrawAll OutlinedPixman(Surface const& surface)
{
    std::shared_ptr<pixman_image> const image = surface.NewPixmanImage();
    return [image](Places const& places) {
        std::vector<pixman_box32_t> points;
        for (GrRect const& place : places) {
            points.clear();
            AddPointsOf(place, points, [](int x, int y) { return pixman_box32_t{x, y, x + 1, y + 1}; });
            pixman_image_fill_boxes(
                PIXMAN_OP_SRC, image.get(), &kPixmanColor, static_cast<int>(points.size()), points.data());
        }
    };
}

constexpr int kCorners = 64;

/// Corners of a polygon for the ellipse around 0, 0 with radii of 1, the first one again at the end.
auto const kCircle = [] {
    std::array<std::complex<double>, kCorners + 1> corners;
    for (int i = 0; i <= kCorners; ++i)
        corners[static_cast<std::size_t>(i)] = std::polar(1.0, i * 2 * std::numbers::pi / kCorners);
    return corners;
}();

template <typename Point, typename Make>
std::vector<Point> CornersOf(GrRect const& r, Make make)
{
    std::vector<Point> corners;
    corners.reserve(kCircle.size());
    for (auto const& corner : kCircle)
        corners.push_back(make((r.x1 + r.x2 + corner.real() * (r.x2 - r.x1 - 1)) / 2,
            (r.y1 + r.y2 + corner.imag() * (r.y2 - r.y1 - 1)) / 2));
    return corners;
}

DrawAll PolygonsSdl(Surface const& surface)
{
    auto const sdl = std::make_shared<Renderer>(surface);
    return [sdl](Places const& places) {
        std::vector<int> indices;
        for (GrRect const& place : places) {
            auto const corners = CornersOf<SDL_Vertex>(place, [](double x, double y) {
                return SDL_Vertex{{static_cast<float>(x), static_cast<float>(y)}, {32, 96, 160, 255}, {0, 0}};
            });
            int const count = static_cast<int>(corners.size());
            indices.clear();
            for (int i = 1; i + 1 < count; ++i)
                indices.insert(indices.end(), {0, i, i + 1});
            SDL_RenderGeometry(sdl->renderer.get(), nullptr, corners.data(), count, indices.data(),
                static_cast<int>(indices.size()));
        }
        SDL_RenderFlush(sdl->renderer.get());
    };
}

DrawAll PolygonLinesSdl(Surface const& surface)
{
    auto const sdl = std::make_shared<Renderer>(surface);
    return [sdl](Places const& places) {
        for (GrRect const& place : places) {
            auto const corners = CornersOf<SDL_Point>(place, [](double x, double y) {
                return SDL_Point{static_cast<int>(x), static_cast<int>(y)};
            });
            SDL_RenderDrawLines(sdl->renderer.get(), corners.data(), static_cast<int>(corners.size()));
        }
        SDL_RenderFlush(sdl->renderer.get());
    };
}

/// Without smooth edges.
void DrawTriangles(pixman_image* target, std::vector<pixman_triangle_t> const& triangles)
{
    PixmanImage const source(pixman_image_create_solid_fill(&kPixmanColor));
    pixman_composite_triangles(PIXMAN_OP_OVER, source.get(), target, PIXMAN_a1, 0, 0, 0, 0,
        static_cast<int>(triangles.size()), triangles.data());
}

pixman_point_fixed_t PixmanPoint(double x, double y)
{
    return {pixman_double_to_fixed(x), pixman_double_to_fixed(y)};
}

DrawAll PolygonsPixman(Surface const& surface)
{
    std::shared_ptr<pixman_image> const image = surface.NewPixmanImage();
    return [image](Places const& places) {
        std::vector<pixman_triangle_t> triangles;
        for (GrRect const& place : places) {
            auto const corners = CornersOf<pixman_point_fixed_t>(place, PixmanPoint);
            triangles.clear();
            for (std::size_t i = 1; i + 1 < corners.size(); ++i)
                triangles.push_back({corners[0], corners[i], corners[i + 1]});
            DrawTriangles(image.get(), triangles);
        }
    };
}

struct Figure {
    std::string name;
    Places places;
    DrawAll (*ours)(Surface const&);
    std::vector<std::pair<char const*, DrawAll (*)(Surface const&)>> peers;
    bool exact;  ///< the contenders paint the same pixels
};

void AddRow(SharedSurface const& surface, Figure const& figure, std::string const& format)
{
    std::string const name = figure.name + format;
    auto const picture = [&](auto make) {
        std::memset(surface->Row(0), 0, surface->Size());
        make (*surface)(figure.places);
        return std::vector<unsigned char>(surface->Row(0), surface->Row(0) + surface->Size());
    };
    auto const add = [&](char const* contender, auto make) {
        AddContender(name, contender, [surface, places = figure.places, make](benchmark::State& state) {
            DrawAll const draw = make(*surface);
            for (auto _ : state) {
                draw(places);
                benchmark::ClobberMemory();
            }
        });
    };
    add(kOurs, figure.ours);
    auto const ours = picture(figure.ours);
    for (auto const& [contender, make] : figure.peers) {
        add(contender, make);
        if (figure.exact) ExpectSame(picture(make) == ours, name);
    }
}

Places PlacesOf(int width, int height)
{
    Places places;
    RectLoop loop(width, height);
    for (int i = 0; i < kPlaces; ++i)
        places.push_back(loop.Next());
    return places;
}

/// Lines from the upper left ends of the places on, by so much.
Places LinesOf(int dx, int dy)
{
    Places lines = PlacesOf(dx + 1, dy + 1);
    for (auto& [x1, y1, x2, y2] : lines) {
        --x2;
        --y2;
    }
    return lines;
}

Places RandomLines()
{
    RectSource points(11, {0, 0, kScreenWidth, kScreenHeight}, 1);
    Places lines;
    for (int i = 0; i < kPlaces; ++i) {
        GrRect const from = points.Next();
        GrRect const to = points.Next();
        lines.push_back({from.x1, from.y1, to.x1, to.y1});
    }
    return lines;
}

}

void AddRows()
{
    std::vector<std::pair<char const*, DrawAll (*)(Surface const&)>> const sdl{{kSdl, LinesSdl}};
    Figure const lines[] = {
        {"64 lines, horizontal, 300 pixels", LinesOf(299, 0), LinesOurs, sdl, true},
        {"64 lines, vertical, 300 pixels", LinesOf(0, 299), LinesOurs, sdl, true},
        {"64 lines, 45 degrees, 300 pixels", LinesOf(299, 299), LinesOurs, sdl, true},
        {"64 lines, random", RandomLines(), LinesOurs, sdl, false},
    };
    std::vector<Figure> figures(std::begin(lines), std::end(lines));
    for (auto const& [width, height] : {std::pair{40, 30}, {200, 150}}) {
        std::string const size = std::to_string(width) + "x" + std::to_string(height);
        Places const places = PlacesOf(width, height);
        figures.push_back({"64 filled ellipses " + size, places, FilledOurs,
            {{kSdl, PolygonsSdl}, {kPixman, PolygonsPixman}}, false});
        figures.push_back({"64 filled ellipses " + size + ", rows by the caller", places, FilledOurs,
            {{kSdl, FilledSdl}, {kPixman, FilledPixman}}, true});
        figures.push_back(
            {"64 outlined ellipses " + size, places, OutlinedOurs, {{kSdl, PolygonLinesSdl}}, false});
        figures.push_back({"64 outlined ellipses " + size + ", points by the caller", places, OutlinedOurs,
            {{kSdl, OutlinedSdl}, {kPixman, OutlinedPixman}}, true});
    }
    for (auto const& [width, bits] :
        {std::pair{kScreenWidth, 32}, {kScreenWidth + 16, 32}, {kScreenWidth + 16, 16}}) {
        auto const surface = std::make_shared<Surface const>(width, bits);
        for (Figure const& figure : figures)
            AddRow(surface, figure, ", " + std::to_string(bits) + " bits, width " + std::to_string(width));
    }
}
