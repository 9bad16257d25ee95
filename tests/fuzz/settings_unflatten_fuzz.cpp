// Unflatten through the arbitrary-data callback, as a host loading a project calls it, then
// interpolation, print and flatten of what came back. The first byte picks the arbitrary id and
// whether the buffer is stretched to one of the sizes the record had in earlier versions.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "host/arb_data.h"
#include "tests/fuzz/fuzz_support.h"

namespace {

// Host handles as plain heap blocks with their size in front.
struct Block {
    size_t size;
    void* data;
};

PF_Handle NewHandle(A_u_longlong size) {
    auto* block = new Block{static_cast<size_t>(size), std::malloc(size ? size : 1)};
    return reinterpret_cast<PF_Handle>(block);
}
void* LockHandle(PF_Handle h) { return reinterpret_cast<Block*>(h)->data; }
void UnlockHandle(PF_Handle) {}
void DisposeHandle(PF_Handle h) {
    auto* block = reinterpret_cast<Block*>(h);
    std::free(block->data);
    delete block;
}
A_u_longlong HandleSize(PF_Handle h) { return reinterpret_cast<Block*>(h)->size; }

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using namespace vt;
    if (size == 0) return 0;
    static PF_UtilCallbacks utils = [] {
        PF_UtilCallbacks u{};
        u.host_new_handle = NewHandle;
        u.host_lock_handle = LockHandle;
        u.host_unlock_handle = UnlockHandle;
        u.host_dispose_handle = DisposeHandle;
        u.host_get_handle_size = HandleSize;
        return u;
    }();
    PF_InData in{};
    in.utils = &utils;
    (void)EnsurePreferencesLoaded();

    const A_short ids[] = {0, 1, 45, 104, -3};
    const size_t sizes[] = {0, kSettingsV1Size, kSettingsV2Size, kSettingsV3Size, kSettingsSize};
    const uint8_t selector = data[0];
    const A_short id = ids[selector % 5];
    std::vector<uint8_t> flat(data + 1, data + size);
    if (const size_t stretched = sizes[(selector / 5) % 5]; stretched != 0) flat.resize(stretched, 0);

    PF_ArbParamsExtra extra{};
    extra.id = id;
    extra.which_function = PF_Arbitrary_UNFLATTEN_FUNC;
    PF_ArbitraryH value = nullptr;
    extra.u.unflatten_func_params.buf_sizeLu = static_cast<A_u_long>(flat.size());
    extra.u.unflatten_func_params.flat_dataPV = flat.data();
    extra.u.unflatten_func_params.arbPH = &value;
    if (ArbitraryCallback(&in, nullptr, &extra) != PF_Err_NONE || value == nullptr) return 0;

    // Blend the value with a reset record and with itself, print it, flatten it back.
    PF_ArbitraryH reset = NewHandle(kSettingsSize);
    std::memcpy(LockHandle(reset), fuzz::ResetRecord().get(), kSettingsSize);
    for (PF_ArbitraryH other : {reset, value}) {
        PF_ArbitraryH blended = nullptr;
        PF_ArbParamsExtra interp{};
        interp.id = id;
        interp.which_function = PF_Arbitrary_INTERP_FUNC;
        interp.u.interp_func_params.left_arbH = value;
        interp.u.interp_func_params.right_arbH = other;
        interp.u.interp_func_params.tF = 0.375;
        interp.u.interp_func_params.interpPH = &blended;
        if (ArbitraryCallback(&in, nullptr, &interp) == PF_Err_NONE && blended) DisposeHandle(blended);
    }
    std::vector<char> text(kPrintSize);
    PF_ArbParamsExtra print{};
    print.id = id;
    print.which_function = PF_Arbitrary_PRINT_FUNC;
    print.u.print_func_params.arbH = value;
    print.u.print_func_params.print_sizeLu = static_cast<A_u_long>(text.size());
    print.u.print_func_params.print_bufferPC = text.data();
    (void)ArbitraryCallback(&in, nullptr, &print);
    std::vector<uint8_t> back(HandleSize(value) + 16);
    PF_ArbParamsExtra flatten{};
    flatten.id = id;
    flatten.which_function = PF_Arbitrary_FLATTEN_FUNC;
    flatten.u.flatten_func_params.arbH = value;
    flatten.u.flatten_func_params.buf_sizeLu = static_cast<A_u_long>(back.size());
    flatten.u.flatten_func_params.flat_dataPV = back.data();
    (void)ArbitraryCallback(&in, nullptr, &flatten);
    DisposeHandle(reset);
    DisposeHandle(value);
    return 0;
}
