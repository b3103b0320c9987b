#pragma once

#include "pane.h"
#include "words.h"

#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace desktop {

/// What can be chosen. The functions are asked anew whenever something depends on them.
struct Item {
    std::function<std::u16string()> label;
    std::function<void()> act;
    std::function<bool()> isOn = [] { return false; };
};

/// A list of items that drops from the bar.
class Menu : public Pane {
public:
    explicit Menu(std::vector<Item> menuItems);

    void Open(int left);
    void Close();
    /// The item at a point lights up; a release there carries it out.
    void Hover(Point at) override { Light(ItemAt(at)); }
    void Leave() override { Light(-1); }
    void Drag(Point at) override { Hover(at); }
    void Release(Point at) override;
    void Paint(GrContext& context) override;
    Pointer PointerAt(Point) const override { return Pointer::Hand; }

private:
    GrRect Row(int i) const;
    int ItemAt(Point at) const;
    void Light(int i);

    std::vector<Item> const items;
    int lit = -1;
};

/// The bar at the top of the screen: menus at the left, the layout of the keys at the right.
class Bar : public Pane {
public:
    Bar();

    /// Menus come one beside the other; the first one's title is bold.
    void Add(std::function<std::u16string()> title, std::vector<Item> items);
    void SetLayout(std::u16string_view name);
    /// Closes the menu that is open.
    void CloseMenu() { Open(-1); }
    bool Owns(Pane const* pane) const;
    /// Titles have other widths.
    void Relabel();

    void Paint(GrContext& context) override;
    void Press(Point at) override;
    void Drag(Point at) override;
    void Release(Point at) override;
    void Hover(Point at) override;
    Pointer PointerAt(Point at) const override { return EntryAt(at) < 0 ? Pointer::Arrow : Pointer::Hand; }

private:
    struct Entry {
        std::function<std::u16string()> title;
        std::unique_ptr<Menu> menu;
        GrRange columns;
    };
    int EntryAt(Point at) const;
    void Open(int entry);
    /// The menu that is open, and a point of the bar in its coordinates; null if it isn't on the menu.
    Menu* MenuAt(Point& at);

    std::vector<Entry> entries;
    int open = -1;
    std::u16string layout;
};

}
