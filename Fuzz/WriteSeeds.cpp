#include "Shared/FrameList.h"
#include "Shared/RecordingContainer.h"
#include "Tools/Stimulus/StimulusText.h"

#include <cstdint>
#include <cstdio>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <string_view>

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

/// The first report as hex text, and the first few in the form that the report fuzzer splits: length / 3,
/// bytes.
void addReports(const Corpus &corpus, const std::string &name, const FrameList &frames) {
    constexpr std::size_t kFirstReports = 64;
    std::string split;
    std::size_t count = 0;
    for (const FrameView &frame : frames) {
        if (frame.type != FrameType::InputReport || ++count > kFirstReports)
            continue;
        const std::size_t thirds = (frame.data.size() + 2) / 3;
        split.push_back(static_cast<char>(thirds));
        split.append(frame.data.begin(), frame.data.end());
        split.append(3 * thirds - frame.data.size(), '\0');
    }
    corpus.add("reports", name, split);
    corpus.add("state", name, split); // the state fuzzer makes of any bytes what it can
}

void addGoldenCase(const Corpus &corpus, const fs::path &path) {
    const std::string name = path.stem().string();
    const std::string text = readFile(path);
    corpus.add("stimulus", name, text);
    const FrameList frames = Tools::parseStimulus(text).frames;
    const std::string container = writeRecordingContainer(frames);
    corpus.add("container", name, container);
    corpus.add("hex", name, std::string_view(container).substr(0, 400));
    addReports(corpus, name, frames);
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
    corpus.add("hex", "tokens", "1 0x2f FF zz 100 00000000ff");
    return 0;
} catch (const std::exception &error) {
    std::fprintf(stderr, "zorvatouch-fuzz-seeds: %s\n", error.what());
    return 2;
}
