#include "Host/Runtime/AsioRunLoopTable.h"

#include "Host/Runtime/RunLoopSource.h"

#include <exception>
#include <stdexcept>

namespace ZorvaTouch::Host {
namespace {

void require(const char *mode, ZorvaFunction function) {
    if (!mode || !function)
        throw std::invalid_argument("no mode or no function");
}

} // namespace

/// What `adding` returns, or 0 and a line in the log.
template <typename Adding>
std::uint64_t AsioRunLoop::Table::refusing(AsioRunLoop &self, const Adding &adding) noexcept {
    try {
        try {
            return adding();
        } catch (const std::exception &failure) {
            self._log->write(Ports::LogLevel::Error, std::string("refused: ") + failure.what());
        }
    } catch (...) { // no memory for the line
    }
    return 0;
}

std::uint64_t AsioRunLoop::Table::addSource(ZorvaRunLoop *loop, const char *mode, ZorvaFunction perform,
                                            void *context) noexcept {
    return refusing(of(loop), [&] {
        require(mode, perform);
        return of(loop).add(std::make_shared<Source>(mode, perform, context));
    });
}

std::uint64_t AsioRunLoop::Table::addDescriptor(ZorvaRunLoop *loop, const char *mode, int descriptor,
                                                ZorvaFunction perform, void *context) noexcept {
    return refusing(of(loop), [&] {
        require(mode, perform);
        return of(loop).addDescriptor(std::make_shared<Source>(mode, perform, context), descriptor);
    });
}

void AsioRunLoop::Table::signalSource(ZorvaRunLoop *loop, std::uint64_t source) noexcept {
    of(loop).signal(source);
}

void AsioRunLoop::Table::removeSource(ZorvaRunLoop *loop, std::uint64_t source) noexcept {
    of(loop).remove(source);
}

ZorvaBoolean AsioRunLoop::Table::perform(ZorvaRunLoop *loop, const char *mode, ZorvaFunction run,
                                         ZorvaFunction discard, void *context) noexcept {
    Job job(run, discard, context);
    const auto number = refusing(of(loop), [&] {
        require(mode, run);
        of(loop).enqueue(mode, job);
        return std::uint64_t{1};
    });
    if (number == 0)
        job.disown();
    return static_cast<ZorvaBoolean>(number);
}

const ZorvaRunLoopTable AsioRunLoop::Table::kTable{
    .size = sizeof(ZorvaRunLoopTable),
    .retain = AsioRunLoop::retain<ZorvaRunLoop>,
    .release = AsioRunLoop::release<ZorvaRunLoop>,
    .addSource = addSource,
    .addDescriptor = addDescriptor,
    .signalSource = signalSource,
    .removeSource = removeSource,
    .perform = perform,
};

} // namespace ZorvaTouch::Host
