#include "Fuzz/Transcript.h"
#include "Plugin/ValueObject.h"

#include <cstddef>
#include <cstdint>
#include <stdexcept>

// Targets: Plugin/ValueObject.cpp Shared/Util/PropertyValue.cpp
//
// Length: 256
//
// A value of the boundary whose maker answers whatever comes to mind: kinds that change, counts without end,
// parts that are missing, or itself again. Only the lengths of its texts are true. Reading it ends, and what
// was read crosses the boundary once more unchanged; what is too deep or too large is refused.

namespace {

using namespace ZorvaTouch;

/// What the maker says next.
struct Answers {
    const std::uint8_t *data;
    std::size_t size;

    std::uint8_t next() {
        if (size == 0)
            return 0;
        --size;
        return *data++;
    }
};

struct ChaosValue : ZorvaValue {
    Answers *answers;
};

Answers &answersOf(const ZorvaValue *value) { return *static_cast<const ChaosValue *>(value)->answers; }

std::uint64_t anyNumber(Answers &answers) {
    std::uint64_t number = answers.next();
    for (int byte = 0; number >= 0xFF && byte < 7; ++byte)
        number = number << 8 | answers.next();
    return number;
}

const std::uint8_t *anyBytes(Answers &answers, std::size_t *length) {
    const std::size_t wanted = answers.next();
    *length = wanted < answers.size ? wanted : answers.size;
    return wanted == 0 ? nullptr : answers.data;
}

const ZorvaValueTable kChaosTable{
    .size = sizeof(ZorvaValueTable),
    .retain = [](const ZorvaValue *) {},
    .release = [](const ZorvaValue *) {},
    .kind = [](const ZorvaValue *value) { return std::uint32_t{answersOf(value).next()} % 10; },
    .booleanValue = [](const ZorvaValue *value) { return answersOf(value).next(); },
    .unsignedValue = [](const ZorvaValue *value) { return anyNumber(answersOf(value)); },
    .doubleValue = [](const ZorvaValue *value) { return static_cast<double>(anyNumber(answersOf(value))); },
    .stringValue =
        [](const ZorvaValue *value, std::size_t *length) {
            return reinterpret_cast<const char *>(anyBytes(answersOf(value), length));
        },
    .bytesValue = [](const ZorvaValue *value,
                     std::size_t *length) { return anyBytes(answersOf(value), length); },
    .count = [](const ZorvaValue *value) { return static_cast<std::size_t>(anyNumber(answersOf(value))); },
    .element = [](const ZorvaValue *value, std::size_t) -> const ZorvaValue * {
        return answersOf(value).next() < 32 ? nullptr : value;
    },
    .key = [](const ZorvaValue *value, std::size_t, std::size_t *length) -> const char * {
        return reinterpret_cast<const char *>(anyBytes(answersOf(value), length));
    },
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    Answers answers{data, size};
    ChaosValue chaos;
    chaos.table = &kChaosTable;
    chaos.answers = &answers;
    PropertyValue read;
    try {
        read = readValue(&chaos);
    } catch (const std::length_error &) {
        return 0; // beyond the limits of a value: refused as a whole
    }
    ZORVA_MUST(readValue(makeValue(read).get()) == read);
    return 0;
}
