/* The boundary's header needs nothing before it. */
#include <zorvatouch/ZorvaPlugIn.h>
/* Nor does it mind to be included again. */
#include <zorvatouch/ZorvaPlugIn.h>

/* What it declares can be used: the compiler's word is all that is wanted. */
size_t zorvaHeaderAlone(void);
size_t zorvaHeaderAlone(void) {
    const ZorvaUuid identifiers[] = {kZorvaHidServicePlugInType, kZorvaPlugInInterface,
                                     kZorvaHidServiceInterface};
    return sizeof identifiers + sizeof(ZorvaPlugInFactory) + sizeof(ZorvaEventCallback);
}
