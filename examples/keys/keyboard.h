#pragma once

#include <tessella.h>

#include <string>
#include <vector>

struct Key {
    std::uint32_t vk;
    GrRect place;  ///< in quarters of a key's side, from the corner of the keyboard
    bool isLetter;
};

constexpr int kWide = 92, kHigh = 26;  ///< the keyboard, in quarters of a key's side

/// All keys, those of the pad as with num lock on.
std::vector<Key> BuildKeyboard();

/// The code by which the keyboard has a key that has two: those of the pad by num lock, and M by the layout.
std::uint32_t KeyOf(std::uint32_t vk);

/// What stands on the key, on an American keyboard.
std::u16string LabelOf(Key const& key);
