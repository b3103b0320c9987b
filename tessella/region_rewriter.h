#pragma once

#include <tessella/region_storage.h>

#include <utility>

/// Rewrites a region's list of bands in place, from one band on: reads at `from`, writes at `to`.
///
///     begin        to            to+spares     from          end            capacity
///     | written    | spare slots | (unused)    | unread      | spare slots  |
///
/// The slots between are spare: they own range arrays for reuse. A new band goes into the first of them; a
/// band that is kept exchanges places with it, so the spares queue up behind. When there is none and more
/// must be written than was read, a gap opens: the spare slots at the end of the list change places with the
/// unread bands, and after them come 10 fresh slots at a time. The recorded capacity counts these tens, while
/// the block itself is made large enough for what is likely to follow; only then are there unused slots.
/// Among spares that own nothing, a gap is no wider than is likely to be used: where such a slot lies is no
/// matter until one with storage comes among them.
class BandRewriter {
public:
    using Band = GrRegion::Band;

    /// The bands before slot `index` stay as they are.
    BandRewriter(GrItemArray<Band>& bands, int index)
        : list(bands), begin(bands.items), to(begin + index), from(to), end(begin + bands.item_count),
          capacity(bands.item_capacity), free(std::max(bands.item_capacity - bands.item_count, 0))
    {}
    BandRewriter(BandRewriter const&) = delete;
    BandRewriter& operator=(BandRewriter const&) = delete;

    /// The list ends behind the last band written, on every way out; what was not read becomes spare.
    ~BandRewriter()
    {
        if (from != end) OpenRest();
        if (to + spares != from) MoveSlots(to + spares, from, end - from);
        list.items = begin;
        list.item_count = static_cast<int>(to - begin);
        list.item_capacity = capacity;
    }

    bool AtEnd() const { return from == end; }

    /// The band to be read next. Moves when a slot is opened.
    Band& Next() { return *from; }

    /// Drops the bands written so far; their slots become spare.
    void DropWritten()
    {
        spares += static_cast<int>(to - begin);
        to = begin;
    }

    /// The slot for a new band, to be filled and then committed. `following` says how many more are likely.
    Band& OpenSlot(std::ptrdiff_t following)
    {
        if (spares == 0) OpenGap(following);
        return *to;
    }

    /// Ends the band in the slot at `to`. One with the same ranges as the band above only makes that one
    /// longer, wherever it lies: that is how a vertical hole between equal bands is filled.
    void Commit()
    {
        if (to != begin && SameRanges(*to, to[-1])) {
            to[-1].r2 = to->r2;
            OpenRest();
        } else {
            ++to;
            --spares;
        }
    }

    /// Takes over the next band and commits it.
    void Keep()
    {
        MoveRun(1);
        --to;
        ++spares;
        Commit();
    }

    /// Keeps all bands that are left.
    void KeepRest()
    {
        if (to == begin && from != end) Keep();
        while (from != end) {
            MoveRun(FirstLikeAbove(from, end, to - 1) - from);
            if (from != end) Keep();
        }
    }

private:
    /// The first band with the same ranges as the one above it.
    static Band const* FirstLikeAbove(Band const* band, Band const* end, Band const* above)
    {
        for (; band != end; above = band++)
            if (SameRanges(*band, *above)) break;
        return band;
    }

    /// Room for a few slots while bands move past them as a block.
    class SavedSlots {
    public:
        static constexpr int kMost = 16;
        static constexpr int kFew = 14;  // up to so many bands move faster one by one
        void Save(Band const* slots, int count)
        {
            std::memcpy(bytes, static_cast<void const*>(slots), Size(count));
        }
        /// Puts `count` of the saved slots, from slot `first` on, to `slots`.
        void Restore(Band* slots, int first, int count) const
        {
            std::memcpy(static_cast<void*>(slots), bytes + Size(first), Size(count));
        }

    private:
        static constexpr std::size_t Size(int count)
        {
            return static_cast<std::size_t>(count) * sizeof(Band);
        }
        alignas(Band) unsigned char bytes[kMost * sizeof(Band)];
    };

    /// Moves the next `count` bands down to the written ones. One by one each would take the place of the
    /// first spare slot, which then queues up last; so the spares come out turned by `count` places.
    void MoveRun(std::ptrdiff_t count)
    {
        SavedSlots saved;
        if (spares == 0) {
            if (to != from) MoveSlots(to, from, count);
        } else if (count > SavedSlots::kFew && spares <= SavedSlots::kMost) {
            int const turn = static_cast<int>(count % spares);
            saved.Save(to, spares);
            MoveSlots(to, from, count);
            saved.Restore(to + count, turn, spares - turn);
            saved.Restore(to + count + spares - turn, 0, turn);
        } else {
            for (std::ptrdiff_t i = 0; i < count; ++i) {
                saved.Save(to + i, 1);
                MoveSlots(to + i, from + i, 1);
                saved.Restore(to + i + spares, 0, 1);
            }
        }
        to += count;
        from += count;
    }

    /// Only called when there is no spare slot before the unread bands. The spare slots behind them change
    /// places with them, the last pair first, which turns the spares; or else, when all are in use, 10 new
    /// ones open.
    void OpenGap(std::ptrdiff_t following)
    {
        GR_ASSERT_TEXT(spares == 0, "from==to");
        if (free == 0)
            Grow(end - from, following);
        else if (blank || (free <= SavedSlots::kMost && OwnNothing(end, free)))
            OpenBlank(static_cast<int>(std::min<std::ptrdiff_t>(free, 2 * following)));
        else
            SwapWithSpares();
    }

    /// Moves the unread bands past `count` more spares, all of which own nothing.
    void OpenBlank(int count)
    {
        MoveSlots(from + count, from, end - from);
        ZeroSlots(from, count);
        from += count;
        end += count;
        spares += count;
        free -= count;
        blank = true;
    }

    /// From now on it matters where the spares lie.
    void OpenRest()
    {
        if (blank && free > 0) OpenBlank(free);
    }

    void SwapWithSpares()
    {
        int const unread = static_cast<int>(end - from);
        SavedSlots saved;
        if (unread > SavedSlots::kFew && free <= SavedSlots::kMost) {
            int const turn = unread % free;
            saved.Save(end, free);
            MoveSlots(from + free, from, unread);
            saved.Restore(from + turn, 0, free - turn);
            saved.Restore(from, free - turn, turn);
        } else {
            for (Band* slot = end; slot-- != from;) {
                saved.Save(slot, 1);
                MoveSlots(slot, slot + free, 1);
                saved.Restore(slot + free, 0, 1);
            }
        }
        from += free;
        end += free;
        spares = std::exchange(free, 0);
    }

    static bool OwnNothing(Band const* slots, int count)
    {
        bool nothing = true;
        for (int i = 0; i < count && nothing; ++i)
            nothing = slots[i].items == nullptr;
        return nothing;
    }

    void Grow(std::ptrdiff_t unread, std::ptrdiff_t following)
    {
        int opened = kGrowth;
        if (from - to < kGrowth) {
            std::ptrdiff_t const written = to - begin;
            std::ptrdiff_t const size = written + kGrowth + following + unread;
            // Not zeroed: slots count only once they have been moved to, or zeroed below.
            Band* const larger = new Band[static_cast<std::size_t>(size)];
            if (2 * following < kGrowth) opened = static_cast<int>(2 * following);
            Band* const place = larger + (opened < kGrowth ? written + opened : size - unread);
            MoveSlots(larger, begin, written);
            MoveSlots(place, from, unread);
            DeleteSlots(std::exchange(begin, larger), capacity);
            to = begin + written;
            from = place;
            end = place + unread;
        }
        spares = opened;
        free = kGrowth - opened;
        blank = true;
        ZeroSlots(to, spares);
        ZeroSlots(end, free);
        capacity += kGrowth;
    }

    GrItemArray<Band>& list;
    Band* begin;
    Band* to;
    Band* from;
    Band* end;
    int capacity;
    int free;  // spare slots behind the unread bands
    int spares = 0;
    bool blank = false;  // the slots behind the unread bands own nothing
};
