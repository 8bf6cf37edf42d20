#pragma once

#include "Shared/Frame.h"

#include <cstddef>
#include <cstdint>
#include <iterator>
#include <span>
#include <vector>

namespace ZorvaTouch {

/// A recording's frames, oldest first after sorting.
///
/// The frames live in fixed-size chunks. A full chunk never changes again, so copies of a list share its full
/// chunks and copying a long recording costs little more than counting references; dropped chunks that nobody
/// shares are used again, so that a bounded recording stops allocating once it has been full.
/// Docs/Design/FrameStorage.md tells the whole story.
///
/// Threads:  no lock of its own. Different lists may be used on different threads even while they share
/// chunks. Realtime: `appendReport` allocates only when a new chunk is needed and none is left over.
class FrameList {
public:
    class Iterator;

    FrameList() = default;
    FrameList(const FrameList &other);
    FrameList &operator=(const FrameList &other);
    FrameList(FrameList &&other) noexcept;
    FrameList &operator=(FrameList &&other) noexcept;
    ~FrameList() = default;

    [[nodiscard]] std::size_t size() const noexcept { return _size; }
    [[nodiscard]] bool empty() const noexcept { return _size == 0; }

    /// The frame at `index`, less than `size()`. Takes logarithmic time; walk with iterators.
    [[nodiscard]] FrameView operator[](std::size_t index) const noexcept;
    [[nodiscard]] Iterator begin() const noexcept;
    [[nodiscard]] Iterator end() const noexcept;

    /// Adds a frame at the end.
    void append(Frame frame);
    /// Adds an input report at the end. `report` is copied.
    void appendReport(std::uint64_t timestampNs, std::span<const std::uint8_t> report);

    /// Keeps the newest `maxCount` frames that are no state writes, and the state writes that still matter:
    /// between two kept frames the last one of each key, and before the oldest kept frame the newest one of
    /// each key. So a replay of what is left restores every state as it was. State writes do not count
    /// against `maxCount`.
    ///
    /// @param cursor  A position in the list, `size()` for its end.
    /// @return The position of the same frame afterwards, or of the next one that was kept.
    std::size_t trim(std::uint64_t maxCount, std::size_t cursor = 0);

    /// Sorts by time stamp; frames of the same time keep their order.
    /// @return The position of the frame that was at `cursor`.
    std::size_t sort(std::size_t cursor = 0);

private:
    struct Slot;
    struct Chunk;

    /// A counted reference to a chunk.
    class ChunkRef {
    public:
        ChunkRef() noexcept = default;
        explicit ChunkRef(Chunk *chunk) noexcept : _chunk(chunk) {} ///< takes over one reference
        ChunkRef(const ChunkRef &other) noexcept;
        ChunkRef(ChunkRef &&other) noexcept;
        ChunkRef &operator=(ChunkRef other) noexcept;
        ~ChunkRef();

        [[nodiscard]] Chunk *get() const noexcept { return _chunk; }
        [[nodiscard]] Chunk *operator->() const noexcept { return _chunk; }
        [[nodiscard]] Chunk &operator*() const noexcept { return *_chunk; }
        /// Whether nobody else holds the chunk, and whatever others did with it has happened before.
        [[nodiscard]] bool isSole() const noexcept;

    private:
        Chunk *_chunk = nullptr;
    };

    struct Entry {
        ChunkRef chunk;
        std::size_t firstIndex; ///< position of the chunk's first frame in the list
    };

    [[nodiscard]] static FrameView viewOf(const Chunk &chunk, std::size_t slotIndex) noexcept;
    [[nodiscard]] ChunkRef takeChunk();
    void giveBack(ChunkRef chunk);
    /// The chunk that the next frame goes into.
    [[nodiscard]] Chunk &openChunk();
    void appendCopy(const Chunk &chunk, std::size_t slot);
    /// Thins a chunk to the frames with a bit in `mask`; without any, leaves it null until `renumber`.
    void keepOnly(Entry &entry, std::uint64_t mask);
    void renumber() noexcept;
    void defragment();
    void limitSpares(std::uint64_t maxCount) noexcept;

    std::vector<Entry> _entries; ///< only the last one's chunk is still written to, and is never shared
    std::vector<ChunkRef> _spares;
    std::size_t _size = 0;
};

/// Walks a list from oldest to newest. Valid until the list is changed.
class FrameList::Iterator {
public:
    using iterator_category = std::input_iterator_tag;
    using value_type = FrameView;
    using difference_type = std::ptrdiff_t;
    using pointer = void;
    using reference = FrameView;

    Iterator(const FrameList &list, std::size_t entry) noexcept : _list(&list), _entry(entry) {}

    [[nodiscard]] FrameView operator*() const noexcept;
    Iterator &operator++() noexcept;
    friend bool operator==(const Iterator &left, const Iterator &right) noexcept {
        return left._entry == right._entry && left._slot == right._slot;
    }

private:
    const FrameList *_list;
    std::size_t _entry;
    std::size_t _slot = 0;
};

} // namespace ZorvaTouch
