#pragma once

#include "Host/Linux/IioText.h"

#include <cstddef>
#include <initializer_list>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace ZorvaTouch::Linux {

/// Something about a sensor that does not work. The text is one line that says what and why.
class IioFailure : public std::runtime_error {
public:
    /// @param number  An errno; 0: the system did as it was asked, and what came of it makes no sense.
    IioFailure(const std::string &text, int number) : std::runtime_error(text), errorNumber(number) {}
    const int errorNumber;
};

/// The attributes of a device, files of one line each in a folder. Names may lead into folders below it.
///
/// Threads: any. What it throws beside IioFailure is std::bad_alloc.
class IioSysfs {
public:
    /// Longer texts are refused.
    static constexpr std::size_t kLongestText = 4096;

    /// @param folder  Without a slash at the end.
    explicit IioSysfs(std::string folder) : _folder(std::move(folder)) {}

    [[nodiscard]] const std::string &folder() const noexcept { return _folder; }
    [[nodiscard]] bool has(std::string_view name) const;
    /// The first of these names that there is.
    [[nodiscard]] std::optional<std::string> firstOf(std::initializer_list<std::string> names) const;

    /// The text, without blanks and line ends around it.
    [[nodiscard]] std::string text(std::string_view name) const;
    [[nodiscard]] double number(std::string_view name) const;
    [[nodiscard]] unsigned count(std::string_view name) const;
    [[nodiscard]] ScanType scanType(std::string_view name) const;

    /// The names in a folder below that begin and end like this, sorted, without either. Empty if there is no
    /// such folder.
    [[nodiscard]] std::vector<std::string> names(std::string_view below, std::string_view begin,
                                                 std::string_view end) const;

    void set(std::string_view name, std::string_view text) const;
    /// Leaves an attribute alone that has that text already, or is not there. @return Whether it has it now.
    bool trySet(std::string_view name, std::string_view wanted) const;

private:
    [[nodiscard]] std::string pathOf(std::string_view name) const;

    const std::string _folder;
};

} // namespace ZorvaTouch::Linux
