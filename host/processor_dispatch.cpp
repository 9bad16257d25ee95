#include "host/processor_dispatch.h"

#include "engine/kernel.h"
#include "link/pixel_convert.h"
#include "resample/resample.h"

namespace vt {

void InitProcessorDispatch() {
    InitEngineDispatch();
    InitLinkDispatch();
    InitResampleDispatch();
}

}  // namespace vt
