#include "host/processor_dispatch.h"

namespace vt {

void InitProcessorDispatch() {}

}  // namespace vt
