#include "menu.h"

#include <utility>

namespace desktop {

namespace {

constexpr int kRowHeight = 24;
constexpr int kMark = 26;  // columns for the mark of an item that is on
constexpr GrRect kNowhere = {0, 0, 1, 1};

}

Menu::Menu(std::vector<Item> menuItems) : Pane(*GrWindow::RootWindow(), kNowhere), items(std::move(menuItems))
{
    window.SetShadowed(true);
}

void Menu::Open(int left)
{
    int width = 0;
    for (auto const& item : items)
        width = std::max(width, TextWidth(Face::Body, item.label()));
    lit = -1;
    window.SetWindowRegion(
        GrRect{0, 0, width + kMark + 3 * kGap, static_cast<int>(items.size()) * kRowHeight + kGap});
    window.Move(left, kBarHeight);
    window.Raise();
    window.Show();
}

void Menu::Close() { window.Hide(); }

GrRect Menu::Row(int i) const
{
    int const top = kGap / 2 + i * kRowHeight;
    return {kGap / 2, top, Width() - kGap / 2, top + kRowHeight};
}

int Menu::ItemAt(Point at) const
{
    for (int i = 0; i < static_cast<int>(items.size()); ++i)
        if (IsIn(Row(i), at)) return i;
    return -1;
}

void Menu::Light(int i)
{
    if (i == lit) return;
    if (lit >= 0) window.Invalidate(Row(lit));
    lit = i;
    if (lit >= 0) window.Invalidate(Row(lit));
}

void Menu::Release(Point at)
{
    int const chosen = ItemAt(at);
    if (chosen < 0) return;
    Close();
    items[static_cast<std::size_t>(chosen)].act();
}

void Menu::Paint(GrContext& context)
{
    Fill(context, All(), kPaper);
    DrawEdge(context, All(), kLine);
    for (int i = 0; i < static_cast<int>(items.size()); ++i) {
        Item const& item = items[static_cast<std::size_t>(i)];
        GrRect const row = Row(i);
        GrColor const ink = i == lit ? kPaper : kInk;
        if (i == lit) FillRounded(context, row, kSlate);
        if (item.isOn()) {
            context.SetForeColor(i == lit ? kPaper : kBright);
            context.FillArc(row.x1 + 8, row.y1 + kRowHeight / 2 - 4, 7, 7, 0, 23040);
        }
        DrawText(context, Face::Body, row.x1 + kMark, {row.y1, row.y2}, item.label(), ink);
    }
}

Bar::Bar() : Pane(*GrWindow::RootWindow(), {0, 0, GrWindow::RootWindow()->bounds.x2, kBarHeight}) {}

void Bar::Add(std::function<std::u16string()> title, std::vector<Item> items)
{
    entries.push_back({std::move(title), std::make_unique<Menu>(std::move(items)), {}});
    Relabel();
}

void Bar::SetLayout(std::u16string_view name)
{
    layout = name;
    window.Invalidate();
}

bool Bar::Owns(Pane const* pane) const
{
    return pane == this ||
        std::ranges::any_of(entries, [pane](Entry const& entry) { return entry.menu.get() == pane; });
}

void Bar::Relabel()
{
    int left = kGap;
    for (Entry& entry : entries) {
        Face const face = &entry == &entries.front() ? Face::Title : Face::Body;
        entry.columns = {left, left + TextWidth(face, entry.title()) + 3 * kGap};
        left = entry.columns.r2;
    }
    window.Invalidate();
}

void Bar::Paint(GrContext& context)
{
    Fill(context, All(), kInk);
    for (Entry const& entry : entries) {
        bool const isFirst = &entry == &entries.front();
        bool const isOpen = open >= 0 && &entry == &entries[static_cast<std::size_t>(open)];
        GrRect const place = {entry.columns.r1, 3, entry.columns.r2, kBarHeight - 3};
        if (isOpen) FillRounded(context, place, kSlateLight);
        DrawTextCentred(context, isFirst ? Face::Title : Face::Body, place, entry.title(),
            isFirst || isOpen ? kPaper : kLine);
    }
    if (layout.empty()) return;
    int const width = TextWidth(Face::Title, layout) + 12;
    GrRect const badge = {Width() - kGap - width, 6, Width() - kGap, kBarHeight - 6};
    FillRounded(context, badge, kSlateLight);
    DrawTextCentred(context, Face::Title, badge, layout, kPaper);
}

int Bar::EntryAt(Point at) const
{
    for (std::size_t i = 0; i < entries.size(); ++i)
        if (at.x >= entries[i].columns.r1 && at.x < entries[i].columns.r2 && at.y < kBarHeight)
            return static_cast<int>(i);
    return -1;
}

void Bar::Open(int entry)
{
    if (entry == open) return;
    if (open >= 0) entries[static_cast<std::size_t>(open)].menu->Close();
    open = entry;
    if (open >= 0) {
        Entry const& opened = entries[static_cast<std::size_t>(open)];
        opened.menu->Open(opened.columns.r1);
    }
    window.Invalidate();
}

void Bar::Press(Point at)
{
    int const entry = EntryAt(at);
    Open(entry == open ? -1 : entry);
}

void Bar::Hover(Point at)
{
    if (int const entry = EntryAt(at); open >= 0 && entry >= 0) Open(entry);
}

// A menu can be used with one press: the button goes down on the bar, and up on an item.
void Bar::Drag(Point at)
{
    Hover(at);
    if (open < 0) return;
    Point onMenu = at;
    if (Menu* const menu = MenuAt(onMenu))
        menu->Hover(onMenu);
    else
        entries[static_cast<std::size_t>(open)].menu->Leave();
}

void Bar::Release(Point at)
{
    if (Menu* const menu = MenuAt(at)) menu->Release(at);
}

Menu* Bar::MenuAt(Point& at)
{
    if (open < 0) return nullptr;
    Menu& menu = *entries[static_cast<std::size_t>(open)].menu;
    GrRect const& bounds = menu.Window().bounds;
    if (!IsIn(bounds, at)) return nullptr;  // the bar begins where the screen does
    at = {at.x - bounds.x1, at.y - bounds.y1};
    return &menu;
}

}
