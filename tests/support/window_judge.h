#pragma once

#include <tessella/types.h>

#include <algorithm>
#include <cstdint>
#include <utility>
#include <vector>

/// The judge of windows: a tree over sets of pixels, one flag a pixel. It knows nothing of regions; what is
/// seen of a window is decided for each pixel by itself. Windows go by number; 0 is the root.
class WindowJudge {
public:
    struct Window {
        int parent = -1;
        std::vector<int> children;  ///< topmost first
        GrRect bounds{};
        std::vector<bool> shape;  ///< one flag a pixel of `bounds`
        bool visible = false, invalidated = false, shadowed = false;
        unsigned paints = 0;
    };
    struct Paint {
        int window;
        GrRect rect;  ///< in window coordinates
        std::uint32_t color;
        bool offScreen;
    };

    int const width, height;
    std::vector<Window> windows;
    std::vector<bool> valid;            ///< one a pixel of the screen, row by row
    std::vector<std::uint32_t> screen;  ///< what painting has left, as colours
    bool countPaints = true;            ///< each paint has a colour of its own; else each window

    WindowJudge(int screenWidth, int screenHeight)
        : width(screenWidth), height(screenHeight), windows(1),
          valid(static_cast<std::size_t>(width * height)), screen(valid.size())
    {
        windows[0].bounds = {0, 0, width, height};
        windows[0].shape.assign(valid.size(), true);
        windows[0].visible = true;
    }

    Window& operator[](int i) { return windows[static_cast<std::size_t>(i)]; }

    void Link(int i, int parent)
    {
        (*this)[i].parent = parent;
        auto& siblings = (*this)[parent].children;
        siblings.insert(siblings.begin(), i);
    }
    void Unlink(int i) { std::erase((*this)[(*this)[i].parent].children, i); }
    void Show(int i)
    {
        (*this)[i].visible = true;
        InvalidateAnew(i);
    }
    void Hide(int i)
    {
        FullInvalidate(i, false);
        (*this)[i].visible = (*this)[i].invalidated = false;
    }
    void Move(int i, int dx, int dy)
    {
        FullInvalidate(i, false);
        Shift(i, dx, dy);
        InvalidateAnew(i);
    }
    void Reshape(int i, GrRect const& bounds, std::vector<bool> const& shape)
    {
        FullInvalidate(i, false);
        (*this)[i].bounds = bounds;
        (*this)[i].shape = shape;
        InvalidateAnew(i);
    }
    void SetShadowed(int i, bool shadowed)
    {
        if ((*this)[i].shadowed == shadowed) return;
        if (!shadowed) FullInvalidate(i, false);
        (*this)[i].shadowed = shadowed;
        if (shadowed) InvalidateAnew(i);
    }
    /// To the top, whose gain is to be painted, or to the bottom, whose loss is.
    void Restack(int i, bool toTop)
    {
        auto& siblings = (*this)[(*this)[i].parent].children;
        auto const before = Clip(i, FirstChild(i), toTop);
        Unlink(i);
        siblings.insert(toTop ? siblings.begin() : siblings.end(), i);
        auto const after = Clip(i, FirstChild(i), toTop);
        for (std::size_t p = 0; p < valid.size(); ++p)
            if (toTop ? after[p] && !before[p] : before[p] && !after[p]) valid[p] = false;
    }
    void Invalidate(int i, GrRect const* rect)
    {
        if (IsInvalidated(i)) return;
        GrRect const corner = (*this)[i].bounds;
        for (int p = 0; auto const seen : Clip(i, -1, false)) {
            int const x = p % width - corner.x1, y = p / width - corner.y1;
            if (seen && (!rect || (x >= rect->x1 && x < rect->x2 && y >= rect->y1 && y < rect->y2)))
                valid[static_cast<std::size_t>(p)] = false;
            ++p;
        }
    }
    void FullInvalidate(int i, bool force)
    {
        if (!force && IsInvalidated(i)) return;
        auto const clip = Clip(i, FirstChild(i), (*this)[i].shadowed);
        for (std::size_t p = 0; p < valid.size(); ++p)
            if (clip[p]) valid[p] = false;
        (*this)[i].invalidated = true;
    }

    int At(int x, int y, bool withShadow)
    {
        int best = 0;
        for (bool found = true; found;) {
            found = false;
            for (int const child : (*this)[best].children)
                if (!found && (*this)[child].visible && Covers(child, x, y, withShadow)) {
                    found = true;
                    best = child;
                    break;
                }
        }
        return best;
    }

    /// Chooses the next paint and carries it out, the windows below its shadow first; empty if none is due.
    std::vector<Paint> NextPaint()
    {
        std::vector<Paint> paints;
        Pixels due(valid);
        due.flip();
        if (First(due) < 0) return paints;
        int const owner = Choose(due, true);
        auto const inShadow = [&](int p) { return !Covers(owner, p % width, p / width, false); };
        Pixels shadow(valid.size()), own(valid.size());
        for (std::size_t p = 0; p < due.size(); ++p)
            if (due[p]) valid[p] = (inShadow(static_cast<int>(p)) ? shadow : own)[p] = true;
        auto const [x1, y1, x2, y2] = (*this)[owner].bounds;
        for (GrRect const& strip :
            {GrRect{x2, y1 + 5, x2 + 5, y2}, GrRect{x1 + 5, y2, x2 + 5, y2 + 5}, GrRect{0, 0, width, height}})
            PaintBelow(shadow, strip, paints);
        paints.push_back(PaintOf(owner, own));
        auto const clip = Clip(owner, -1, true);
        auto const& [left, top, right, bottom] = paints.back().rect;
        for (std::size_t p = 0; p < clip.size(); ++p) {
            int const x = static_cast<int>(p) % width - x1, y = static_cast<int>(p) / width - y1;
            if (clip[p] && x >= left && x < right && y >= top && y < bottom) screen[p] = paints.back().color;
        }
        return paints;
    }

    /// The picture that the tree has, each window in its own colour.
    std::vector<std::uint32_t> Picture()
    {
        std::vector<std::uint32_t> picture;
        for (int p = 0; p < width * height; ++p) {
            int const x = p % width, y = p / width, owner = At(x, y, true);
            bool const isShadow = !Covers(owner, x, y, false);
            picture.push_back(isShadow ? Darkened(ColorOf(At(x, y, false))) : ColorOf(owner));
        }
        return picture;
    }

    int FirstChild(int i) { return (*this)[i].children.empty() ? -1 : (*this)[i].children.front(); }

private:
    using Pixels = std::vector<bool>;

    static int First(Pixels const& set)
    {
        auto const first = std::find(set.begin(), set.end(), true);
        return first == set.end() ? -1 : static_cast<int>(first - set.begin());
    }
    std::uint32_t ColorOf(int i)
    {
        unsigned const paints = countPaints ? (*this)[i].paints : 0;
        unsigned const serial = static_cast<unsigned>(i) * 7919 + paints * 31;
        return (serial & 0xFF) * 0x10001 | (serial & 0xFF00);
    }
    static std::uint32_t Darkened(std::uint32_t color)
    {
        std::uint32_t dark = 0;
        for (unsigned shift = 0; shift < 24; shift += 8)
            dark |= ((color >> shift & 0xFF) * 215 >> 8) << shift;
        return dark;
    }

    /// The owner of the first pixel, to whose pixels the set is cut.
    int Choose(Pixels& set, bool withShadow)
    {
        int const first = First(set), owner = At(first % width, first / width, withShadow);
        auto const clip = Clip(owner, -1, withShadow);
        for (std::size_t p = 0; p < set.size(); ++p)
            set[p] = set[p] && clip[p];
        (*this)[owner].invalidated = false;
        for (int i = (*this)[owner].parent; i >= 0; i = (*this)[i].parent)
            ResetInvalidated(i);
        return owner;
    }
    Paint PaintOf(int i, Pixels const& set)
    {
        GrRect rect{width, height, 0, 0};
        for (int p = 0; p < width * height; ++p)
            if (set[static_cast<std::size_t>(p)])
                rect = {std::min(rect.x1, p % width), std::min(rect.y1, p / width),
                    std::max(rect.x2, p % width + 1), std::max(rect.y2, p / width + 1)};
        if (rect.x2 == 0) rect = {};
        GrRect const corner = (*this)[i].bounds;
        ++(*this)[i].paints;
        return {i, {rect.x1 - corner.x1, rect.y1 - corner.y1, rect.x2 - corner.x1, rect.y2 - corner.y1},
            ColorOf(i), false};
    }
    /// A pass: the strip leaves the shadow when the windows below it have been painted and darkened.
    void PaintBelow(Pixels& shadow, GrRect const& strip, std::vector<Paint>& paints)
    {
        Pixels rest(shadow.size());
        for (std::size_t p = 0; p < shadow.size(); ++p) {
            int const x = static_cast<int>(p) % width, y = static_cast<int>(p) / width;
            rest[p] = shadow[p] && x >= strip.x1 && x < strip.x2 && y >= strip.y1 && y < strip.y2;
            if (rest[p]) shadow[p] = false;
        }
        while (First(rest) >= 0) {
            Pixels part(rest);
            paints.push_back(PaintOf(Choose(part, false), part));
            paints.back().offScreen = true;
            for (std::size_t p = 0; p < part.size(); ++p)
                if (part[p]) {
                    screen[p] = Darkened(paints.back().color);
                    rest[p] = false;
                }
        }
    }

    /// What is seen of a window, with those of its children that do not lie above `stop`; -1: with none.
    Pixels Clip(int i, int stop, bool withShadow)
    {
        Pixels seen(valid.size());
        for (int p = 0; p < width * height; ++p)
            seen[static_cast<std::size_t>(p)] = IsSeen(i, stop, p % width, p / width, withShadow);
        return seen;
    }
    bool Covers(int i, int x, int y, bool withShadow)
    {
        auto const& [x1, y1, x2, y2] = (*this)[i].bounds;
        bool const inside = x >= x1 && x < x2 && y >= y1 && y < y2;
        return (inside && (*this)[i].shape[static_cast<std::size_t>((y - y1) * (x2 - x1) + x - x1)]) ||
            (withShadow && (*this)[i].shadowed && Covers(i, x - 5, y - 5, false));
    }
    bool IsSeen(int i, int stop, int x, int y, bool withShadow)
    {
        Window const& window = (*this)[i];
        if (!window.visible || !Covers(i, x, y, withShadow) ||
            (i != 0 && !IsSeen(window.parent, i, x, y, withShadow)))
            return false;
        for (int const child : window.children) {
            if (child == stop) break;
            if ((*this)[child].visible && Covers(child, x, y, withShadow)) return false;
        }
        return true;
    }
    bool IsInvalidated(int i)
    {
        return i >= 0 && ((*this)[i].invalidated || IsInvalidated((*this)[i].parent));
    }
    void InvalidateAnew(int i)
    {
        (*this)[i].invalidated = false;
        FullInvalidate(i, false);
    }
    void ResetInvalidated(int i)
    {
        for (int const child : (*this)[i].children)
            if ((*this)[child].invalidated) ResetInvalidated(child);
        (*this)[i].invalidated = false;
    }
    void Shift(int i, int dx, int dy)
    {
        auto& [x1, y1, x2, y2] = (*this)[i].bounds;
        (x1 += dx, x2 += dx), (y1 += dy, y2 += dy);
        for (int const child : (*this)[i].children)
            Shift(child, dx, dy);
    }
};
