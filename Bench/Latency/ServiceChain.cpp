#include "Bench/Latency/Chain.h"
#include "Bench/Latency/RunningService.h"
#include "Bench/Rounds.h"

#include <atomic>

namespace ZorvaTouch::Bench {
namespace {

class ServiceChain final : public Chain, private ReportObserver {
public:
    ServiceChain(const Link &link, bool realTime) : _service(link, *this, realTime, handleEvent, this) {}

    void watch(Journey *journey) override { _journey.store(journey); }

private:
    void reportRead() override { _journey.load()->read(wallNs()); }
    void reportHandled() override {}
    static void handleEvent(void *target, void *, void *, const ZorvaEvent *, std::uint32_t) {
        static_cast<ServiceChain *>(target)->_journey.load()->arrived(wallNs());
    }

    std::atomic<Journey *> _journey{nullptr};
    RunningService _service;
};

} // namespace

std::unique_ptr<Chain> makeServiceChain(const Link &link, bool realTime) {
    return std::make_unique<ServiceChain>(link, realTime);
}

} // namespace ZorvaTouch::Bench
