#pragma once

#include <tessella/key_layout_file.h>

#include <memory>
#include <optional>
#include <span>
#include <vector>

/// What the keys mean in one country: an entry of the keyboard's list of layouts.
class GrKeyLayout {
public:
    GrKeyLayout* next = nullptr;      ///< in the keyboard's list, which owns it
    GrKeyLayout* previous = nullptr;  ///< the same

    GrKeyLayout() = default;
    GrKeyLayout(GrKeyLayout const&) = delete;
    GrKeyLayout& operator=(GrKeyLayout const&) = delete;
    virtual ~GrKeyLayout() = default;

    /// The layout's name, UTF-16 with a zero behind it; lives as long as the layout.
    virtual char16_t const* GetName() const = 0;

    /// The virtual key code of the Linux key code `scan`, 0 if the key does nothing. `flags` are the
    /// modifiers (`GrModShift` and the others). Unless `ch` is null it receives the character that they make
    /// with the key, 0 for none, and those modifiers that were used up to make it are taken out of `flags`.
    /// Both are left alone for a `scan` above 127.
    virtual unsigned Translate(unsigned scan, unsigned& flags, unsigned short* ch) const = 0;

    /// The virtual key code of the first key that has the character `ch` with whatever modifiers, 0 if none
    /// has. The key code 127 is not looked at.
    virtual unsigned FindVkForChar(unsigned ch) const = 0;

    /// The number of the dead key whose character is `ch`, `kNoDeadKey` if there is none.
    virtual unsigned FindDeadKey(unsigned ch) const = 0;

    /// Replaces `ch` by what the dead key of this number makes of it. False, with `ch` unchanged, if it makes
    /// nothing of it, or if there is no such dead key.
    virtual bool ApplyDeadKey(unsigned index, unsigned& ch) const = 0;

    static constexpr unsigned kNoDeadKey = 0xFFFFFFFF;
};

/// A layout as it stands in a file `keyboard.kbd`: a view that holds no tables of its own.
class GrSmartKeyLayout final : public GrKeyLayout {
public:
    /// The layout of the record at `offset` of `file`, whose bytes must outlive the layout and begin where
    /// `new` may put them. Null if the record or one of its dead keys does not lie within the file, or if
    /// there are more dead keys than `kMostDeadKeys`.
    static std::unique_ptr<GrSmartKeyLayout> Create(std::span<unsigned char const> file, std::size_t offset);

    char16_t const* GetName() const override;
    unsigned Translate(unsigned scan, unsigned& flags, unsigned short* ch) const override;
    unsigned FindVkForChar(unsigned ch) const override;
    unsigned FindDeadKey(unsigned ch) const override;
    bool ApplyDeadKey(unsigned index, unsigned& ch) const override;

private:
    explicit GrSmartKeyLayout(GrKeyLayoutRecord const* record) : table(record) {}
    bool FindDeadKeys(std::span<unsigned char const> file);

    GrKeyLayoutRecord const* table;
    unsigned char const* deadTables[GrKeyLayoutRecord::kMostDeadKeys] = {};  ///< in the order of the file
};

/// The layouts of a file `keyboard.kbd`, in its order; `GrSmartKeyLayout::Create` tells what they demand of
/// the file's bytes. Nothing if the file is too short for a layout, or not whole.
std::optional<std::vector<std::unique_ptr<GrSmartKeyLayout>>> ReadKeyLayouts(
    std::span<unsigned char const> file);
