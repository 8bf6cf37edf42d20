#pragma once

#include "Tools/Cli/Environment.h"
#include "Tools/Cli/Layout.h"
#include "Tools/Cli/LivePrinter.h"

#include <cstddef>
#include <string_view>

namespace ZorvaTouch::Tools {

/// Prints a run for a person: a row for each gesture, and on a screen the electrodes below: at their places
/// on the sensor if there are rows for that, else in a line. A screen narrower than the table gets its first
/// columns.
///
/// Whatever else is printed meanwhile must come after `clear`: the lowest lines are drawn again all the time.
class LiveTable final : public LivePrinter {
public:
    /// @param environment  Borrowed. Its output is written to.
    /// @param showsFinger  There is a column for what really happened.
    LiveTable(Environment &environment, bool showsFinger)
        : _environment(environment), _showsFinger(showsFinger) {}
    ~LiveTable() override;
    LiveTable(const LiveTable &) = delete;
    LiveTable &operator=(const LiveTable &) = delete;

    void print(const LiveGesture &gesture) override;
    void printSilence(std::uint64_t timeNs, const std::string &what, bool isMissed) override;
    void refresh(std::uint64_t timeNs, const std::optional<InputReport::Image> &image) override;
    void clear() override;

private:
    /// A row's cells, as text.
    struct Cells {
        std::string_view time, gesture, region, duration, action, finger;
    };

    void beginRow();
    void appendCells(std::string &row, const Cells &cells, Colour gestureColour, bool usesColour) const;
    void eraseElectrodes();
    [[nodiscard]] bool isNarrow() const;

    Environment &_environment;
    const bool _showsFinger;
    bool _hasRows = false;
    std::size_t _visibleLines = 0; ///< of electrodes
};

} // namespace ZorvaTouch::Tools
