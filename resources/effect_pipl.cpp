// Out-of-line view of the property list bytes built in effect_pipl.h.
#include "resources/effect_pipl.h"

namespace vt {

std::span<const uint8_t> EffectPiplBytes() { return kEffectPiplBytes; }

}  // namespace vt
