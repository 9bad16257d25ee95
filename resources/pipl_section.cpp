// The effect property list inside the module file. On POSIX it sits in a section of its own,
// ".pipl", which a host reads from the file before it loads the code; the Windows build carries
// the same bytes as a PiPL resource instead.
#include "resources/effect_pipl.h"

namespace vt {

__attribute__((used, section(".pipl"))) constexpr auto kPiplSectionBytes = kEffectPiplBytes;

}  // namespace vt
