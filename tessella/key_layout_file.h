#pragma once

#include <cstddef>
#include <cstdint>

// The file `keyboard.kbd`: the key layouts of one language. All numbers are little-endian, as in memory.
//
//   GrKeyLayoutFile                        how many layouts there are
//   GrKeyLayoutRecord, one a layout        the first one is active at the start
//   dead keys of the layouts: each a GrDeadKeyRecord and its GrDeadKeyPairs, at the place that the layout's
//   record tells for the first, and one behind the other from there

struct GrKeyLayoutFile {
    std::uint16_t layoutCount;
    std::uint16_t reserved;  ///< 0
};

/// What one key types. All of it 0: the key does nothing.
struct GrKeyRow {
    enum : std::uint16_t {
        kLetter = 1,   ///< key flags: a letter, or one of some other keys; nobody asks
        kPad = 4,      ///< key flags: a key of the numeric pad, which num lock changes
        kAltCaps = 1,  ///< alternate flags: caps lock swaps the two alternates
    };

    std::uint16_t vk;
    std::uint16_t characters[4];  ///< plain, with shift, with caps lock, with caps lock and shift
    std::uint16_t flags;
    /// With right alt, or with control and alt; the same with shift. On a key of the pad: the character, and
    /// the virtual key code, with num lock.
    std::uint16_t alternates[2];
    std::uint16_t alternateFlags;
};

struct GrKeyLayoutRecord {
    static constexpr std::size_t kNameLength = 8;
    static constexpr std::size_t kRowCount = 128;
    static constexpr std::size_t kMostDeadKeys = 127;

    char16_t name[kNameLength];  ///< filled up with zeros
    GrKeyRow rows[kRowCount];    ///< by Linux key code
    std::uint32_t deadKeyCount;
    std::uint32_t deadKeyOffset;  ///< from the start of the file; 0 without dead keys
};

struct GrDeadKeyRecord {
    std::uint32_t size;  ///< of this record and its pairs, in bytes: from here to the next dead key
    std::uint16_t character;
    std::uint16_t filler;  ///< means nothing, whatever it holds
    std::uint32_t pairCount;
};

struct GrDeadKeyPair {
    std::uint16_t character;  ///< typed after the dead key
    std::uint16_t composed;   ///< what both give together
};

static_assert(sizeof(GrKeyLayoutFile) == 4 && sizeof(GrKeyRow) == 18 && sizeof(GrKeyLayoutRecord) == 2328);
static_assert(sizeof(GrDeadKeyRecord) == 12 && sizeof(GrDeadKeyPair) == 4);

/// A file has at least its head and one layout.
constexpr std::size_t kLeastLayoutFile = sizeof(GrKeyLayoutFile) + sizeof(GrKeyLayoutRecord);
static_assert(kLeastLayoutFile == 2332);
