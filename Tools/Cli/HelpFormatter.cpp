#include "Tools/Cli/HelpFormatter.h"

#include "Tools/Cli/Layout.h"
#include "Tools/Cli/Suggestion.h"

#include <string_view>
#include <utility>
#include <vector>

namespace ZorvaTouch::Tools {
std::string HelpFormatter::make_usage(const CLI::App *app, std::string name) const {
    std::string usage = CLI::Formatter::make_usage(app, std::move(name));
    const std::string badge = "[" + get_label("OPTIONS") + "]";
    std::string required;
    for (const CLI::Option *option : app->get_options([](const CLI::Option *candidate) {
             return candidate->nonpositional() && candidate->get_required();
         }))
        required += " " + option->get_name(false, true) + " " + option->get_type_name();
    if (const std::size_t at = usage.find(badge); at != std::string::npos)
        usage.insert(at + badge.size(), required);
    return usage;
}

std::string HelpFormatter::make_option(const CLI::Option *option, bool isPositional) const {
    std::string description = make_option_desc(option);
    if (option->get_required() && !isPositional)
        description += " (required)";
    std::string name = make_option_name(option, isPositional) + make_option_opts(option);
    name.erase(name.find_last_not_of(' ') + 1); // where the library marks what is required
    return entry(name, description);
}

std::string HelpFormatter::make_subcommand(const CLI::App *command) const {
    return entry(command->get_name(), command->get_description());
}

std::string unknownOption(const std::string &option, const CLI::App &app) {
    const std::string name = option.substr(0, option.find('='));
    std::vector<std::string> names;
    for (const CLI::Option *known : app.get_options())
        for (const std::string &longName : known->get_lnames())
            names.push_back("--" + longName);
    std::string_view file;
    if (!option.starts_with("--"))
        file = "; a file whose name begins with '-' is written as ./-NAME";
    return "unknown option '" + name + "'" +
           suggestion(name, std::vector<std::string_view>(names.begin(), names.end()), file);
}

std::string HelpFormatter::entry(const std::string &name, const std::string &description) const {
    const std::size_t column = get_column_width();
    std::string text = "  " + name;
    if (text.size() + 1 > column)
        text.append("\n").append(column, ' ');
    else
        text.append(column - text.size(), ' ');
    std::string_view rest = description;
    for (std::size_t end = rest.find('\n'); end != std::string_view::npos; end = rest.find('\n')) {
        appendWrapped(text, rest.substr(0, end), column);
        text.append("\n").append(column, ' ');
        rest.remove_prefix(end + 1);
    }
    appendWrapped(text, rest, column);
    return text.append("\n");
}

} // namespace ZorvaTouch::Tools
