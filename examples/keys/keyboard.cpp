#include "keyboard.h"

#include <algorithm>
#include <iterator>
#include <map>
#include <string_view>

namespace {

/// Puts keys side by side, from left to right.
class Row {
public:
    Row(std::vector<Key>& keyboard, int left, int top) : keys(keyboard), x(left), y(top) {}
    Row& Gap(int width) { return x += width, *this; }
    Row& Letter(std::uint32_t vk, int width = 4) { return Add(vk, width, 4, true); }
    Row& Letters(std::string_view letters)
    {
        for (char const letter : letters)
            Letter(static_cast<unsigned char>(letter));
        return *this;
    }
    Row& Function(std::uint32_t vk, int width = 4, int height = 4) { return Add(vk, width, height, false); }
    Row& Functions(std::uint32_t first, int count)
    {
        for (int i = 0; i < count; ++i)
            Function(first + static_cast<unsigned>(i));
        return *this;
    }

private:
    Row& Add(std::uint32_t vk, int width, int height, bool isLetter)
    {
        keys.push_back({vk, {x, y, x + width, y + height}, isLetter});
        return Gap(width);
    }

    std::vector<Key>& keys;
    int x, y;
};

}

std::vector<Key> BuildKeyboard()
{
    std::vector<Key> keys;
    Row(keys, 0, 0)
        .Function(GrVkEscape)
        .Gap(4)
        .Functions(GrVkF1, 4)
        .Gap(2)
        .Functions(GrVkF1 + 4, 4)
        .Gap(2)
        .Functions(GrVkF1 + 8, 4);
    Row(keys, 0, 6).Letters("`1234567890-=").Function(GrVkBackspace, 8);
    Row(keys, 0, 10).Function(GrVkTab, 6).Letters("qwertyuiop{}").Letter('\\', 6);
    Row(keys, 0, 14).Function(GrVkCapsLock, 7).Letters("asdfghjkl;'").Function(GrVkReturn, 9);
    Row(keys, 0, 18)
        .Function(GrVkLeftShift, 5)
        .Letter(GrVkLessGreater)
        .Letters("zxcvbnm,")
        .Letter(GrVkPeriod)
        .Letter('/')
        .Function(GrVkRightShift, 11);
    Row(keys, 0, 22)
        .Function(GrVkLeftControl, 5)
        .Function(GrVkLeftLogo, 5)
        .Function(GrVkLeftAlt, 5)
        .Letter(' ', 25)
        .Function(GrVkRightAlt, 5)
        .Function(GrVkRightLogo, 5)
        .Function(GrVkMenu, 5)
        .Function(GrVkRightControl, 5);

    Row(keys, 62, 0).Function(GrVkSystemRequest).Function(GrVkScrollLock).Function(GrVkPause);
    Row(keys, 62, 6).Function(GrVkInsert).Function(GrVkHome).Function(GrVkPageUp);
    Row(keys, 62, 10).Function(GrVkDelete).Function(GrVkEnd).Function(GrVkPageDown);
    Row(keys, 66, 18).Function(GrVkUp);
    Row(keys, 62, 22).Function(GrVkLeft).Function(GrVkDown).Function(GrVkRight);

    Row(keys, 76, 6)
        .Function(GrVkNumLock)
        .Function(GrVkPadDivide)
        .Function(GrVkPadMultiply)
        .Function(GrVkPadSubtract);
    Row(keys, 76, 10).Letter(GrVkPad0 + 7).Letter(GrVkPad0 + 8).Letter(GrVkPad9).Function(GrVkPadAdd, 4, 8);
    Row(keys, 76, 14).Letter(GrVkPad0 + 4).Letter(GrVkPad0 + 5).Letter(GrVkPad0 + 6);
    Row(keys, 76, 18)
        .Letter(GrVkPad0 + 1)
        .Letter(GrVkPad0 + 2)
        .Letter(GrVkPad0 + 3)
        .Function(GrVkPadEnter, 4, 8);
    Row(keys, 76, 22).Letter(GrVkPad0, 8).Letter(GrVkPadDecimal);
    return keys;
}

std::uint32_t KeyOf(std::uint32_t vk)
{
    constexpr std::uint32_t kPad[] = {GrVkPadInsert, GrVkPadEnd, GrVkPadDown, GrVkPadPageDown, GrVkPadLeft,
        GrVkPadCentre, GrVkPadRight, GrVkPadHome, GrVkPadUp, GrVkPadPageUp};
    if (auto const* const found = std::ranges::find(kPad, vk); found != std::end(kPad))
        return GrVkPad0 + static_cast<std::uint32_t>(found - kPad);
    if (vk == GrVkPadDelete) return GrVkPadDecimal;
    return vk == 'M' ? 'm' : vk;
}

std::u16string LabelOf(Key const& key)
{
    static std::map<std::uint32_t, std::u16string_view> const kLabels = {{GrVkEscape, u"Esc"},
        {GrVkBackspace, u"Back"}, {GrVkTab, u"Tab"}, {GrVkCapsLock, u"Caps"}, {GrVkReturn, u"Enter"},
        {GrVkLeftShift, u"Shift"}, {GrVkRightShift, u"Shift"}, {GrVkLeftControl, u"Ctrl"},
        {GrVkRightControl, u"Ctrl"}, {GrVkLeftLogo, u"Logo"}, {GrVkRightLogo, u"Logo"}, {GrVkLeftAlt, u"Alt"},
        {GrVkRightAlt, u"Alt"}, {GrVkMenu, u"Menu"}, {GrVkSystemRequest, u"Print"},
        {GrVkScrollLock, u"Scroll"}, {GrVkPause, u"Break"}, {GrVkInsert, u"Ins"}, {GrVkHome, u"Home"},
        {GrVkPageUp, u"PgUp"}, {GrVkDelete, u"Del"}, {GrVkEnd, u"End"}, {GrVkPageDown, u"PgDn"},
        {GrVkUp, u"Up"}, {GrVkLeft, u"Left"}, {GrVkDown, u"Down"}, {GrVkRight, u"Right"},
        {GrVkNumLock, u"Num"}, {GrVkPadDivide, u"/"}, {GrVkPadMultiply, u"*"}, {GrVkPadSubtract, u"-"},
        {GrVkPadAdd, u"+"}, {GrVkPadEnter, u"Enter"}, {GrVkPadDecimal, u"."}, {GrVkLeftBracket, u"["},
        {GrVkRightBracket, u"]"}, {GrVkPeriod, u"."}, {GrVkLessGreater, u"<"}};
    if (auto const found = kLabels.find(key.vk); found != kLabels.end()) return std::u16string(found->second);
    if (key.vk >= GrVkPad0 && key.vk <= GrVkPad9) return {static_cast<char16_t>(u'0' + key.vk - GrVkPad0)};
    if (key.isLetter) return {static_cast<char16_t>(key.vk)};
    std::string const number = std::to_string(key.vk - GrVkF1 + 1);
    return u"F" + std::u16string(number.begin(), number.end());
}
