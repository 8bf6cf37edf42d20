#include "Host/Linux/IioSysfs.h"

#include "Host/Linux/SystemFailure.h"
#include "Host/Linux/UniqueFd.h"
#include "Shared/Util/Text.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <filesystem>
#include <system_error>

namespace ZorvaTouch::Linux {
namespace {

constexpr std::string_view kBlanks{" \t\r\n\0", 5};
constexpr std::size_t kLongestQuote = 40;

[[noreturn]] void fail(const char *operation, const std::string &path, int errorNumber) {
    const std::string what = std::string(operation) + ' ' + path;
    throw IioFailure(describe({what.c_str(), errorNumber}), errorNumber);
}

UniqueFd open(const std::string &path, int flags, const char *operation) {
    UniqueFd file(::open(path.c_str(), flags | O_CLOEXEC));
    if (!file)
        fail(operation, path, errno);
    return file;
}

std::string trimmed(std::string_view text) {
    const std::size_t begin = text.find_first_not_of(kBlanks);
    if (begin == std::string_view::npos)
        return {};
    return std::string(text.substr(begin, text.find_last_not_of(kBlanks) + 1 - begin));
}

/// A text as part of a line.
std::string quoted(std::string_view text) {
    return '"' + Util::printable(text.substr(0, kLongestQuote)) +
           (text.size() > kLongestQuote ? "...\"" : "\"");
}

/// What was read of a text, or word of a text that is none.
template <typename Value>
Value require(const std::optional<Value> &value, const char *kind, const std::string &path,
              std::string_view text) {
    if (!value)
        throw IioFailure(path + " is no " + kind + ": " + quoted(text), 0);
    return *value;
}

} // namespace

std::string IioSysfs::pathOf(std::string_view name) const { return _folder + '/' + std::string(name); }

bool IioSysfs::has(std::string_view name) const { return ::access(pathOf(name).c_str(), F_OK) == 0; }

std::optional<std::string> IioSysfs::firstOf(std::initializer_list<std::string> names) const {
    const auto *const found =
        std::find_if(names.begin(), names.end(), [this](const std::string &name) { return has(name); });
    return found == names.end() ? std::nullopt : std::optional(*found);
}

std::string IioSysfs::text(std::string_view name) const {
    const std::string path = pathOf(name);
    const UniqueFd file = open(path, O_RDONLY, "read");
    std::array<char, kLongestText + 1> buffer;
    std::size_t size = 0;
    while (size < buffer.size()) {
        const ssize_t count = ::read(file.get(), buffer.data() + size, buffer.size() - size);
        if (count == 0)
            return trimmed({buffer.data(), size});
        if (count < 0 && errno != EINTR)
            fail("read", path, errno);
        size += count < 0 ? 0 : static_cast<std::size_t>(count);
    }
    fail("read", path, EMSGSIZE);
}

double IioSysfs::number(std::string_view name) const {
    const std::string read = text(name);
    return require(parseIioNumber(read), "number", pathOf(name), read);
}

unsigned IioSysfs::count(std::string_view name) const {
    const std::string read = text(name);
    return require(parseIioCount(read), "count", pathOf(name), read);
}

ScanType IioSysfs::scanType(std::string_view name) const {
    const std::string read = text(name);
    return require(parseScanType(read), "format of a scan's value", pathOf(name), read);
}

std::vector<std::string> IioSysfs::names(std::string_view below, std::string_view begin,
                                         std::string_view end) const {
    std::vector<std::string> names;
    std::error_code isMissing;
    std::filesystem::directory_iterator entry(pathOf(below), isMissing);
    for (; !isMissing && entry != std::filesystem::directory_iterator(); entry.increment(isMissing)) {
        const std::string name = entry->path().filename().string();
        if (name.size() >= begin.size() + end.size() && name.starts_with(begin) && name.ends_with(end))
            names.push_back(name.substr(begin.size(), name.size() - begin.size() - end.size()));
    }
    std::ranges::sort(names);
    return names;
}

void IioSysfs::set(std::string_view name, std::string_view text) const {
    const std::string path = pathOf(name);
    const UniqueFd file = open(path, O_WRONLY | O_TRUNC, "write");
    ssize_t count = 0;
    do
        count = ::write(file.get(), text.data(), text.size());
    while (count < 0 && errno == EINTR);
    if (count < 0)
        fail("write", path, errno);
}

bool IioSysfs::trySet(std::string_view name, std::string_view wanted) const {
    try {
        if (text(name) != wanted)
            set(name, wanted);
        return text(name) == wanted;
    } catch (const IioFailure &) {
        return false;
    }
}

} // namespace ZorvaTouch::Linux
