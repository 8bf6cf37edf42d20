// The boundary's header needs nothing before it, and does not mind to be included again.
#include <zorvatouch/ZorvaPlugIn.h>
// The second time.
#include <zorvatouch/ZorvaPlugIn.h>

#include <type_traits>

// What it declares can be used: the compiler's word is all that is wanted.
static_assert(std::is_trivially_copyable<ZorvaUuid>::value, "passed by value");
static_assert(std::is_standard_layout<PlugInInterfaceTable>::value, "read by C");
static_assert(std::is_standard_layout<HidServiceInterfaceTable>::value, "read by C");
static_assert(sizeof(kZorvaHidServicePlugInType) + sizeof(kZorvaPlugInInterface) +
                      sizeof(kZorvaHidServiceInterface) ==
                  48,
              "16 bytes each");
