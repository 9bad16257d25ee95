// The lookup rebuild: turns one CorrectionSettings into the engine parameter block and its tables,
// and publishes them for the kernel. A set is built completely in fresh storage and only then
// published, so a render never sees a half-built set and a failed rebuild leaves the previous set
// in force.
#pragma once

#include <cstdint>
#include <memory>

#include "engine/correction_settings.h"
#include "engine/engine_params.h"

namespace vt {

// One complete, immutable build: the parameter block and the storage its table pointers point into.
struct EngineSet {
    EngineParams params;
    std::unique_ptr<float[]> storage;
};

// Builds a new set from settings. Tables whose builder runs out of memory keep the contents they
// have in previous (or a neutral table when there is none). Returns null, after telling the user,
// when the rebuild cannot start for lack of memory.
std::shared_ptr<const EngineSet> BuildEngineSet(const CorrectionSettings& settings, const EngineSet* previous);

// Rebuilds from settings and publishes the result; on failure the published set stays as it was.
// Called by ApplySettings under the module's render serialisation.
void Update(const CorrectionSettings& settings);

// The set the kernel uses now (null before the first Update). A holder keeps the set alive while
// a newer one is published.
std::shared_ptr<const EngineSet> CurrentEngineSet();

// Number of Update calls since the process started (or since the last reset below).
uint64_t LookupRebuildCount();

// Forgets the published set and zeroes the rebuild count; for tests.
void ResetPublishedEngineSet();

}  // namespace vt
