#pragma once

#include <cstddef>
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

/// The archive's file with the catalogue of a language.
constexpr char kMessageFile[] = "tessella.msg";

/// The catalogue in these bytes, which are aligned as their words are; null if they are none with the keys of
/// this library, all its texts within it.
MessageCatalogue const* ReadCatalogue(unsigned char const* bytes, std::size_t size);

/// The text of a key of the catalogue, ended by 0.
unsigned short const* TextOf(MessageCatalogue const& catalogue, unsigned key);
