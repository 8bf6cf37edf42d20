#pragma once

#include <cstdint>
#include <map>
#include <string_view>
#include <vector>

namespace ZorvaTouch::KernelTests {

/// How the surface meets requests for its feature reports, by report ID.
class FeatureAnswers {
public:
    enum class Mode { Answer, Refuse, Mute };

    struct Answer {
        Mode mode = Mode::Refuse;
        std::vector<std::uint8_t> report; ///< report ID first
    };

    /// As the simulated device: debug reports of five bytes, the ID and 01 02 03 04; 12 and 3b are refused;
    /// 1f, the factory reset's hold, is 10000. Any other is refused.
    FeatureAnswers();

    /// Reads "ID=answer", "ID=refuse", "ID=mute" or "ID=answer:1f 10 27", the ID in decimal.
    /// @throws std::invalid_argument
    void change(std::string_view text);

    [[nodiscard]] const Answer &of(std::uint8_t reportId) const;

private:
    std::map<std::uint8_t, Answer> _answers;
    Answer _refusal;
};

[[nodiscard]] const char *nameOf(FeatureAnswers::Mode mode) noexcept;

} // namespace ZorvaTouch::KernelTests
