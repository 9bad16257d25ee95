// Platform switches of the host SDK declarations: how the entry point is exported and which calling
// convention host callbacks use. The only place in sdk/ that looks at the target platform.
#pragma once

// Records are laid out with natural alignment, the host's own default packing (8-byte maximum), so no
// pack pragma is used anywhere in sdk/. Every integer is fixed-width and every pointer is 8 bytes, which
// makes each record identical on Win64 and on Linux x86-64; the static_asserts beside each record hold
// on both.

#ifdef _WIN32
#define DllExport __declspec(dllexport)
#else
#define DllExport __attribute__((visibility("default")))
#endif

// Host callbacks use the platform's plain C convention; x86-64 has only one, so this stays empty.
#define SPAPI
