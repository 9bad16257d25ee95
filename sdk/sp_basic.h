// The host's suite directory: every other suite is acquired and released through SPBasicSuite, which
// also offers plain memory blocks.
#pragma once

#include <cstddef>
#include <cstdint>

#include "sdk/ae_config.h"

extern "C" {

typedef int32_t SPErr;
typedef int32_t SPBoolean;

constexpr SPErr kSPNoError = 0;

constexpr const char* kSPBasicSuite = "SP Basic Suite";
constexpr int32_t kSPBasicSuiteVersion = 4;

struct SPBasicSuite {
    SPErr(SPAPI* AcquireSuite)(const char* name, int32_t version, const void** suite);
    SPErr(SPAPI* ReleaseSuite)(const char* name, int32_t version);
    SPBoolean(SPAPI* IsEqual)(const char* token1, const char* token2);
    SPErr(SPAPI* AllocateBlock)(size_t size, void** block);
    SPErr(SPAPI* FreeBlock)(void* block);
    SPErr(SPAPI* ReallocateBlock)(void* block, size_t newSize, void** newblock);
    SPErr(SPAPI* Undefined)(void);
};
static_assert(sizeof(SPBasicSuite) == 56);
static_assert(offsetof(SPBasicSuite, AcquireSuite) == 0);
static_assert(offsetof(SPBasicSuite, ReleaseSuite) == 8);
static_assert(offsetof(SPBasicSuite, IsEqual) == 16);
static_assert(offsetof(SPBasicSuite, AllocateBlock) == 24);
static_assert(offsetof(SPBasicSuite, FreeBlock) == 32);
static_assert(offsetof(SPBasicSuite, ReallocateBlock) == 40);
static_assert(offsetof(SPBasicSuite, Undefined) == 48);

}  // extern "C"
