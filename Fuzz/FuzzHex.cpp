#include "Fuzz/Transcript.h"
#include "Shared/Util/Hex.h"

#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

// Targets: Shared/Util/Hex.cpp
//
// Length: 256
//
// Hex text: any text reads without a crash, a blank in front changes nothing, and what was read is written
// and read back the same.

using namespace ZorvaTouch;

namespace {

std::optional<std::vector<std::uint8_t>> read(std::string_view text) {
    try {
        return Util::bytesFromHexString(text);
    } catch (const std::invalid_argument &) {
        return std::nullopt;
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    const std::string text(reinterpret_cast<const char *>(data), size);
    const auto bytes = read(text);
    ZORVA_MUST(bytes == read(" " + text)); // the blank leads past the reader for the canonical form
    if (bytes)
        ZORVA_MUST(bytes == read(Util::hexStringFromBytes(*bytes)));
    ZORVA_MUST(read(Util::hexStringFromBytes({data, size})) == std::vector<std::uint8_t>(data, data + size));
    return 0;
}
