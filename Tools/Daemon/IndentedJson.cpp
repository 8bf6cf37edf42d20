#include "Tools/Daemon/IndentedJson.h"

#include <cstddef>

namespace ZorvaTouch::Tools {
namespace {

/// The end of the string that begins at `begin`, behind its closing quote.
std::size_t endOfString(std::string_view json, std::size_t begin) {
    std::size_t end = begin + 1;
    while (end < json.size() && json[end] != '"')
        end += json[end] == '\\' ? 2U : 1U;
    return end + 1;
}

bool isEmptyGroup(std::string_view json, std::size_t at) {
    return at + 1 < json.size() && (json[at + 1] == ']' || json[at + 1] == '}');
}

class Indenter {
public:
    std::string text;

    void put(std::string_view part) { text.append(part); }
    void open(char bracket) {
        text.push_back(bracket);
        ++_level;
        breakLine();
    }
    void close(char bracket) {
        --_level;
        breakLine();
        text.push_back(bracket);
    }
    void breakLine() { text.append("\n").append(2 * _level, ' '); }

private:
    std::size_t _level = 0;
};

} // namespace

std::string indentedJson(std::string_view json) {
    Indenter indenter;
    for (std::size_t at = 0; at < json.size(); ++at) {
        const char c = json[at];
        if (c == '"') {
            const std::size_t end = endOfString(json, at);
            indenter.put(json.substr(at, end - at));
            at = end - 1;
        } else if ((c == '{' || c == '[') && isEmptyGroup(json, at)) {
            indenter.put(json.substr(at++, 2));
        } else if (c == '{' || c == '[') {
            indenter.open(c);
        } else if (c == '}' || c == ']') {
            indenter.close(c);
        } else if (c == ',') {
            indenter.put(",");
            indenter.breakLine();
        } else {
            indenter.put(c == ':' ? ": " : json.substr(at, 1));
        }
    }
    indenter.put("\n");
    return indenter.text;
}

std::string withoutControls(std::string_view json) {
    std::string text;
    for (; !json.empty(); json.remove_prefix(1)) {
        const auto lead = static_cast<unsigned char>(json.front());
        const auto next = static_cast<unsigned char>(json.size() > 1 ? json[1] : ' ');
        if (lead == 0x7F) {
            text.append("\\u007f");
        } else if (lead == 0xC2 && next >= 0x80 && next < 0xA0) {
            text.append(next < 0x90 ? "\\u008" : "\\u009").push_back("0123456789abcdef"[next % 16U]);
            json.remove_prefix(1);
        } else {
            text.push_back(json.front());
        }
    }
    return text;
}

} // namespace ZorvaTouch::Tools
