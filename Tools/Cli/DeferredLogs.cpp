#include "Tools/Cli/DeferredLogs.h"

#include <mutex>
#include <new>
#include <string>
#include <utility>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

struct Record {
    std::shared_ptr<Ports::Log> log;
    Ports::LogLevel level;
    std::string text;
};

} // namespace

class DeferredLogs::Records {
public:
    void put(Record record) {
        const std::lock_guard lock(_lock);
        _records.push_back(std::move(record));
    }
    [[nodiscard]] bool isEmpty() const {
        const std::lock_guard lock(_lock);
        return _records.empty();
    }
    [[nodiscard]] std::vector<Record> take() {
        const std::lock_guard lock(_lock);
        return std::exchange(_records, {});
    }

private:
    mutable std::mutex _lock;
    std::vector<Record> _records;
};

class DeferredLogs::Handle final : public Ports::Log {
public:
    Handle(std::shared_ptr<Ports::Log> log, std::shared_ptr<Records> records)
        : _log(std::move(log)), _records(std::move(records)) {}

    [[nodiscard]] bool isEnabled(Ports::LogLevel level) const noexcept override {
        return _log->isEnabled(level);
    }
    void write(Ports::LogLevel level, std::string_view text) noexcept override {
        try {
            _records->put({_log, level, std::string(text)});
        } catch (const std::bad_alloc &) { // no memory for the line: there is nobody to tell
        }
    }

private:
    const std::shared_ptr<Ports::Log> _log;
    const std::shared_ptr<Records> _records;
};

DeferredLogs::DeferredLogs(std::unique_ptr<Ports::LogProvider> logs)
    : _logs(std::move(logs)), _records(std::make_shared<Records>()) {}

DeferredLogs::~DeferredLogs() { write(); }

std::shared_ptr<Ports::Log> DeferredLogs::openLog(std::string_view subsystem, std::string_view category) {
    return std::make_shared<Handle>(_logs->openLog(subsystem, category), _records);
}

bool DeferredLogs::hasRecords() const { return !_records->isEmpty(); }

void DeferredLogs::write() {
    for (const Record &record : _records->take())
        record.log->write(record.level, record.text);
}

} // namespace ZorvaTouch::Tools
