#include "Fuzz/ShortRecording.h"
#include "Shared/FrameList.h"
#include "Shared/InputReport.h"
#include "Shared/RecordingContainer.h"
#include "Tools/Stimulus/StimulusText.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

// Writes the seed corpora from the golden cases and the recordings that the tests use: zorvatouch-fuzz-seeds
// FOLDER

using namespace ZorvaTouch;
namespace fs = std::filesystem;

namespace {

std::string readFile(const fs::path &path) {
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
}

class Corpus {
public:
    explicit Corpus(fs::path folder) : _folder(std::move(folder)) {}

    void add(const char *target, const std::string &name, std::string_view content) const {
        const fs::path folder = _folder / (std::string("fuzz-") + target);
        fs::create_directories(folder);
        std::ofstream file(folder / name, std::ios::binary);
        file.exceptions(std::ios::failbit | std::ios::badbit);
        file.write(content.data(), static_cast<std::streamsize>(content.size()));
    }

private:
    fs::path _folder;
};

/// Which images of a recording a short one needs: those that change a signal, and one in a while. A hold is
/// then a few images instead of sixty, and is a hold all the same, because time is in the images.
class Thinning {
public:
    [[nodiscard]] bool keeps(const FrameView &frame) {
        const auto image = InputReport::Image::parse(frame.data.data(), frame.data.size());
        if (!image)
            return true;
        if (_last && image->signals == _last->signals && image->timeMs - _last->timeMs < kWhileMs)
            return false;
        _last = image;
        return true;
    }

private:
    static constexpr std::uint32_t kWhileMs = 200;

    std::optional<InputReport::Image> _last;
};

/// The thinned recording in pieces of so many frames: an input of the fuzzers is short.
std::vector<FrameList> shortPieces(const FrameList &frames, std::size_t length) {
    std::vector<FrameList> pieces;
    Thinning thinning;
    for (const FrameView &frame : frames) {
        if (!thinning.keeps(frame))
            continue;
        if (pieces.empty() || pieces.back().size() == length)
            pieces.emplace_back();
        pieces.back().append(frame.toFrame());
    }
    return pieces;
}

/// Reports as the report fuzzer splits them: length / 3, bytes.
std::string splitReports(const FrameList &frames) {
    std::string split;
    for (const FrameView &frame : frames) {
        const std::size_t thirds = (frame.data.size() + 2) / 3;
        split.push_back(static_cast<char>(thirds));
        split.append(frame.data.begin(), frame.data.end());
        split.append(3 * thirds - frame.data.size(), '\0');
    }
    return split;
}

template <typename Write>
void addPieces(const Corpus &corpus, const char *target, const std::string &name, const FrameList &frames,
               std::size_t length, const Write &write) {
    std::size_t number = 0;
    for (const FrameList &piece : shortPieces(frames, length))
        corpus.add(target, name + '-' + std::to_string(++number), write(piece));
}

/// The text without comments.
std::string withoutComments(std::string_view text) {
    std::string rest;
    while (!text.empty()) {
        const std::string_view line = text.substr(0, text.find('\n'));
        text.remove_prefix(std::min(line.size() + 1, text.size()));
        if (!line.starts_with('#'))
            rest.append(line.substr(0, line.find('#'))).push_back('\n');
    }
    return rest;
}

void addGoldenCase(const Corpus &corpus, const fs::path &path) {
    const std::string name = path.stem().string();
    const std::string text = withoutComments(readFile(path));
    corpus.add("stimulus", name, text);
    const FrameList frames = Tools::parseStimulus(text).frames;
    addPieces(corpus, "container", name, frames, 6, writeRecordingContainer);
    addPieces(corpus, "reports", name, frames, 12, splitReports);
    addPieces(corpus, "state", name, frames, 16, Fuzzing::shortRecording);
    corpus.add("hex", name, std::string_view(writeRecordingContainer(frames)).substr(0, 200));
}

/// What the system says of an accelerometer, as the scan fuzzer takes texts: each ends with a backslash and
/// another byte. Then the scan; the last eight bytes are the wanted frequency.
void addScan(const Corpus &corpus, const std::string &name, std::string_view type, std::string_view scale) {
    const auto text = [](std::string_view content) { return std::string(content) + "\\/"; };
    std::string input = text("12.5 25 50 100");
    for (const char *const index : {"0", "1", "2"})
        input += text(index) + text(type);
    input += text("3") + text("le:s64/64>>0") + text("4") + text("le:s16/16>>0");
    for (int axis = 0; axis < 3; ++axis)
        input += text("-5") + text(scale);
    for (int byte = 1; byte < 48; ++byte)
        input.push_back(static_cast<char>(5 * byte));
    corpus.add("iioscan", name, input);
}

} // namespace

int main(int argc, char **argv) try {
    if (argc != 2) {
        std::fputs("usage: zorvatouch-fuzz-seeds FOLDER\n", stderr);
        return 2;
    }
    const Corpus corpus{fs::path(argv[1])};
    const fs::path source(ZORVA_SEED_SOURCE_DIR);
    for (const auto &entry : fs::directory_iterator(source / "Golden"))
        if (entry.path().extension() == ".txt")
            addGoldenCase(corpus, entry.path());
    for (const auto &entry : fs::recursive_directory_iterator(source / "Data"))
        if (entry.is_regular_file())
            corpus.add("container", entry.path().filename().string(), readFile(entry.path()));
    addScan(corpus, "twelve-bits", "le:s12/16>>4", "0.009582");
    addScan(corpus, "sixteen-bits", "be:s16/16>>0", "0.000598");
    addScan(corpus, "thirty-two-bits", "le:u24/32>>8", "9.8e-6");
    corpus.add("hex", "tokens", "1 0x2f FF zz 100 00000000ff");
    return 0;
} catch (const std::exception &error) {
    std::fprintf(stderr, "zorvatouch-fuzz-seeds: %s\n", error.what());
    return 2;
}
