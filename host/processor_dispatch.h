// Chooses the processor-specific paths of the engine, the conversions and the resampler once, at
// global setup, from the features of the processor the module runs on.
#pragma once

namespace vt {

void InitProcessorDispatch();

}  // namespace vt
