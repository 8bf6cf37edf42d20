#pragma once

#include <CLI/CLI.hpp>

#include <cstddef>
#include <string>

namespace ZorvaTouch::Tools {

/// Lays out the help of both programs: descriptions are wrapped at `kTextColumns`, options that are required
/// are marked and stand in the usage line.
class HelpFormatter final : public CLI::Formatter {
public:
    /// @param column  Where descriptions begin, from 0.
    explicit HelpFormatter(std::size_t column) { column_width(column); }

    [[nodiscard]] std::string make_usage(const CLI::App *app, std::string name) const override;
    [[nodiscard]] std::string make_option(const CLI::Option *option, bool isPositional) const override;
    [[nodiscard]] std::string make_subcommand(const CLI::App *command) const override;

private:
    /// A name and its description.
    [[nodiscard]] std::string entry(const std::string &name, const std::string &description) const;
};

/// The message about an option that the program or the command does not have.
/// @param option  As it was typed, "--tremour" or "--tremour=3".
[[nodiscard]] std::string unknownOption(const std::string &option, const CLI::App &app);

} // namespace ZorvaTouch::Tools
