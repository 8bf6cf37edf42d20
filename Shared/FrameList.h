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
/// Errors:   std::bad_alloc. A change that runs out of memory leaves the list as it was.
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

    /// Adds a frame at the end, whole: a key or a value of a report is kept, as are bytes of any other kind.
    void append(Frame frame);
    /// Adds an input report at the end. `report` is copied.
    void appendReport(std::uint64_t timestampNs, std::span<const std::uint8_t> report);

    /// Takes back the last call of `append` or `appendReport`. Nothing else may have happened to the list
    /// since, not even a copy: the chunk that the frame is in may be shared then.
    void undoAppend() noexcept;

    /// Keeps the newest `maxCount` frames that are no state writes, and the state writes that still matter:
    /// between two kept frames the last one of each key, and before the oldest kept frame the newest one of
    /// each key. So a replay of what is left restores every state as it was. State writes do not count
    /// against `maxCount`.
    void trim(std::uint64_t maxCount);

    /// How many of the frames from index `first` on `trim(maxCount)` would keep.
    [[nodiscard]] std::size_t countKept(std::uint64_t maxCount, std::size_t first = 0) const;

    /// Sorts by time stamp; frames of the same time keep their order.
    void sort();

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

    using Entries = std::vector<Entry>;

    [[nodiscard]] static FrameView viewOf(const Chunk &chunk, std::size_t slotIndex) noexcept;
    [[nodiscard]] ChunkRef takeChunk();
    void giveBack(ChunkRef chunk) noexcept;
    /// Adds one frame by `fill`, which puts it into a chunk or throws.
    template <typename Fill> void appendBy(const Fill &fill);
    void appendCopy(const Chunk &chunk, std::size_t slot);
    /// The chunks that a trim leaves, newest first and not numbered yet.
    [[nodiscard]] Entries thinned(std::uint64_t maxCount);
    void replaceEntries(Entries entries) noexcept;
    void limitSpares(std::uint64_t maxCount) noexcept;

    Entries _entries; ///< only the last one's chunk is still written to, and is never shared
    Entries _scratch; ///< empty; its capacity saves a trim the allocation
    std::vector<ChunkRef> _spares;
    std::size_t _size = 0;
};

/// Walks a list from oldest to newest; several passes are allowed. Valid until the list is changed.
///
/// A forward iterator for ranges and their algorithms. For those of C++17, which ask a forward iterator for
/// a reference to an element that lives in the container, it is an input iterator: views are made on the way.
class FrameList::Iterator {
public:
    // NOLINTBEGIN(readability-identifier-naming): the standard library's names
    using iterator_concept = std::forward_iterator_tag;
    using iterator_category = std::input_iterator_tag;
    using value_type = FrameView;
    using difference_type = std::ptrdiff_t;
    using reference = FrameView;
    class pointer {
    public:
        explicit pointer(const FrameView &view) noexcept : _view(view) {}
        [[nodiscard]] const FrameView *operator->() const noexcept { return &_view; }

    private:
        FrameView _view;
    };
    // NOLINTEND(readability-identifier-naming)

    Iterator() noexcept = default; ///< of no list: only to be assigned to
    Iterator(const FrameList &list, std::size_t entry) noexcept : _list(&list), _entry(entry) {}

    [[nodiscard]] FrameView operator*() const noexcept;
    [[nodiscard]] pointer operator->() const noexcept { return pointer(**this); }
    Iterator &operator++() noexcept;
    Iterator operator++(int) noexcept {
        const Iterator before = *this;
        ++*this;
        return before;
    }
    friend bool operator==(const Iterator &left, const Iterator &right) noexcept {
        return left._entry == right._entry && left._slot == right._slot;
    }

private:
    const FrameList *_list = nullptr;
    std::size_t _entry = 0;
    std::size_t _slot = 0;
};

static_assert(std::forward_iterator<FrameList::Iterator>);

} // namespace ZorvaTouch
