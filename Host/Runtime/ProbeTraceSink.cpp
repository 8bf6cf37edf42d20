#include "Host/Runtime/ProbeTraceSink.h"

#include <sys/sdt.h>

namespace ZorvaTouch::Host {

void ProbeTraceSink::emit(std::uint32_t code, std::uint64_t argument0, std::uint64_t argument1,
                          std::uint64_t argument2, std::uint64_t argument3) noexcept {
    switch (code) { // which is the first argument of each: to those who collect by number
    case Trace::kInputReport:
        STAP_PROBE5(zorvatouch, input_report, code, argument0, argument1, argument2, argument3);
        break;
    case Trace::kDispatchLand:
        STAP_PROBE2(zorvatouch, dispatch_land, code, argument0);
        break;
    case Trace::kDispatchEvent:
        STAP_PROBE3(zorvatouch, dispatch_event, code, argument0, argument1);
        break;
    case Trace::kFirmwareEvent:
        STAP_PROBE3(zorvatouch, firmware_event, code, argument0, argument1);
        break;
    default:
        break;
    }
}

} // namespace ZorvaTouch::Host
