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
        bool visible = false, invalidated = false;
        unsigned paints = 0;
    };
    struct Paint {
        int window;
        GrRect rect;  ///< in window coordinates
        std::uint32_t color;
    };

    int const width, height;
    std::vector<Window> windows;
    std::vector<bool> valid;            ///< one a pixel of the screen, row by row
    std::vector<std::uint32_t> screen;  ///< what painting has left, as colours

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
    /// To the top, whose gain is to be painted, or to the bottom, whose loss is.
    void Restack(int i, bool toTop)
    {
        auto& siblings = (*this)[(*this)[i].parent].children;
        auto const before = Clip(i, FirstChild(i));
        Unlink(i);
        siblings.insert(toTop ? siblings.begin() : siblings.end(), i);
        auto const after = Clip(i, FirstChild(i));
        for (std::size_t p = 0; p < valid.size(); ++p)
            if (toTop ? after[p] && !before[p] : before[p] && !after[p]) valid[p] = false;
    }
    void Invalidate(int i, GrRect const* rect)
    {
        if (IsInvalidated(i)) return;
        GrRect const corner = (*this)[i].bounds;
        for (int p = 0; auto const seen : Clip(i, -1)) {
            int const x = p % width - corner.x1, y = p / width - corner.y1;
            if (seen && (!rect || (x >= rect->x1 && x < rect->x2 && y >= rect->y1 && y < rect->y2)))
                valid[static_cast<std::size_t>(p)] = false;
            ++p;
        }
    }
    void FullInvalidate(int i, bool force)
    {
        if (!force && IsInvalidated(i)) return;
        auto const clip = Clip(i, FirstChild(i));
        for (std::size_t p = 0; p < valid.size(); ++p)
            if (clip[p]) valid[p] = false;
        (*this)[i].invalidated = true;
    }

    int At(int x, int y)
    {
        int best = 0;
        for (bool found = true; found;) {
            found = false;
            for (int const child : (*this)[best].children)
                if (!found && (*this)[child].visible && Covers(child, x, y)) {
                    found = true;
                    best = child;
                    break;
                }
        }
        return best;
    }

    /// Chooses the next paint and carries it out; false if nothing is due.
    bool NextPaint(Paint& paint)
    {
        auto const due = std::find(valid.begin(), valid.end(), false) - valid.begin();
        if (due == width * height) return false;
        int const owner = At(static_cast<int>(due) % width, static_cast<int>(due) / width);
        auto const clip = Clip(owner, -1);
        GrRect rect{width, height, 0, 0};
        for (int p = 0; p < width * height; ++p)
            if (auto const i = static_cast<std::size_t>(p); clip[i] && !valid[i]) {
                valid[i] = true;
                rect = {std::min(rect.x1, p % width), std::min(rect.y1, p / width),
                    std::max(rect.x2, p % width + 1), std::max(rect.y2, p / width + 1)};
            }
        (*this)[owner].invalidated = false;
        for (int i = (*this)[owner].parent; i >= 0; i = (*this)[i].parent)
            ResetInvalidated(i);
        unsigned const serial = static_cast<unsigned>(owner) * 7919 + ++(*this)[owner].paints * 31;
        paint.color = (serial & 0xFF) * 0x10001 | (serial & 0xFF00);
        for (int y = rect.y1; y < rect.y2; ++y)
            for (int x = rect.x1; x < rect.x2; ++x)
                if (auto const i = static_cast<std::size_t>(y * width + x); clip[i]) screen[i] = paint.color;
        GrRect const corner = (*this)[owner].bounds;
        paint.window = owner;
        paint.rect = {rect.x1 - corner.x1, rect.y1 - corner.y1, rect.x2 - corner.x1, rect.y2 - corner.y1};
        return true;
    }

    /// What is seen of a window, with those of its children that do not lie above `stop`; -1: with none.
    std::vector<bool> Clip(int i, int stop)
    {
        std::vector<bool> seen(valid.size());
        for (int p = 0; p < width * height; ++p)
            seen[static_cast<std::size_t>(p)] = IsSeen(i, stop, p % width, p / width);
        return seen;
    }
    int FirstChild(int i) { return (*this)[i].children.empty() ? -1 : (*this)[i].children.front(); }

private:
    bool Covers(int i, int x, int y)
    {
        auto const& [x1, y1, x2, y2] = (*this)[i].bounds;
        return x >= x1 && x < x2 && y >= y1 && y < y2 &&
            (*this)[i].shape[static_cast<std::size_t>((y - y1) * (x2 - x1) + x - x1)];
    }
    bool IsSeen(int i, int stop, int x, int y)
    {
        Window const& window = (*this)[i];
        if (!window.visible || !Covers(i, x, y) || (i != 0 && !IsSeen(window.parent, i, x, y))) return false;
        for (int const child : window.children) {
            if (child == stop) break;
            if ((*this)[child].visible && Covers(child, x, y)) return false;
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
