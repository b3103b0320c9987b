#pragma once

#include "pane.h"
#include "words.h"

#include <memory>
#include <string>
#include <vector>

// What the frames hold. Each has a file of its own.

namespace desktop {

/// Pictures to leaf through, with the buttons below or the wheel.
class Viewer : public Pane {
public:
    Viewer(GrWindow& parent, GrRect const& place);

    void Paint(GrContext& context) override;
    void Press(Point at) override;
    void Hover(Point at) override;
    void Leave() override { Light(0); }
    void Wheel(int direction) override { Turn(direction); }
    Pointer PointerAt(Point at) const override;

private:
    GrRect Stage() const { return {0, 0, Width(), Height() - kStripHeight}; }
    /// Of -1, back, and 1, forth.
    GrRect Button(int direction) const;
    int ButtonAt(Point at) const;
    void Light(int direction);
    void Turn(int direction);

    std::vector<std::unique_ptr<GrImage>> pictures;  // made when they are first looked at
    std::size_t current = 0;
    int lit = 0;
};

/// A sheet to draw on.
class Canvas : public Pane {
public:
    Canvas(GrWindow& parent, GrRect const& place);

    void Paint(GrContext& context) override;
    void Press(Point at) override;
    void Drag(Point at) override;
    void Release(Point) override { isDrawing = false; }
    Pointer PointerAt(Point at) const override;

private:
    GrRect Sheet() const { return {0, 0, Width(), Height() - kStripHeight}; }
    GrRect Swatch(int i) const;
    GrRect Size(int i) const;
    GrRect ClearButton() const;
    void DrawTo(Point at);

    std::unique_ptr<GrImage> drawing;
    std::unique_ptr<GrContext> pen;  // over it
    int color = 0, size = 1;
    bool isDrawing = false;
    Point last{};
};

/// A few lines of text to edit.
class Note : public Pane {
public:
    Note(GrWindow& parent, GrRect const& place) : Pane(parent, place) {}

    void SetLayout(std::u16string_view name);
    void Paint(GrContext& context) override;
    void Press(Point at) override;
    void Key(GrEvent const& event) override;
    Pointer PointerAt(Point at) const override;

private:
    int LineHeight() const { return TextHeight(Face::Body) + 4; }
    GrRect Strip() const { return {0, Height() - kStripHeight, Width(), Height()}; }
    std::u16string& Line() { return lines[row]; }
    void Edit(std::uint32_t vk);
    void Insert(char16_t character);
    void SetDeadKeyWaits(bool waits);

    std::vector<std::u16string> lines{1};
    std::size_t row = 0, column = 0;  // where the next character goes
    std::u16string layout;
    bool deadKeyWaits = false;
};

/// All shapes of the pointer; it takes the one that it points at.
class PointerBoard : public Pane {
public:
    PointerBoard(GrWindow& parent, GrRect const& place) : Pane(parent, place) {}

    void Paint(GrContext& context) override;
    void Hover(Point at) override;
    void Leave() override { Light(-1); }
    Pointer PointerAt(Point at) const override;

private:
    static constexpr int kColumns = 3, kRows = 2;
    GrRect Cell(int i) const;
    int CellAt(Point at) const;
    void Light(int i);

    int lit = -1;
};

/// A window that is no rectangle. It lies on the root itself, and is dragged at any place.
class Hexagon : public Pane {
public:
    explicit Hexagon(GrRect const& place);

    void Paint(GrContext& context) override;
    void Press(Point at) override { grip = at; }
    void Drag(Point at) override;
    Pointer PointerAt(Point) const override { return Pointer::Move; }

private:
    std::unique_ptr<GrImage> picture;
    Point grip{};
};

}
