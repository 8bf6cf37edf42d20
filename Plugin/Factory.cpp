#include "Host/Interface/Platform.h"
#include "Plugin/ZorvaPlugIn.h"
#include "Service/ServiceLog.h"
#include "Service/ZorvaTouchHIDService.h"
#include "Shared/LogNames.h"

#include <cstring>
#include <exception>

namespace {

using namespace ZorvaTouch;

void reportFailure(const char *reason) noexcept {
    try {
        ServiceLog(Host::processPlatform().logs().openLog(kLogSubsystem, kLogCategoryService))
            .error("factory failed: {}", reason);
    } catch (...) { // no memory even for a log: the null pointer must do
    }
}

} // namespace

extern "C" __attribute__((visibility("default"))) void *ZorvaTouchHIDServiceFactory(void * /*allocator*/,
                                                                                    ZorvaUuid type) noexcept {
    if (std::memcmp(&type, &kZorvaHidServicePlugInType, sizeof type) != 0)
        return nullptr;
    try {
        // The one reference that it begins with is the host's.
        return (new ZorvaTouchHIDService(Host::processPlatform()))->getPluginInterface();
    } catch (const std::exception &error) {
        reportFailure(error.what());
    } catch (...) {
        reportFailure("unknown exception");
    }
    return nullptr;
}
