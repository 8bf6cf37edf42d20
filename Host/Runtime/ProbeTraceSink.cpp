#include "Host/Runtime/ProbeTraceSink.h"

#include <sys/sdt.h>

namespace ZorvaTouch::Host {

void ProbeTraceSink::emit(std::uint32_t code, std::uint64_t argument0, std::uint64_t argument1, std::uint64_t,
                          std::uint64_t) noexcept {
    switch (code) {
    case Trace::kInputReport:
        STAP_PROBE1(zorvatouch, input_report, argument0);
        break;
    case Trace::kDispatchLand:
        STAP_PROBE1(zorvatouch, dispatch_land, argument0);
        break;
    case Trace::kDispatchEvent:
        STAP_PROBE2(zorvatouch, dispatch_event, argument0, argument1);
        break;
    case Trace::kFirmwareEvent:
        STAP_PROBE2(zorvatouch, firmware_event, argument0, argument1);
        break;
    default:
        break;
    }
}

} // namespace ZorvaTouch::Host
