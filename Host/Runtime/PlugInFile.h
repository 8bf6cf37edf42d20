#pragma once

#include "Plugin/ZorvaPlugIn.h"

#include <stdexcept>
#include <string>

namespace ZorvaTouch::Host {

/// A plug-in's file that cannot be opened or has no such factory; the text is one line for people.
class PlugInFailure : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// An open plug-in's file. It is closed with this object, so every service made from it must be gone before,
/// and no queue may have work of it left.
class PlugInFile {
public:
    /// Opens a file; its name is a path, the folders where the system looks for libraries are not searched.
    /// @throws PlugInFailure
    explicit PlugInFile(const std::string &path);
    ~PlugInFile();
    PlugInFile(PlugInFile &&other) noexcept;
    PlugInFile &operator=(PlugInFile &&other) noexcept;

    /// @throws PlugInFailure  The file has no such name.
    [[nodiscard]] ZorvaPlugInFactory factory(const char *name) const;

    [[nodiscard]] const std::string &path() const noexcept { return _path; }

private:
    std::string _path;
    void *_handle = nullptr; ///< null when moved from
};

} // namespace ZorvaTouch::Host
