#include "Shared/FrameList.h"

#include <algorithm>
#include <array>
#include <atomic>
#include <bit>
#include <map>
#include <memory>
#include <memory_resource>
#include <utility>

namespace ZorvaTouch {
namespace {

constexpr std::size_t kFramesPerChunk = 64;
constexpr std::size_t kInlineReportLength = 76; // an image of 73 bytes, and the slot a multiple of 8 bytes
constexpr std::uint16_t kNotInline = 0xFFFF;

using SlotMask = std::uint64_t; ///< a bit for each slot of a chunk
static_assert(kFramesPerChunk == 64, "a mask has a bit for each slot");

constexpr SlotMask maskBelow(std::size_t slot) {
    return slot >= kFramesPerChunk ? ~SlotMask{0} : (SlotMask{1} << slot) - 1;
}

constexpr std::size_t countOf(SlotMask mask) { return static_cast<std::size_t>(std::popcount(mask)); }

const PropertyValue kNoValue;

/// The rule by which a list is trimmed, asked about each frame from the newest to the oldest.
class TrimRule {
public:
    explicit TrimRule(std::uint64_t maxCount) : _left(maxCount) {}

    [[nodiscard]] bool keepsState(std::string_view key) {
        const auto [entry, isNew] = _lastKeptIn.try_emplace(key, _stretch);
        const bool keeps = isNew || entry->second != _stretch;
        entry->second = _stretch;
        return keeps;
    }

    /// Asks about a run of frames that are no state writes; says how many of them, the newest, are kept.
    [[nodiscard]] std::size_t keepsOthers(std::size_t count) {
        const auto kept = static_cast<std::size_t>(std::min<std::uint64_t>(count, _left));
        _left -= kept;
        _stretch +=
            kept != 0; // a kept frame begins a new stretch of state writes, in which each key counts anew
        return kept;
    }

private:
    std::uint64_t _left; ///< frames that may still be kept
    std::uint64_t _stretch = 0;
    std::array<std::byte, 2048> _buffer; ///< enough for the usual handful of keys without touching the heap
    std::pmr::monotonic_buffer_resource _memory{_buffer.data(), _buffer.size()};
    /// Stretch in which each key was last kept. The keys are those of kept frames and live as long.
    std::pmr::map<std::string_view, std::uint64_t> _lastKeptIn{&_memory};
};

} // namespace

/// One frame. Input reports up to the inline length lie in the slot itself; anything else is a shared frame.
struct FrameList::Slot {
    std::uint64_t timestampNs;
    std::uint16_t length; ///< of the report; `kNotInline`: the frame is `others[other]`
    std::uint16_t other;
    std::array<std::uint8_t, kInlineReportLength> bytes;
};

struct FrameList::Chunk {
    Chunk() noexcept {} // leaves the slots as they are: each is written before it is read

    std::atomic<std::uint32_t> owners{1};
    std::size_t count = 0;
    std::size_t stateCount = 0; ///< state writes among them
    std::vector<std::shared_ptr<const Frame>> others;
    std::array<Slot, kFramesPerChunk> slots;

    [[nodiscard]] bool isFull() const noexcept { return count == kFramesPerChunk; }

    void addReport(std::uint64_t timestampNs, std::span<const std::uint8_t> report) noexcept {
        Slot &slot = slots[count++];
        slot.timestampNs = timestampNs;
        slot.length = static_cast<std::uint16_t>(report.size());
        std::copy(report.begin(), report.end(), slot.bytes.begin());
    }

    void addOther(std::shared_ptr<const Frame> frame) {
        others.push_back(std::move(frame)); // throws before anything has changed, or not at all
        stateCount += others.back()->type == FrameType::State;
        Slot &slot = slots[count++];
        slot.timestampNs = others.back()->timestampNs;
        slot.length = kNotInline;
        slot.other = static_cast<std::uint16_t>(others.size() - 1);
    }

    void addCopy(const Chunk &from, std::size_t index) {
        const Slot &slot = from.slots[index];
        if (slot.length == kNotInline)
            addOther(from.others[slot.other]);
        else
            addReport(slot.timestampNs, {slot.bytes.data(), slot.length});
    }

    void addCopies(const Chunk &from, SlotMask which) {
        for (; which != 0; which &= which - 1)
            addCopy(from, static_cast<std::size_t>(std::countr_zero(which)));
    }

    void removeLast() noexcept {
        if (slots[--count].length != kNotInline)
            return;
        stateCount -= others.back()->type == FrameType::State;
        others.pop_back();
    }

    void clear() noexcept {
        count = 0;
        stateCount = 0;
        others.clear();
    }

    /// Which of the frames a trim keeps.
    [[nodiscard]] SlotMask keptBy(TrimRule &rule) const {
        if (stateCount == 0)
            return maskBelow(count) & ~maskBelow(count - rule.keepsOthers(count));
        SlotMask mask = 0;
        for (std::size_t slot = count; slot-- > 0;) {
            const FrameView frame = viewOf(*this, slot);
            const bool kept =
                frame.type == FrameType::State ? rule.keepsState(frame.key) : rule.keepsOthers(1) != 0;
            mask |= SlotMask{kept} << slot;
        }
        return mask;
    }
};
static_assert(sizeof(FrameList) <= 80);

FrameList::ChunkRef::ChunkRef(const ChunkRef &other) noexcept : _chunk(other._chunk) {
    if (_chunk)
        _chunk->owners.fetch_add(1, std::memory_order_relaxed);
}

FrameList::ChunkRef::ChunkRef(ChunkRef &&other) noexcept : _chunk(std::exchange(other._chunk, nullptr)) {}

FrameList::ChunkRef &FrameList::ChunkRef::operator=(ChunkRef other) noexcept {
    std::swap(_chunk, other._chunk);
    return *this;
}

FrameList::ChunkRef::~ChunkRef() {
    if (_chunk && _chunk->owners.fetch_sub(1, std::memory_order_acq_rel) == 1)
        delete _chunk;
}

bool FrameList::ChunkRef::isSole() const noexcept {
    // Acquire pairs with the release in the other owners' destructors: what they read, they have read before
    // we write.
    return _chunk->owners.load(std::memory_order_acquire) == 1;
}

FrameList::FrameList(const FrameList &other) : _entries(other._entries), _size(other._size) {
    if (_entries.empty() || _entries.back().chunk->isFull())
        return;
    // The chunk that is still being filled is not shared.
    const Chunk &open = *other._entries.back().chunk;
    _entries.back().chunk = ChunkRef(new Chunk);
    _entries.back().chunk->addCopies(open, maskBelow(open.count));
}

FrameList &FrameList::operator=(const FrameList &other) {
    if (this != &other)
        *this = FrameList(other);
    return *this;
}

FrameList::FrameList(FrameList &&other) noexcept
    : _entries(std::exchange(other._entries, {})), _scratch(std::exchange(other._scratch, {})),
      _spares(std::exchange(other._spares, {})), _size(std::exchange(other._size, 0)) {}

FrameList &FrameList::operator=(FrameList &&other) noexcept {
    if (this == &other)
        return *this;
    _entries = std::exchange(other._entries, {});
    _scratch = std::exchange(other._scratch, {});
    _spares = std::exchange(other._spares, {});
    _size = std::exchange(other._size, 0);
    return *this;
}

FrameView FrameList::viewOf(const Chunk &chunk, std::size_t slotIndex) noexcept {
    const Slot &slot = chunk.slots[slotIndex];
    if (slot.length != kNotInline)
        return {FrameType::InputReport, slot.timestampNs, {}, kNoValue, {slot.bytes.data(), slot.length}};
    const Frame &frame = *chunk.others[slot.other];
    return {frame.type, frame.timestampNs, frame.key, frame.value, frame.data};
}

FrameView FrameList::operator[](std::size_t index) const noexcept {
    const auto after =
        std::upper_bound(_entries.begin(), _entries.end(), index,
                         [](std::size_t i, const Entry &entry) { return i < entry.firstIndex; });
    const Entry &entry = *std::prev(after);
    return viewOf(*entry.chunk, index - entry.firstIndex);
}

FrameList::Iterator FrameList::begin() const noexcept { return {*this, 0}; }
FrameList::Iterator FrameList::end() const noexcept { return {*this, _entries.size()}; }

FrameView FrameList::Iterator::operator*() const noexcept {
    return viewOf(*_list->_entries[_entry].chunk, _slot);
}

FrameList::Iterator &FrameList::Iterator::operator++() noexcept {
    if (++_slot == _list->_entries[_entry].chunk->count) {
        ++_entry;
        _slot = 0;
    }
    return *this;
}

void FrameList::append(Frame frame) {
    const bool isPlainReport =
        frame.type == FrameType::InputReport && frame.key.empty() && frame.value.isNull();
    if (isPlainReport && frame.data.size() <= kInlineReportLength)
        return appendReport(frame.timestampNs, frame.data);
    auto shared = std::make_shared<const Frame>(std::move(frame));
    appendBy([&shared](Chunk &chunk) { chunk.addOther(std::move(shared)); });
}

void FrameList::appendReport(std::uint64_t timestampNs, std::span<const std::uint8_t> report) {
    if (report.size() > kInlineReportLength)
        return append({FrameType::InputReport, timestampNs, {}, {}, {report.begin(), report.end()}});
    appendBy([timestampNs, report](Chunk &chunk) { chunk.addReport(timestampNs, report); });
}

void FrameList::appendCopy(const Chunk &chunk, std::size_t slot) {
    appendBy([&chunk, slot](Chunk &open) { open.addCopy(chunk, slot); });
}

template <typename Fill> void FrameList::appendBy(const Fill &fill) {
    // A chunk in the middle that a trim has thinned may end up last while a copy still shares it.
    const bool canGrow =
        !_entries.empty() && !_entries.back().chunk->isFull() && _entries.back().chunk.isSole();
    if (canGrow) {
        fill(*_entries.back().chunk);
    } else {
        // The frame is in the chunk before the chunk is in the list: an empty one is never listed.
        ChunkRef fresh = takeChunk();
        fill(*fresh);
        _entries.push_back({std::move(fresh), _size});
    }
    ++_size;
}

void FrameList::undoAppend() noexcept {
    ChunkRef &last = _entries.back().chunk;
    last->removeLast();
    --_size;
    if (last->count == 0) {
        giveBack(std::move(last));
        _entries.pop_back();
    }
}

FrameList::ChunkRef FrameList::takeChunk() {
    if (_spares.empty())
        return ChunkRef(new Chunk);
    ChunkRef chunk = std::move(_spares.back());
    _spares.pop_back();
    return chunk;
}

void FrameList::giveBack(ChunkRef chunk) noexcept {
    if (!chunk.isSole() || _spares.size() == _spares.capacity()) // without room it is freed
        return;
    chunk->clear();
    _spares.push_back(std::move(chunk));
}

void FrameList::trim(std::uint64_t maxCount) {
    // What may run out of memory comes first and works beside the list.
    Entries entries = thinned(maxCount);
    std::size_t kept = 0;
    for (const Entry &entry : entries)
        kept += entry.chunk->count;
    const bool isSparse = entries.size() > 2 * (kept / kFramesPerChunk) + 4;
    if (isSparse) {
        FrameList dense;
        for (auto entry = entries.rbegin(); entry != entries.rend(); ++entry)
            for (std::size_t slot = 0; slot < entry->chunk->count; ++slot)
                dense.appendCopy(*entry->chunk, slot);
        *this = std::move(dense);
    } else {
        _spares.reserve(_entries.size() + _spares.size());
        std::reverse(entries.begin(), entries.end());
        replaceEntries(std::move(entries));
    }
    limitSpares(maxCount);
}

FrameList::Entries FrameList::thinned(std::uint64_t maxCount) {
    Entries entries = std::exchange(_scratch, {});
    entries.reserve(_entries.size());
    TrimRule rule(maxCount);
    for (auto entry = _entries.rbegin(); entry != _entries.rend(); ++entry) {
        const Chunk &chunk = *entry->chunk;
        const SlotMask mask = chunk.keptBy(rule);
        if (countOf(mask) == chunk.count) {
            entries.push_back(*entry);
        } else if (mask != 0) {
            ChunkRef part = takeChunk();
            part->addCopies(chunk, mask);
            entries.push_back({std::move(part), 0});
        }
    }
    return entries;
}

void FrameList::replaceEntries(Entries entries) noexcept {
    _entries.swap(entries);
    _size = 0;
    for (Entry &entry : _entries) {
        entry.firstIndex = _size;
        _size += entry.chunk->count;
    }
    for (Entry &dropped : entries)
        giveBack(std::move(dropped.chunk)); // one that stays has another owner: the list
    entries.clear();
    _scratch = std::move(entries);
}

std::size_t FrameList::countKept(std::uint64_t maxCount, std::size_t first) const {
    // Whether a frame is kept depends on itself and on newer ones.
    TrimRule rule(maxCount);
    std::size_t kept = 0;
    for (auto entry = _entries.rbegin(); entry != _entries.rend(); ++entry) {
        const SlotMask older = first > entry->firstIndex ? maskBelow(first - entry->firstIndex) : 0;
        kept += countOf(entry->chunk->keptBy(rule) & ~older);
    }
    return kept;
}

void FrameList::limitSpares(std::uint64_t maxCount) noexcept {
    // As many as the list needs to grow to twice the bound again, and no more: a division rounds down, the
    // first and the last chunk may be partly filled, and the next trim cuts one into a spare.
    constexpr std::uint64_t kPartlyFilled = 4;
    const std::uint64_t needed = maxCount / (kFramesPerChunk / 2) + kPartlyFilled;
    const std::uint64_t wanted = needed > _entries.size() ? needed - _entries.size() : 0;
    if (_spares.size() > wanted)
        _spares.erase(_spares.begin() + static_cast<std::ptrdiff_t>(wanted), _spares.end());
}

void FrameList::sort() {
    struct Place {
        std::uint64_t timestampNs;
        const Chunk *chunk;
        std::size_t slot;
    };
    const auto isEarlier = [](const Place &left, const Place &right) {
        return left.timestampNs < right.timestampNs;
    };
    std::vector<Place> places;
    places.reserve(_size);
    for (const Entry &entry : _entries)
        for (std::size_t slot = 0; slot < entry.chunk->count; ++slot)
            places.push_back({entry.chunk->slots[slot].timestampNs, entry.chunk.get(), slot});
    if (std::is_sorted(places.begin(), places.end(), isEarlier))
        return;

    std::stable_sort(places.begin(), places.end(), isEarlier);
    FrameList sorted;
    for (const Place &place : places)
        sorted.appendCopy(*place.chunk, place.slot);
    *this = std::move(sorted);
}

} // namespace ZorvaTouch
