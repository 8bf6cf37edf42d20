#include "Tests/Unit/Host/Simulated/ManualLoop.h"

#include <algorithm>

namespace ZorvaTouch::Simulated {

struct ManualLoop::Entries {
    static ManualLoop &of(ZorvaRunLoop *loop) { return static_cast<ManualLoop &>(*loop); }

    static void retain(ZorvaRunLoop *loop) { ++of(loop).references; }
    static void release(ZorvaRunLoop *loop) { --of(loop).references; }
    static std::uint64_t addSource(ZorvaRunLoop *loop, const char *mode, ZorvaFunction perform,
                                   void *context) {
        ManualLoop &self = of(loop);
        if (self.isOutOfMemory)
            return 0;
        self._sources[++self._lastNumber] = {mode, perform, context, false};
        return self._lastNumber;
    }
    static std::uint64_t addDescriptor(ZorvaRunLoop *, const char *, int, ZorvaFunction, void *) { return 0; }
    static void signalSource(ZorvaRunLoop *loop, std::uint64_t source) {
        if (const auto found = of(loop)._sources.find(source); found != of(loop)._sources.end())
            found->second.isReady = true;
    }
    static void removeSource(ZorvaRunLoop *loop, std::uint64_t source) { of(loop)._sources.erase(source); }
    static ZorvaBoolean perform(ZorvaRunLoop *, const char *, ZorvaFunction, ZorvaFunction, void *) {
        return 0;
    }
};

const ZorvaRunLoopTable ManualLoop::kTable{
    .size = sizeof(ZorvaRunLoopTable),
    .retain = Entries::retain,
    .release = Entries::release,
    .addSource = Entries::addSource,
    .addDescriptor = Entries::addDescriptor,
    .signalSource = Entries::signalSource,
    .removeSource = Entries::removeSource,
    .perform = Entries::perform,
};

ManualLoop::ManualLoop() : ZorvaRunLoop{&kTable} {}

bool ManualLoop::serveOne(const std::string &mode) {
    const auto found = std::find_if(_sources.begin(), _sources.end(), [&](const auto &entry) {
        return entry.second.isReady && entry.second.mode == mode;
    });
    if (found == _sources.end())
        return false;
    found->second.isReady = false;
    const Source source = found->second; // it may take itself away
    source.perform(source.context);
    return true;
}

std::size_t ManualLoop::sourceCount(const std::string &mode) const {
    return static_cast<std::size_t>(std::count_if(
        _sources.begin(), _sources.end(), [&](const auto &entry) { return entry.second.mode == mode; }));
}

} // namespace ZorvaTouch::Simulated
