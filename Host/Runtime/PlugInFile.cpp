#include "Host/Runtime/PlugInFile.h"

#include <dlfcn.h>

#include <utility>

namespace ZorvaTouch::Host {
namespace {

/// What the loader says of its last failure on this thread.
std::string loaderText() {
    const char *const text = ::dlerror();
    return text ? text : "the loader gives no reason";
}

/// A name without a slash would be searched for, and an empty one is the program itself.
std::string asPath(const std::string &path) {
    return path.find('/') == std::string::npos ? "./" + path : path;
}

} // namespace

PlugInFile::PlugInFile(const std::string &path)
    : _path(path), _handle(::dlopen(asPath(path).c_str(), RTLD_NOW | RTLD_LOCAL)) {
    if (!_handle)
        throw PlugInFailure("cannot open the plug-in " + path + ": " + loaderText());
}

PlugInFile::~PlugInFile() {
    if (_handle)
        ::dlclose(_handle);
}

PlugInFile::PlugInFile(PlugInFile &&other) noexcept
    : _path(std::move(other._path)), _handle(std::exchange(other._handle, nullptr)) {}

PlugInFile &PlugInFile::operator=(PlugInFile &&other) noexcept {
    PlugInFile taken(std::move(other));
    std::swap(_path, taken._path);
    std::swap(_handle, taken._handle);
    return *this;
}

ZorvaPlugInFactory PlugInFile::factory(const char *name) const {
    void *const found = _handle ? ::dlsym(_handle, name) : nullptr;
    if (!found)
        throw PlugInFailure("the plug-in " + _path + " has no factory " + name + ": " + loaderText());
    return reinterpret_cast<ZorvaPlugInFactory>(found);
}

} // namespace ZorvaTouch::Host
