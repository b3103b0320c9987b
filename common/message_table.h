#pragma once

#include <cstdint>

/// The front of a catalogue, as files have it and as it is used in place: slots follow, then the texts.
/// Slot i holds the distance from its own position to the text of key i, UTF-16LE ended by 0.
struct MessageCatalogue {
    std::uint32_t size;        ///< of the whole catalogue in bytes
    std::uint32_t entryCount;  ///< the number of slots
};

/// Of every catalogue, whatever its language.
constexpr std::uint32_t kMessageCount = 134;

/// The English catalogue, which is part of the library.
MessageCatalogue const& BuiltInMessages();
