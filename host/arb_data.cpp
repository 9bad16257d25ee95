// Answers to the host's arbitrary-data callbacks for the "Parameters" value (a whole settings
// record) and its placeholder siblings, with keyframe blending, the text form and the import of
// earlier record versions. Values are host handles; nothing here reads past a handle's size, and
// the smaller values are held rather than treated as records.
#include "host/arb_data.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <cstring>
#include <string_view>

#include "files/preferences.h"

namespace vt {

namespace {

static_assert(kSettingsWords == 8389);

// ---------------------------------------------------------------------------------------------
// Keyframe blending. Each group is a run of entries (a range or a levels group); within an entry
// a run of floats is blended, and the entry's own enable and its section enables are switched on
// when any of them differs.

struct BlendGroup {
    size_t first;        // offset of the first entry
    size_t stride;       // bytes from one entry to the next
    int entries;
    size_t floatsAt;     // offset of the first float within the entry
    int floats;
    size_t enableAt;     // offset of the entry's enable within the entry
    size_t sections[2];  // section enables; 0 for none (word 0 is the magic, never an enable)
};

// In the order they are processed.
constexpr BlendGroup kBlendGroups[] = {
    {12, 40, 4, 4, 9, 0, {4, 8}},     // tonal ranges
    {176, 52, 4, 4, 12, 0, {172, 0}}, // RGB set
    {600, 52, 4, 4, 12, 0, {596, 0}}, // third channel set
    {388, 52, 4, 4, 12, 0, {384, 0}}, // second channel set
    {868, 32, 5, 8, 6, 4, {864, 0}},  // levels groups (the word before each group starts the entry)
};
static_assert(offsetof(CorrectionSettings, tonal) == 12 && sizeof(TonalRange) == 40);
static_assert(offsetof(CorrectionSettings, rgbSet.range) == 176 && offsetof(CorrectionSettings, rgbSet.enable) == 172);
static_assert(offsetof(CorrectionSettings, thirdSet.range) == 600 && offsetof(CorrectionSettings, thirdSet.enable) == 596);
static_assert(offsetof(CorrectionSettings, secondSet.range) == 388 && offsetof(CorrectionSettings, secondSet.enable) == 384);
static_assert(offsetof(CorrectionSettings, levelsWord) == 868 && offsetof(CorrectionSettings, levelsEnable) == 864);

float LoadFloat(const uint8_t* p) {
    float value;
    std::memcpy(&value, p, 4);
    return value;
}

void StoreWord(uint8_t* p, uint32_t value) { std::memcpy(p, &value, 4); }

uint32_t LoadWord(const uint8_t* p) {
    uint32_t value;
    std::memcpy(&value, p, 4);
    return value;
}

// ---------------------------------------------------------------------------------------------
// The text form.

bool IsBlank(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\v' || c == '\f' || c == '\r'; }

std::string_view Trim(std::string_view field) {
    while (!field.empty() && IsBlank(field.front())) field.remove_prefix(1);
    while (!field.empty() && IsBlank(field.back())) field.remove_suffix(1);
    return field;
}

// The whole field must be the number: a decimal count, or a 32-bit word in hexadecimal (an "0x"
// in front allowed). Anything else, or a value wider than 32 bits, is malformed.
bool ParseDecimal(std::string_view field, uint64_t* value) {
    field = Trim(field);
    const auto [end, error] = std::from_chars(field.data(), field.data() + field.size(), *value, 10);
    return error == std::errc() && end == field.data() + field.size() && !field.empty();
}

bool ParseHexWord(std::string_view field, uint32_t* value) {
    field = Trim(field);
    if (field.size() > 2 && field[0] == '0' && (field[1] == 'x' || field[1] == 'X')) field.remove_prefix(2);
    uint64_t wide = 0;
    const auto [end, error] = std::from_chars(field.data(), field.data() + field.size(), wide, 16);
    if (error != std::errc() || end != field.data() + field.size() || field.empty() || wide > UINT32_MAX) {
        return false;
    }
    *value = static_cast<uint32_t>(wide);
    return true;
}

// The fields of a text, each ending at a tab; never beyond the text's end.
class FieldReader {
public:
    FieldReader(const char* text, size_t length) : m_text(text), m_length(length) {}
    // False when no tab ends the next field within the text, or the field is longer than allowed.
    bool Next(std::string_view* field) {
        const void* tab = std::memchr(m_text + m_position, '\t', m_length - m_position);
        if (tab == nullptr) return false;
        const size_t size = static_cast<size_t>(static_cast<const char*>(tab) - (m_text + m_position));
        if (size > kScanFieldMax) return false;
        *field = std::string_view(m_text + m_position, size);
        m_position += size + 1;
        return true;
    }

private:
    const char* m_text;
    size_t m_length;
    size_t m_position = 0;
};

// ---------------------------------------------------------------------------------------------
// Earlier record versions. Each step is a list of moves from the older record to the newer one.
// Run forwards, a step converts; run backwards over a newer default record, it gives the older
// version's defaults (the record that converts to them), which the next older step starts from.

enum class MoveKind : uint8_t {
    kCopy,    // the word as it is
    kFixed,   // signed 16.16 fixed point to float
    kFlag,    // any non-zero word to 1
    kOrFlag,  // OR (word != 0) into the newer word
    kZero,    // the newer word becomes 0
};

class Mover {
public:
    // Forward: older -> newer. Backward: newer -> older (older is then written).
    Mover(uint8_t* newer, size_t newerSize, uint8_t* older, size_t olderSize, bool backward)
        : m_newer(newer), m_newerSize(newerSize), m_older(older), m_olderSize(olderSize), m_backward(backward) {}

    void Copy(size_t to, size_t from, size_t words = 1) { Run(MoveKind::kCopy, to, from, words); }
    void Fixed(size_t to, size_t from, size_t words = 1) { Run(MoveKind::kFixed, to, from, words); }
    void Flag(size_t to, size_t from) { Run(MoveKind::kFlag, to, from, 1); }
    void OrFlag(size_t to, size_t from) { Run(MoveKind::kOrFlag, to, from, 1); }
    void Zero(size_t to) { Run(MoveKind::kZero, to, 0, 1); }

private:
    void Run(MoveKind kind, size_t to, size_t from, size_t words) {
        for (size_t i = 0; i < words; ++i) Word(kind, to + 4 * i, from + 4 * i);
    }

    void Word(MoveKind kind, size_t to, size_t from) {
        if (to + 4 > m_newerSize || from + 4 > m_olderSize) return;  // the tables stay within both records
        uint8_t* newer = m_newer + to;
        uint8_t* older = m_older + from;
        if (!m_backward) {
            const uint32_t word = LoadWord(older);
            switch (kind) {
                case MoveKind::kCopy: StoreWord(newer, word); break;
                case MoveKind::kFixed: {
                    const float value =
                        static_cast<float>(static_cast<double>(static_cast<int32_t>(word)) / 65536.0);
                    std::memcpy(newer, &value, 4);
                    break;
                }
                case MoveKind::kFlag: StoreWord(newer, word != 0 ? 1u : 0u); break;
                case MoveKind::kOrFlag: StoreWord(newer, LoadWord(newer) | (word != 0 ? 1u : 0u)); break;
                case MoveKind::kZero: StoreWord(newer, 0); break;
            }
            return;
        }
        switch (kind) {
            case MoveKind::kCopy:
            case MoveKind::kFlag: StoreWord(older, LoadWord(newer)); break;
            case MoveKind::kFixed: StoreWord(older, static_cast<uint32_t>(ToFixed(LoadFloat(newer)))); break;
            case MoveKind::kOrFlag:
            case MoveKind::kZero: break;
        }
    }

    static int32_t ToFixed(float value) {
        const double scaled = std::round(static_cast<double>(value) * 65536.0);
        if (!(scaled == scaled)) return 0;
        return static_cast<int32_t>(std::clamp(scaled, -2147483648.0, 2147483647.0));
    }

    uint8_t* m_newer;
    size_t m_newerSize;
    uint8_t* m_older;
    size_t m_olderSize;
    bool m_backward;
};

// Version 3 (18,404 bytes) to the current record.
void MovesFromV3(Mover& m) {
    m.Copy(4, 4);
    m.Copy(8, 8);
    for (int r = 0; r < kRangeCount; ++r) {
        // Old tonal range: enable, hue, saturation, then brightness ... pedestal; no vibrance.
        const size_t to = 12 + 40 * r;
        const size_t from = 12 + 36 * r;
        m.Copy(to, from);
        m.Fixed(to + 4, from + 4, 2);
        m.Fixed(to + 16, from + 12, 6);
    }
    m.Copy(172, 156);
    for (int r = 0; r < kRangeCount; ++r) {
        m.Copy(176 + 52 * r, 160 + 52 * r);
        m.Fixed(180 + 52 * r, 164 + 52 * r, 12);
    }
    m.Copy(384, 368);
    for (int r = 0; r < kRangeCount; ++r) {
        m.Copy(388 + 52 * r, 372 + 52 * r);
        m.Fixed(392 + 52 * r, 376 + 52 * r, 12);
    }
    m.Copy(596, 580);
    for (int r = 0; r < kRangeCount; ++r) {
        m.Copy(600 + 52 * r, 584 + 52 * r);
        m.Fixed(604 + 52 * r, 588 + 52 * r, 12);
    }
    m.Copy(808, 792);
    // Old hue wheels: the flag, then per wheel its word, angle and amount.
    m.Copy(812, 796);
    for (int w = 0; w < kHueWheelCount; ++w) {
        m.Copy(816 + 12 * w, 800 + 12 * w);
        m.Fixed(820 + 12 * w, 804 + 12 * w, 2);
    }
    m.Copy(864, 848);
    // Old levels groups: the word before the group and its enable, then its six levels.
    for (int g = 0; g < 5; ++g) {
        m.Copy(868 + 32 * g, 852 + 32 * g, 2);
        m.Fixed(876 + 32 * g, 860 + 32 * g, 6);
    }
    m.Copy(29860, 1012);
    // Old 30-word secondaries: as the preset file's tag 26.
    for (int k = 0; k < kSecondaryCount; ++k) {
        const size_t to = 29868 + 124 * k;
        const size_t from = 17516 + 120 * k;
        m.Copy(to, from);
        m.Fixed(to + 4, from + 4, 3);
        m.Flag(to + 16, from + 16);
        m.Copy(to + 24, from + 20);
        m.Fixed(to + 28, from + 24, 2);
        m.Copy(to + 36, from + 32);
        m.Fixed(to + 40, from + 36, 2);
        m.Copy(to + 48, from + 44, 16);
        m.Fixed(to + 112, from + 108, 3);
        m.OrFlag(29864, from);
    }
    m.Copy(1028, 1016);
    m.Copy(1040, 1024);
    m.Copy(1044, 1028);
    m.Copy(1048, 1032);
    m.Copy(1052, 1036, 16);
    m.Copy(1116, 1100, 16);
    m.Copy(17468, 17452, 9);
    m.Copy(29832, 17488, 7);
    m.Copy(33376, 18244);
    // Old limiter: three fixed levels, the soft-clip enable, three fixed levels, method, system.
    m.Fixed(33384, 18252, 3);
    m.Copy(33396, 18264);
    m.Fixed(33400, 18268, 3);
    m.Copy(33412, 18280, 2);
    m.Copy(33424, 18288, 20);
}

// Version 2 (2,532 bytes) to version 3. The header and the groups before the curves stay where
// they are; the four 140-byte curves become 4,108-byte records; everything after the curves moves
// up by the records' growth. The point count is also written where the next step reads it.
void MovesFromV2(Mover& m) {
    m.Copy(0, 0, 1020 / 4);
    for (int c = 0; c < kToneCurveCount; ++c) {
        const size_t to = 1024 + 4108 * c;
        const size_t from = 1020 + 140 * c;
        m.Copy(to, from + 4);
        m.Zero(to + 4);
        m.Copy(to + 8, from + 4);
        m.Copy(to + 12, from + 12, 32);
    }
    m.Copy(17452, 1580, (kSettingsV2Size - 1580) / 4);
}

// Version 1 (2,420 bytes) to version 2: the six 108-byte secondaries spread to 120 bytes, and
// what follows them moves up by the growth.
void MovesFromV1(Mover& m) {
    m.Copy(0, 0, 1644 / 4);
    for (int k = 0; k < kSecondaryCount; ++k) m.Copy(1644 + 120 * k, 1644 + 108 * k, 108 / 4);
    m.Copy(2364, 2292, 2);
    m.Copy(2372, 2300, (kSettingsV1Size - 2300) / 4);
}

using V3Record = std::array<uint8_t, kSettingsV3Size>;
using V2Record = std::array<uint8_t, kSettingsV2Size>;

void ResetRecord(CorrectionSettings* settings, const Preferences& prefs) {
    std::memset(settings, 0, sizeof *settings);
    ResetSettings(settings, kMaskAll, prefs);
}

// Run backwards, a mover only reads the newer record.
void V3Defaults(V3Record* v3, const CorrectionSettings& defaults) {
    v3->fill(0);
    auto* newer = const_cast<uint8_t*>(reinterpret_cast<const uint8_t*>(&defaults));
    Mover back(newer, kSettingsSize, v3->data(), v3->size(), true);
    MovesFromV3(back);
}

void ConvertV3(const uint8_t* v3, CorrectionSettings* settings, const Preferences& prefs) {
    ResetRecord(settings, prefs);
    Mover forward(reinterpret_cast<uint8_t*>(settings), kSettingsSize, const_cast<uint8_t*>(v3), kSettingsV3Size,
                  false);
    MovesFromV3(forward);
}

void ConvertV2(const uint8_t* v2, V3Record* v3, const CorrectionSettings& defaults) {
    V3Defaults(v3, defaults);
    Mover forward(v3->data(), v3->size(), const_cast<uint8_t*>(v2), kSettingsV2Size, false);
    MovesFromV2(forward);
}

void V2Defaults(V2Record* v2, const CorrectionSettings& defaults) {
    V3Record v3;
    V3Defaults(&v3, defaults);
    v2->fill(0);
    Mover back(v3.data(), v3.size(), v2->data(), v2->size(), true);
    MovesFromV2(back);
}

void ConvertV1(const uint8_t* v1, V2Record* v2, const CorrectionSettings& defaults) {
    V2Defaults(v2, defaults);
    Mover forward(v2->data(), v2->size(), const_cast<uint8_t*>(v1), kSettingsV1Size, false);
    MovesFromV1(forward);
}

// ---------------------------------------------------------------------------------------------
// Host handles.

class HostHandles {
public:
    explicit HostHandles(const PF_InData* in_data) : m_utils(in_data ? in_data->utils : nullptr) {}

    bool usable() const {
        return m_utils && m_utils->host_new_handle && m_utils->host_lock_handle && m_utils->host_unlock_handle &&
               m_utils->host_dispose_handle && m_utils->host_get_handle_size;
    }
    PF_Handle New(size_t size) const { return m_utils->host_new_handle(size); }
    void Dispose(PF_Handle handle) const {
        if (handle) m_utils->host_dispose_handle(handle);
    }
    size_t Size(PF_Handle handle) const { return static_cast<size_t>(m_utils->host_get_handle_size(handle)); }
    void* Lock(PF_Handle handle) const { return m_utils->host_lock_handle(handle); }
    void Unlock(PF_Handle handle) const { m_utils->host_unlock_handle(handle); }

private:
    const PF_UtilCallbacks* m_utils;
};

// A handle locked for a scope, with its size.
class Locked {
public:
    Locked(const HostHandles& handles, PF_Handle handle) : m_handles(handles), m_handle(handle) {
        if (m_handle) {
            m_bytes = static_cast<uint8_t*>(m_handles.Lock(m_handle));
            if (m_bytes) m_size = m_handles.Size(m_handle);
        }
    }
    ~Locked() { Release(); }
    Locked(const Locked&) = delete;
    Locked& operator=(const Locked&) = delete;

    void Release() {
        if (m_bytes) m_handles.Unlock(m_handle);
        m_bytes = nullptr;
    }
    explicit operator bool() const { return m_bytes != nullptr; }
    uint8_t* bytes() const { return m_bytes; }
    size_t size() const { return m_size; }
    std::span<const uint8_t> span() const { return {m_bytes, m_size}; }
    // The value as a settings record, when it is large enough to be one.
    CorrectionSettings* settings() const {
        return m_bytes && m_size >= kSettingsSize ? reinterpret_cast<CorrectionSettings*>(m_bytes) : nullptr;
    }

private:
    const HostHandles& m_handles;
    PF_Handle m_handle;
    uint8_t* m_bytes = nullptr;
    size_t m_size = 0;
};

bool IsSettingsId(A_short id) { return id == 0 || id == kSettingsArbId; }

// A new handle of size bytes holding the first bytes of data (zero beyond them); null on failure.
PF_Handle NewHandleWith(const HostHandles& handles, size_t size, std::span<const uint8_t> data) {
    PF_Handle handle = handles.New(size);
    if (!handle) return nullptr;
    Locked locked(handles, handle);
    if (!locked && size > 0) {
        handles.Dispose(handle);
        return nullptr;
    }
    const size_t n = std::min(size, data.size());
    if (n > 0) std::memcpy(locked.bytes(), data.data(), n);
    if (size > n) std::memset(locked.bytes() + n, 0, size - n);
    return handle;
}

// A new handle holding a full reset record; null on failure.
PF_Handle NewResetRecord(const HostHandles& handles) {
    PF_Handle handle = handles.New(kSettingsSize);
    if (!handle) return nullptr;
    Locked locked(handles, handle);
    if (!locked.settings()) {
        locked.Release();
        handles.Dispose(handle);
        return nullptr;
    }
    ResetRecord(locked.settings(), EnsurePreferencesLoaded());
    return handle;
}

PF_Err NewValue(const HostHandles& handles, PF_ArbParamsExtra* extra) {
    PF_ArbitraryH* out = extra->u.new_func_params.arbPH;
    if (!out) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    PF_Handle handle = NewResetRecord(handles);
    if (!handle) return PF_Err_OUT_OF_MEMORY;
    *out = handle;
    return PF_Err_NONE;
}

PF_Err CopyValue(const HostHandles& handles, PF_ArbParamsExtra* extra) {
    auto& p = extra->u.copy_func_params;
    if (!p.dst_arbPH) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    if (!p.src_arbH) {
        *p.dst_arbPH = nullptr;
        return PF_Err_INTERNAL_STRUCT_DAMAGED;
    }
    Locked source(handles, p.src_arbH);
    if (!source) return PF_Err_UNRECOGNIZED_PARAM_TYPE;
    PF_Handle copy = NewHandleWith(handles, source.size(), source.span());
    if (!copy) return PF_Err_OUT_OF_MEMORY;
    *p.dst_arbPH = copy;
    return PF_Err_NONE;
}

PF_Err FlatSize(const HostHandles& handles, PF_ArbParamsExtra* extra) {
    auto& p = extra->u.flat_size_func_params;
    if (!p.arbH || !p.flat_data_sizePLu) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    *p.flat_data_sizePLu = static_cast<A_u_long>(handles.Size(p.arbH));
    return PF_Err_NONE;
}

PF_Err Flatten(const HostHandles& handles, PF_ArbParamsExtra* extra) {
    auto& p = extra->u.flatten_func_params;
    if (!p.arbH || (!p.flat_dataPV && p.buf_sizeLu > 0)) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    Locked value(handles, p.arbH);
    if (!value) return PF_Err_UNRECOGNIZED_PARAM_TYPE;
    if (IsSettingsId(extra->id) && p.buf_sizeLu == kSettingsSize && value.settings()) {
        SwapSettingsIfForeign(value.settings());
    }
    // The host's buffer gets the value's bytes; a buffer larger than the value is zero-filled
    // beyond it rather than filled from past the value's end.
    const size_t n = std::min<size_t>(p.buf_sizeLu, value.size());
    auto* flat = static_cast<uint8_t*>(p.flat_dataPV);
    if (n > 0) std::memcpy(flat, value.bytes(), n);
    if (p.buf_sizeLu > n) std::memset(flat + n, 0, p.buf_sizeLu - n);
    return PF_Err_NONE;
}

PF_Err Unflatten(const HostHandles& handles, PF_ArbParamsExtra* extra) {
    auto& p = extra->u.unflatten_func_params;
    if (!p.arbPH || (!p.flat_dataPV && p.buf_sizeLu > 0)) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    const std::span<const uint8_t> flat(static_cast<const uint8_t*>(p.flat_dataPV), p.buf_sizeLu);
    PF_Handle handle = nullptr;
    if (IsSettingsId(extra->id)) {
        handle = handles.New(kSettingsSize);
        if (!handle) return PF_Err_OUT_OF_MEMORY;
        bool converted = false;
        {
            Locked locked(handles, handle);
            if (!locked.settings()) {
                locked.Release();
                handles.Dispose(handle);
                return PF_Err_OUT_OF_MEMORY;
            }
            converted = UnflattenSettings(flat, locked.settings(), EnsurePreferencesLoaded());
        }
        if (!converted) {
            // A size no version ever had: kept as it came.
            handles.Dispose(handle);
            handle = NewHandleWith(handles, flat.size(), flat);
        }
    } else if (extra->id == kHueOffsetArbId) {
        handle = NewHandleWith(handles, kHueOffsetValueSize, flat);
    } else if (extra->id == kCurvesArbId) {
        handle = NewHandleWith(handles, kCurvesValueSize, flat);
    } else {
        handle = NewHandleWith(handles, flat.size(), flat);
    }
    if (!handle) return PF_Err_OUT_OF_MEMORY;
    *p.arbPH = handle;
    return PF_Err_NONE;
}

PF_Err Interpolate(const HostHandles& handles, PF_ArbParamsExtra* extra) {
    auto& p = extra->u.interp_func_params;
    if (!p.left_arbH || !p.right_arbH || !p.interpPH) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    Locked left(handles, p.left_arbH);
    Locked right(handles, p.right_arbH);
    if (!left || !right) return PF_Err_UNRECOGNIZED_PARAM_TYPE;
    // Values smaller than a record (the placeholder controls' values) are held at the left key.
    if (!left.settings() || !right.settings()) {
        PF_Handle held = NewHandleWith(handles, left.size(), left.span());
        if (!held) return PF_Err_OUT_OF_MEMORY;
        *p.interpPH = held;
        return PF_Err_NONE;
    }
    PF_Handle handle = handles.New(kSettingsSize);
    if (!handle) return PF_Err_OUT_OF_MEMORY;
    {
        Locked out(handles, handle);
        if (!out.settings()) {
            out.Release();
            handles.Dispose(handle);
            return PF_Err_OUT_OF_MEMORY;
        }
        InterpolateSettings(out.settings(), *left.settings(), *right.settings(), p.tF);
    }
    *p.interpPH = handle;
    return PF_Err_NONE;
}

PF_Err Compare(const HostHandles& handles, PF_ArbParamsExtra* extra) {
    auto& p = extra->u.compare_func_params;
    if (!p.a_arbH || !p.b_arbH || !p.compareP) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    Locked a(handles, p.a_arbH);
    Locked b(handles, p.b_arbH);
    if (!a || !b) return PF_Err_UNRECOGNIZED_PARAM_TYPE;
    const size_t n = std::min(a.size(), b.size());
    *p.compareP = std::memcmp(a.bytes(), b.bytes(), n) == 0 ? PF_ArbCompare_EQUAL : PF_ArbCompare_NOT_EQUAL;
    return PF_Err_NONE;
}

PF_Err PrintSize(PF_ArbParamsExtra* extra) {
    auto& p = extra->u.print_size_func_params;
    if (!p.print_sizePLu) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    *p.print_sizePLu = static_cast<A_u_long>(kPrintSize);
    return PF_Err_NONE;
}

PF_Err Print(const HostHandles& handles, PF_ArbParamsExtra* extra) {
    auto& p = extra->u.print_func_params;
    if (!p.arbH) return PF_Err_NONE;
    Locked value(handles, p.arbH);
    if (!value) return PF_Err_UNRECOGNIZED_PARAM_TYPE;
    if (p.print_flags == PF_ArbPrint_NONE && p.print_bufferPC && p.print_sizeLu >= kPrintSize) {
        PrintSettingsText(value.span(), p.print_bufferPC, p.print_sizeLu);
        return PF_Err_NONE;
    }
    if (p.print_bufferPC && p.print_sizeLu > 0) p.print_bufferPC[0] = '\0';
    return PF_Err_OUT_OF_MEMORY;
}

PF_Err Scan(const HostHandles& handles, PF_ArbParamsExtra* extra) {
    auto& p = extra->u.scan_func_params;
    if (!p.arbPH) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    PF_Handle handle = NewResetRecord(handles);
    if (!handle) return PF_Err_OUT_OF_MEMORY;
    // The host owns the value from here on, parsed or not.
    *p.arbPH = handle;
    Locked locked(handles, handle);
    if (!locked.settings()) return PF_Err_UNRECOGNIZED_PARAM_TYPE;
    return ScanSettingsText(p.bufPC, p.bytes_to_scanLu, locked.settings()) ? PF_Err_NONE
                                                                          : PF_Err_UNRECOGNIZED_PARAM_TYPE;
}

}  // namespace

void InterpolateSettings(CorrectionSettings* out, const CorrectionSettings& left, const CorrectionSettings& right,
                         double t) {
    if (out == nullptr) return;
    std::memmove(out, &left, sizeof *out);
    auto* o = reinterpret_cast<uint8_t*>(out);
    const auto* l = reinterpret_cast<const uint8_t*>(&left);
    const auto* r = reinterpret_cast<const uint8_t*>(&right);
    for (const BlendGroup& group : kBlendGroups) {
        for (int e = 0; e < group.entries; ++e) {
            const size_t entry = group.first + group.stride * e;
            bool differs = false;
            for (int f = 0; f < group.floats; ++f) {
                const size_t at = entry + group.floatsAt + 4 * static_cast<size_t>(f);
                const float a = LoadFloat(l + at);
                const float b = LoadFloat(r + at);
                if (a == b) continue;
                // The difference in single precision, the rest in double, rounded back to single.
                const float difference = b - a;
                const auto blended = static_cast<float>(static_cast<double>(difference) * t + static_cast<double>(a));
                std::memcpy(o + at, &blended, 4);
                differs = true;
            }
            if (!differs) continue;
            StoreWord(o + entry + group.enableAt, 1);
            for (size_t section : group.sections) {
                if (section != 0) StoreWord(o + section, 1);
            }
        }
    }
}

size_t PrintSettingsText(std::span<const uint8_t> value, char* buffer, size_t capacity) {
    if (buffer == nullptr || capacity < kPrintSize) return 0;
    char* p = buffer;
    char* const end = buffer + capacity;
    const size_t wordLength = std::strlen(kTextProductWord);
    std::memcpy(p, kTextProductWord, wordLength);
    p += wordLength;
    *p++ = '\t';
    p = std::to_chars(p, end, kSettingsWords).ptr;
    *p++ = '\t';
    for (size_t i = 0; i < kSettingsWords; ++i) {
        // A shorter value reads as zero beyond its end.
        uint8_t bytes[4] = {0, 0, 0, 0};
        const size_t at = 4 * i;
        if (at < value.size()) std::memcpy(bytes, value.data() + at, std::min<size_t>(4, value.size() - at));
        const uint32_t word = uint32_t{bytes[0]} | (uint32_t{bytes[1]} << 8) | (uint32_t{bytes[2]} << 16) |
                              (uint32_t{bytes[3]} << 24);
        p = std::to_chars(p, end, word, 16).ptr;
        *p++ = '\t';
    }
    *p = '\0';
    return static_cast<size_t>(p - buffer);
}

bool ScanSettingsText(const char* text, size_t byteCount, CorrectionSettings* settings) {
    if (text == nullptr || settings == nullptr) return false;
    // The text ends at the byte count or at a zero byte before it.
    const void* zero = std::memchr(text, '\0', byteCount);
    const size_t length = zero ? static_cast<size_t>(static_cast<const char*>(zero) - text) : byteCount;
    FieldReader fields(text, length);
    std::string_view field;
    if (!fields.Next(&field) || field != kTextProductWord) return false;
    uint64_t count = 0;
    if (!fields.Next(&field) || !ParseDecimal(field, &count) || count != kSettingsWords) return false;
    auto* record = reinterpret_cast<uint8_t*>(settings);
    for (size_t i = 0; i < kSettingsWords; ++i) {
        uint32_t word = 0;
        if (!fields.Next(&field) || !ParseHexWord(field, &word)) return false;
        const uint8_t bytes[4] = {static_cast<uint8_t>(word), static_cast<uint8_t>(word >> 8),
                                  static_cast<uint8_t>(word >> 16), static_cast<uint8_t>(word >> 24)};
        std::memcpy(record + 4 * i, bytes, 4);
    }
    return true;
}

bool UnflattenSettings(std::span<const uint8_t> flat, CorrectionSettings* settings, const Preferences& prefs) {
    if (settings == nullptr) return false;
    switch (flat.size()) {
        case kSettingsSize: std::memmove(settings, flat.data(), kSettingsSize); break;
        case kSettingsV3Size: ConvertV3(flat.data(), settings, prefs); break;
        case kSettingsV2Size:
        case kSettingsV1Size: {
            CorrectionSettings defaults;
            ResetRecord(&defaults, prefs);
            V3Record v3;
            if (flat.size() == kSettingsV2Size) {
                ConvertV2(flat.data(), &v3, defaults);
            } else {
                V2Record v2;
                ConvertV1(flat.data(), &v2, defaults);
                ConvertV2(v2.data(), &v3, defaults);
            }
            ConvertV3(v3.data(), settings, prefs);
            break;
        }
        default: return false;
    }
    SwapSettingsIfForeign(settings);
    return true;
}

PF_Err ArbitraryCallback(PF_InData* in_data, PF_ParamDef* /*params*/[], PF_ArbParamsExtra* extra) {
    if (extra == nullptr) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    const HostHandles handles(in_data);
    if (!handles.usable()) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    switch (extra->which_function) {
        case PF_Arbitrary_NEW_FUNC: return NewValue(handles, extra);
        case PF_Arbitrary_DISPOSE_FUNC: handles.Dispose(extra->u.dispose_func_params.arbH); return PF_Err_NONE;
        case PF_Arbitrary_COPY_FUNC: return CopyValue(handles, extra);
        case PF_Arbitrary_FLAT_SIZE_FUNC: return FlatSize(handles, extra);
        case PF_Arbitrary_FLATTEN_FUNC: return Flatten(handles, extra);
        case PF_Arbitrary_UNFLATTEN_FUNC: return Unflatten(handles, extra);
        case PF_Arbitrary_INTERP_FUNC: return Interpolate(handles, extra);
        case PF_Arbitrary_COMPARE_FUNC: return Compare(handles, extra);
        case PF_Arbitrary_PRINT_SIZE_FUNC: return PrintSize(extra);
        case PF_Arbitrary_PRINT_FUNC: return Print(handles, extra);
        case PF_Arbitrary_SCAN_FUNC: return Scan(handles, extra);
        default: return PF_Err_NONE;
    }
}

PF_Err HandleArbitraryCallback(const CommandContext& context) {
    return ArbitraryCallback(context.in_data, context.params, static_cast<PF_ArbParamsExtra*>(context.extra));
}

}  // namespace vt
