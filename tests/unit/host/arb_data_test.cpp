#include "host/arb_data.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstring>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "files/preferences.h"
#include "refhost/host.h"

namespace vt {
namespace {

// The host's side: values are its handles, and every call goes through the callback.
class ArbHost {
public:
    ArbHost() : m_host(refhost::HostPersona{}) {}

    PF_Err Call(PF_ArbParamsExtra& extra, A_short id = kSettingsArbId) {
        extra.id = id;
        const PF_Err err = ArbitraryCallback(&m_host.inData(), nullptr, &extra);
        for (PF_Handle h : m_values) EXPECT_EQ(m_host.heap().LockCount(h), 0) << "a value was left locked";
        return err;
    }

    PF_Handle Value(const void* data, size_t size) {
        PF_Handle h = m_host.heap().New(size);
        if (size) std::memcpy(m_host.heap().Lock(h), data, size);
        m_host.heap().Unlock(h);
        return Keep(h);
    }
    PF_Handle Value(const CorrectionSettings& s) { return Value(&s, sizeof s); }
    PF_Handle Keep(PF_Handle h) {
        if (h) m_values.push_back(h);
        return h;
    }

    std::vector<uint8_t> Bytes(PF_Handle h) {
        const size_t size = m_host.heap().Size(h);
        const auto* p = static_cast<const uint8_t*>(m_host.heap().Lock(h));
        std::vector<uint8_t> bytes(p, p + size);
        m_host.heap().Unlock(h);
        return bytes;
    }
    std::unique_ptr<CorrectionSettings> Record(PF_Handle h) {
        const std::vector<uint8_t> bytes = Bytes(h);
        EXPECT_EQ(bytes.size(), kSettingsSize);
        auto s = std::make_unique<CorrectionSettings>();
        std::memcpy(s.get(), bytes.data(), std::min(bytes.size(), kSettingsSize));
        return s;
    }

    refhost::HandleHeap& heap() { return m_host.heap(); }

private:
    refhost::Host m_host;
    std::vector<PF_Handle> m_values;
};

PF_ArbParamsExtra Extra(PF_FunctionSelector which) {
    PF_ArbParamsExtra extra{};
    extra.which_function = which;
    return extra;
}

std::unique_ptr<CorrectionSettings> Reset() {
    auto s = std::make_unique<CorrectionSettings>();
    std::memset(s.get(), 0, sizeof *s);
    ResetSettings(s.get(), kMaskAll, EnsurePreferencesLoaded());
    return s;
}

std::vector<uint8_t> BytesOf(const CorrectionSettings& s) {
    const auto* p = reinterpret_cast<const uint8_t*>(&s);
    return std::vector<uint8_t>(p, p + sizeof s);
}

uint32_t WordAt(const CorrectionSettings& s, size_t offset) {
    uint32_t w;
    std::memcpy(&w, reinterpret_cast<const uint8_t*>(&s) + offset, 4);
    return w;
}

void SetWord(void* record, size_t offset, uint32_t value) {
    std::memcpy(static_cast<uint8_t*>(record) + offset, &value, 4);
}
void SetFloat(void* record, size_t offset, float value) {
    std::memcpy(static_cast<uint8_t*>(record) + offset, &value, 4);
}
float FloatAt(const CorrectionSettings& s, size_t offset) { return std::bit_cast<float>(WordAt(s, offset)); }

std::unique_ptr<CorrectionSettings> RandomRecord(uint32_t seed) {
    std::mt19937 random(seed);
    auto s = std::make_unique<CorrectionSettings>();
    auto* words = reinterpret_cast<uint32_t*>(s.get());
    for (size_t i = 0; i < kSettingsWords; ++i) words[i] = i % 3 == 0 ? 0 : random();
    s->magic = kSettingsMagic;
    return s;
}

// ------------------------------------------------------------------------------------------------
// Values: new, dispose, copy, flatten, unflatten, compare

TEST(ArbData, NewGivesAFullResetRecordForEveryId) {
    ArbHost host;
    for (A_short id : {A_short{1}, A_short{45}, A_short{104}}) {
        PF_ArbitraryH value = nullptr;
        auto extra = Extra(PF_Arbitrary_NEW_FUNC);
        extra.u.new_func_params.arbPH = &value;
        ASSERT_EQ(host.Call(extra, id), PF_Err_NONE);
        host.Keep(value);
        EXPECT_EQ(host.Bytes(value), BytesOf(*Reset())) << id;
    }
    host.heap().FailNextAllocations(1);
    PF_ArbitraryH value = nullptr;
    auto extra = Extra(PF_Arbitrary_NEW_FUNC);
    extra.u.new_func_params.arbPH = &value;
    EXPECT_EQ(host.Call(extra), PF_Err_OUT_OF_MEMORY);
    EXPECT_EQ(value, nullptr);
}

TEST(ArbData, DisposeCopyAndSizes) {
    ArbHost host;
    const size_t live = host.heap().LiveCount();
    auto record = RandomRecord(1);
    PF_Handle original = host.Value(*record);

    PF_ArbitraryH copy = reinterpret_cast<PF_ArbitraryH>(1);
    auto extra = Extra(PF_Arbitrary_COPY_FUNC);
    extra.u.copy_func_params.dst_arbPH = &copy;
    EXPECT_EQ(host.Call(extra), PF_Err_INTERNAL_STRUCT_DAMAGED) << "null source";
    EXPECT_EQ(copy, nullptr);
    extra.u.copy_func_params.src_arbH = original;
    ASSERT_EQ(host.Call(extra), PF_Err_NONE);
    EXPECT_NE(copy, original);
    EXPECT_EQ(host.Bytes(copy), BytesOf(*record));
    const uint8_t small[7] = {1, 2, 3, 4, 5, 6, 7};
    extra.u.copy_func_params.src_arbH = host.Value(small, sizeof small);
    ASSERT_EQ(host.Call(extra), PF_Err_NONE);
    EXPECT_EQ(host.Bytes(copy), std::vector<uint8_t>(small, small + 7));

    A_u_long size = 0;
    auto sizeExtra = Extra(PF_Arbitrary_FLAT_SIZE_FUNC);
    sizeExtra.u.flat_size_func_params.arbH = original;
    sizeExtra.u.flat_size_func_params.flat_data_sizePLu = &size;
    ASSERT_EQ(host.Call(sizeExtra), PF_Err_NONE);
    EXPECT_EQ(size, kSettingsSize);

    A_u_long printSize = 0;
    auto printSizeExtra = Extra(PF_Arbitrary_PRINT_SIZE_FUNC);
    printSizeExtra.u.print_size_func_params.print_sizePLu = &printSize;
    ASSERT_EQ(host.Call(printSizeExtra), PF_Err_NONE);
    EXPECT_EQ(printSize, 75565u);

    auto dispose = Extra(PF_Arbitrary_DISPOSE_FUNC);
    dispose.u.dispose_func_params.arbH = copy;
    EXPECT_EQ(host.Call(dispose), PF_Err_NONE);
    EXPECT_EQ(host.heap().LiveCount(), live + 3);

    auto unknown = Extra(11);
    EXPECT_EQ(host.Call(unknown), PF_Err_NONE);
}

TEST(ArbData, FlattenRepairsTheByteOrderAndNeverReadsPastTheValue) {
    ArbHost host;
    auto record = RandomRecord(2);
    std::vector<uint8_t> swapped = BytesOf(*record);
    for (size_t i = 0; i < swapped.size(); i += 4) std::reverse(swapped.begin() + i, swapped.begin() + i + 4);
    PF_Handle value = host.Value(swapped.data(), swapped.size());

    std::vector<uint8_t> flat(kSettingsSize);
    auto extra = Extra(PF_Arbitrary_FLATTEN_FUNC);
    extra.u.flatten_func_params.arbH = value;
    extra.u.flatten_func_params.buf_sizeLu = kSettingsSize;
    extra.u.flatten_func_params.flat_dataPV = flat.data();
    // Another id's value is copied as it is.
    ASSERT_EQ(host.Call(extra, kHueOffsetArbId), PF_Err_NONE);
    EXPECT_EQ(flat, swapped);
    ASSERT_EQ(host.Call(extra), PF_Err_NONE);
    EXPECT_EQ(flat, BytesOf(*record));
    EXPECT_EQ(host.Bytes(value), BytesOf(*record)) << "the value itself is repaired";

    // A buffer larger than the value gets zeros beyond it, a smaller one the value's start.
    const uint8_t small[6] = {9, 8, 7, 6, 5, 4};
    extra.u.flatten_func_params.arbH = host.Value(small, sizeof small);
    std::vector<uint8_t> larger(20, 0xEE);
    extra.u.flatten_func_params.buf_sizeLu = 20;
    extra.u.flatten_func_params.flat_dataPV = larger.data();
    ASSERT_EQ(host.Call(extra, kHueOffsetArbId), PF_Err_NONE);
    EXPECT_EQ(larger, (std::vector<uint8_t>{9, 8, 7, 6, 5, 4, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}));
    std::vector<uint8_t> smaller(3);
    extra.u.flatten_func_params.buf_sizeLu = 3;
    extra.u.flatten_func_params.flat_dataPV = smaller.data();
    ASSERT_EQ(host.Call(extra, kHueOffsetArbId), PF_Err_NONE);
    EXPECT_EQ(smaller, (std::vector<uint8_t>{9, 8, 7}));
}

PF_Handle Unflatten(ArbHost& host, const std::vector<uint8_t>& flat, A_short id = kSettingsArbId,
                    PF_Err expected = PF_Err_NONE) {
    PF_ArbitraryH value = nullptr;
    auto extra = Extra(PF_Arbitrary_UNFLATTEN_FUNC);
    extra.u.unflatten_func_params.buf_sizeLu = static_cast<A_u_long>(flat.size());
    extra.u.unflatten_func_params.flat_dataPV = flat.data();
    extra.u.unflatten_func_params.arbPH = &value;
    EXPECT_EQ(host.Call(extra, id), expected);
    return host.Keep(value);
}

TEST(ArbData, UnflattenKeepsEachIdWithinItsBuffer) {
    ArbHost host;
    auto record = RandomRecord(3);
    std::vector<uint8_t> flat = BytesOf(*record);
    EXPECT_EQ(host.Bytes(Unflatten(host, flat)), flat);
    EXPECT_EQ(host.Bytes(Unflatten(host, flat, 0)), flat);
    std::vector<uint8_t> swapped = flat;
    for (size_t i = 0; i < swapped.size(); i += 4) std::reverse(swapped.begin() + i, swapped.begin() + i + 4);
    EXPECT_EQ(host.Bytes(Unflatten(host, swapped)), flat);

    // Sizes no version had, and other ids, are kept as they came.
    const std::vector<uint8_t> odd = {1, 2, 3, 4, 5};
    EXPECT_EQ(host.Bytes(Unflatten(host, odd)), odd);
    EXPECT_EQ(host.Bytes(Unflatten(host, odd, -7)), odd);
    EXPECT_EQ(host.Bytes(Unflatten(host, {}, 99)), std::vector<uint8_t>{});

    // The controls' values have fixed sizes; a shorter buffer is read only as far as it goes.
    std::vector<uint8_t> hue = host.Bytes(Unflatten(host, odd, kHueOffsetArbId));
    ASSERT_EQ(hue.size(), 52u);
    EXPECT_TRUE(std::equal(odd.begin(), odd.end(), hue.begin()));
    EXPECT_EQ(std::count(hue.begin() + 5, hue.end(), 0), 47);
    std::vector<uint8_t> curves = host.Bytes(Unflatten(host, flat, kCurvesArbId));
    ASSERT_EQ(curves.size(), 4108u);
    EXPECT_TRUE(std::equal(curves.begin(), curves.end(), flat.begin()));

    host.heap().FailNextAllocations(1);
    EXPECT_EQ(Unflatten(host, flat, kSettingsArbId, PF_Err_OUT_OF_MEMORY), nullptr);
}

TEST(ArbData, CompareLooksAtTheCommonLength) {
    ArbHost host;
    auto record = RandomRecord(4);
    std::vector<uint8_t> longer = BytesOf(*record);
    longer.push_back(42);
    PF_ArbCompareResult result = -1;
    auto extra = Extra(PF_Arbitrary_COMPARE_FUNC);
    extra.u.compare_func_params.compareP = &result;
    extra.u.compare_func_params.a_arbH = host.Value(*record);
    extra.u.compare_func_params.b_arbH = host.Value(longer.data(), longer.size());
    ASSERT_EQ(host.Call(extra), PF_Err_NONE);
    EXPECT_EQ(result, PF_ArbCompare_EQUAL);
    record->tonal[1].gain = 3.0f;
    extra.u.compare_func_params.a_arbH = host.Value(*record);
    ASSERT_EQ(host.Call(extra), PF_Err_NONE);
    EXPECT_EQ(result, PF_ArbCompare_NOT_EQUAL);
    extra.u.compare_func_params.b_arbH = nullptr;
    EXPECT_EQ(host.Call(extra), PF_Err_INTERNAL_STRUCT_DAMAGED);
}

// ------------------------------------------------------------------------------------------------
// Interpolation

TEST(ArbData, InterpolatingOneSaturationBlendsItAndEnablesItsRange) {
    auto left = Reset();
    auto right = Reset();
    right->tonal[kRangeHighlights].saturation = 180.0f;
    auto out = RandomRecord(5);
    InterpolateSettings(out.get(), *left, *right, 0.25);
    auto expected = Reset();
    expected->tonal[kRangeHighlights].saturation = 120.0f;
    expected->tonal[kRangeHighlights].enable = 1;
    expected->masterEnable = 1;
    expected->tonalEnable = 1;
    EXPECT_EQ(BytesOf(*out), BytesOf(*expected));
}

TEST(ArbData, EachBlendedGroupEnablesItselfAndItsSection) {
    struct Probe {
        size_t field;
        std::vector<size_t> enables;
    };
    const Probe probes[] = {
        {12 + 40 * 3 + 36, {132, 4, 8}},  // Shadows pedestal
        {176 + 4, {176, 172}},             // RGB Master gain
        {228 + 48, {228, 172}},            // RGB Highlights blue pedestal
        {388 + 52 * 2 + 20, {492, 384}},   // second set Midtones red gamma
        {600 + 52 * 3 + 4, {756, 596}},    // third set Shadows master gain
        {868 + 8, {872, 864}},             // levels Master input black
        {996 + 28, {1000, 864}},           // fifth levels group output white
    };
    for (const Probe& probe : probes) {
        auto left = Reset();
        auto right = Reset();
        SetFloat(left.get(), probe.field, 0.5f);
        SetFloat(right.get(), probe.field, 1.5f);
        auto out = Reset();
        InterpolateSettings(out.get(), *left, *right, 0.5);
        EXPECT_EQ(FloatAt(*out, probe.field), 1.0f) << probe.field;
        for (size_t enable : probe.enables) EXPECT_EQ(WordAt(*out, enable), 1u) << probe.field << " " << enable;
        auto check = Reset();
        SetFloat(check.get(), probe.field, 1.0f);
        for (size_t enable : probe.enables) SetWord(check.get(), enable, 1);
        EXPECT_EQ(BytesOf(*out), BytesOf(*check)) << probe.field;
    }
}

TEST(ArbData, EverythingElseIsHeldAtTheLeftKey) {
    auto left = RandomRecord(6);
    auto right = RandomRecord(7);
    auto out = Reset();
    InterpolateSettings(out.get(), *left, *right, 0.75);
    // Curves, wheels, secondaries, limiter and the rest come from the left record alone.
    const size_t blended[][2] = {{12, 172}, {176, 384}, {388, 596}, {600, 808}, {872, 1028}};
    for (size_t offset = 0; offset < kSettingsSize; offset += 4) {
        bool inGroup = offset == 4 || offset == 8 || offset == 172 || offset == 384 || offset == 596 || offset == 864;
        for (const auto& range : blended) inGroup = inGroup || (offset >= range[0] && offset < range[1]);
        if (!inGroup) {
            ASSERT_EQ(WordAt(*out, offset), WordAt(*left, offset)) << offset;
        }
    }
    // Equal fields keep the left value and switch nothing on.
    auto same = Reset();
    InterpolateSettings(out.get(), *same, *same, 0.3);
    EXPECT_EQ(BytesOf(*out), BytesOf(*same));
}

TEST(ArbData, BlendingTakesTheDifferenceInSinglePrecision) {
    auto left = Reset();
    auto right = Reset();
    const float a = 0.1f;
    const float b = 16777217.0f;  // not a float: b - a rounds in single precision
    left->rgbSet.range[0].channel[1].gain = a;
    right->rgbSet.range[0].channel[1].gain = b;
    auto out = Reset();
    const double t = 1.0 / 3.0;
    InterpolateSettings(out.get(), *left, *right, t);
    const float difference = b - a;
    EXPECT_EQ(out->rgbSet.range[0].channel[1].gain,
              static_cast<float>(static_cast<double>(difference) * t + static_cast<double>(a)));
    InterpolateSettings(out.get(), *left, *right, 1.0);
    EXPECT_EQ(out->rgbSet.range[0].channel[1].gain, difference + a);
}

TEST(ArbData, InterpolationThroughTheHostHoldsSmallValuesAtTheLeftKey) {
    ArbHost host;
    auto left = Reset();
    auto right = Reset();
    right->levels[2].group.inputWhite = 0.5f;
    PF_ArbitraryH out = nullptr;
    auto extra = Extra(PF_Arbitrary_INTERP_FUNC);
    extra.u.interp_func_params.left_arbH = host.Value(*left);
    extra.u.interp_func_params.right_arbH = host.Value(*right);
    extra.u.interp_func_params.tF = 0.5;
    extra.u.interp_func_params.interpPH = &out;
    ASSERT_EQ(host.Call(extra), PF_Err_NONE);
    host.Keep(out);
    EXPECT_EQ(host.Record(out)->levels[2].group.inputWhite, 0.75f);

    const uint8_t a[52] = {1};
    const uint8_t b[52] = {2};
    extra.u.interp_func_params.left_arbH = host.Value(a, sizeof a);
    extra.u.interp_func_params.right_arbH = host.Value(b, sizeof b);
    ASSERT_EQ(host.Call(extra, kHueOffsetArbId), PF_Err_NONE);
    host.Keep(out);
    EXPECT_EQ(host.Bytes(out), std::vector<uint8_t>(a, a + 52));
    // A record against a smaller value: held too.
    extra.u.interp_func_params.left_arbH = host.Value(*left);
    ASSERT_EQ(host.Call(extra), PF_Err_NONE);
    host.Keep(out);
    EXPECT_EQ(host.Bytes(out), BytesOf(*left));

    extra.u.interp_func_params.right_arbH = nullptr;
    EXPECT_EQ(host.Call(extra), PF_Err_INTERNAL_STRUCT_DAMAGED);
    extra.u.interp_func_params.right_arbH = host.Value(*right);
    host.heap().FailNextAllocations(1);
    out = nullptr;
    EXPECT_EQ(host.Call(extra), PF_Err_OUT_OF_MEMORY);
    EXPECT_EQ(out, nullptr);
}

// ------------------------------------------------------------------------------------------------
// Print and scan

std::string Print(ArbHost& host, PF_Handle value, size_t bufferSize, PF_Err expected = PF_Err_NONE,
                  PF_ArbPrintFlags flags = PF_ArbPrint_NONE) {
    std::vector<char> buffer(bufferSize + 1, 'z');
    auto extra = Extra(PF_Arbitrary_PRINT_FUNC);
    extra.u.print_func_params.print_flags = flags;
    extra.u.print_func_params.arbH = value;
    extra.u.print_func_params.print_sizeLu = static_cast<A_u_long>(bufferSize);
    extra.u.print_func_params.print_bufferPC = buffer.data();
    EXPECT_EQ(host.Call(extra), expected);
    EXPECT_EQ(buffer[bufferSize], 'z') << "written past the buffer";
    return std::string(buffer.data(), strnlen(buffer.data(), bufferSize));
}

PF_Handle Scan(ArbHost& host, const std::string& text, PF_Err expected, size_t count = SIZE_MAX) {
    PF_ArbitraryH value = nullptr;
    auto extra = Extra(PF_Arbitrary_SCAN_FUNC);
    // The text is copied to a buffer of exactly its byte count, so a read past it is caught.
    const size_t bytes = std::min(count, text.size());
    std::unique_ptr<char[]> exact(new char[bytes ? bytes : 1]);
    std::memcpy(exact.get(), text.data(), bytes);
    extra.u.scan_func_params.bufPC = exact.get();
    extra.u.scan_func_params.bytes_to_scanLu = static_cast<A_u_long>(bytes);
    extra.u.scan_func_params.arbPH = &value;
    EXPECT_EQ(host.Call(extra), expected);
    EXPECT_NE(value, nullptr) << "scan hands its value out whatever the text";
    return host.Keep(value);
}

TEST(ArbData, PrintThenScanReproducesTheRecordWordForWord) {
    ArbHost host;
    for (uint32_t seed : {8u, 9u}) {
        auto record = RandomRecord(seed);
        const std::string text = Print(host, host.Value(*record), kPrintSize);
        EXPECT_EQ(text.rfind("Velatone\t8389\t", 0), 0u);
        EXPECT_LE(text.size(), 75515u);
        EXPECT_EQ(std::count(text.begin(), text.end(), '\t'), 8391);
        EXPECT_EQ(host.Bytes(Scan(host, text, PF_Err_NONE)), BytesOf(*record));
    }
    // Each word in lowercase hexadecimal without leading zeros.
    auto reset = Reset();
    const std::string text = Print(host, host.Value(*reset), kPrintSize + 100);
    EXPECT_EQ(text.rfind("Velatone\t8389\t12343210\t0\t0\t0\t", 0), 0u);
    EXPECT_NE(text.find("\t42c80000\t"), std::string::npos) << "saturation 100";
}

TEST(ArbData, PrintNeedsTheAnnouncedSize) {
    ArbHost host;
    PF_Handle value = host.Value(*Reset());
    EXPECT_EQ(Print(host, value, 75564, PF_Err_OUT_OF_MEMORY), "");
    EXPECT_EQ(Print(host, value, kPrintSize, PF_Err_OUT_OF_MEMORY, PF_ArbPrint_ABBREVIATED), "");
    EXPECT_EQ(Print(host, nullptr, 8, PF_Err_NONE), "zzzzzzzz") << "no value, nothing printed";
    // A smaller value prints as if zero-filled to a record.
    const uint8_t small[6] = {0x10, 0x32, 0x34, 0x12, 0xAB, 0x00};
    const std::string text = Print(host, host.Value(small, sizeof small), kPrintSize);
    EXPECT_EQ(text.rfind("Velatone\t8389\t12343210\tab\t0\t0\t", 0), 0u);
}

TEST(ArbData, ScanOfUnusableTextLeavesDefaultsBeyondWhereItStopped) {
    ArbHost host;
    auto record = RandomRecord(10);
    const std::string text = Print(host, host.Value(*record), kPrintSize);
    const std::vector<uint8_t> reset = BytesOf(*Reset());

    std::string wrongCount = text;
    wrongCount.replace(9, 4, "8388");
    EXPECT_EQ(host.Bytes(Scan(host, wrongCount, PF_Err_UNRECOGNIZED_PARAM_TYPE)), reset);
    EXPECT_EQ(host.Bytes(Scan(host, "Velatonf" + text.substr(8), PF_Err_UNRECOGNIZED_PARAM_TYPE)), reset);
    EXPECT_EQ(host.Bytes(Scan(host, "", PF_Err_UNRECOGNIZED_PARAM_TYPE)), reset);

    // Cut after the tenth word's tab: ten words read, the rest at their defaults.
    size_t cut = 0;
    for (int tabs = 0; tabs < 12; ++tabs) cut = text.find('\t', cut) + 1;
    std::vector<uint8_t> expected = reset;
    std::memcpy(expected.data(), record.get(), 40);
    EXPECT_EQ(host.Bytes(Scan(host, text, PF_Err_UNRECOGNIZED_PARAM_TYPE, cut + 3)), expected);
    // A zero byte ends the text as well.
    std::string zero = text;
    zero[cut + 1] = '\0';
    EXPECT_EQ(host.Bytes(Scan(host, zero, PF_Err_UNRECOGNIZED_PARAM_TYPE)), expected);

    // Malformed fields stop the scan where they stand.
    const std::string head = "Velatone\t8389\t";
    for (const std::string& bad : {std::string(64, '0'), std::string("100000000"), std::string("12zz"),
                                   std::string(""), std::string("-1"), std::string("0x")}) {
        std::vector<uint8_t> one = reset;
        SetWord(one.data(), 0, 0xABC);
        EXPECT_EQ(host.Bytes(Scan(host, head + "abc\t" + bad + "\t" + text.substr(cut), PF_Err_UNRECOGNIZED_PARAM_TYPE)),
                  one)
            << bad;
    }
    // Up to 63 characters is a field; blanks, upper case and a 0x are read.
    const std::string wide = std::string(55, '0') + "FFFFFFFF";
    std::vector<uint8_t> two = reset;
    SetWord(two.data(), 0, 0xFFFFFFFF);
    SetWord(two.data(), 4, 0x1F);
    const auto scanned = host.Bytes(Scan(host, head + wide + "\t 0x1f \t", PF_Err_UNRECOGNIZED_PARAM_TYPE));
    EXPECT_TRUE(std::equal(two.begin(), two.begin() + 8, scanned.begin()));
}

// ------------------------------------------------------------------------------------------------
// Records of earlier versions

// An older record and the current record it must become, filled in step by step.
class Legacy {
public:
    explicit Legacy(size_t size) : m_old(size, 0), m_expected(Reset()) {}

    void Copy(size_t to, size_t from, uint32_t value) {
        SetWord(m_old.data(), from, value);
        Expect(to, value);
    }
    void Fixed(size_t to, size_t from, double value) {
        SetWord(m_old.data(), from, static_cast<uint32_t>(static_cast<int32_t>(std::lround(value * 65536))));
        ExpectFloat(to, static_cast<float>(value));
    }
    void Old(size_t from, uint32_t value) { SetWord(m_old.data(), from, value); }
    void Expect(size_t to, uint32_t value) {
        SetWord(m_expected.get(), to, value);
        m_checked.push_back(to);
    }
    void ExpectFloat(size_t to, float value) { Expect(to, std::bit_cast<uint32_t>(value)); }

    // The words set above, and the fields no earlier version carries, which keep their defaults.
    void Check() {
        auto out = std::make_unique<CorrectionSettings>();
        ASSERT_TRUE(UnflattenSettings(m_old, out.get(), EnsurePreferencesLoaded()));
        std::vector<size_t> checked = m_checked;
        for (int r = 0; r < 4; ++r) checked.push_back(12 + 40 * r + 12);  // vibrance
        for (size_t offset = 5144; offset < 17468; offset += 4) checked.push_back(offset);   // Red, Green, Blue
        for (size_t offset = 17504; offset < 29832; offset += 4) checked.push_back(offset);  // hue curves
        for (size_t offset = 30612; offset < 33376; offset += 4) checked.push_back(offset);  // auxiliaries
        for (size_t offset = 33504; offset < kSettingsSize; offset += 4) checked.push_back(offset);
        checked.push_back(0);
        for (size_t offset : checked) {
            ASSERT_EQ(WordAt(*out, offset), WordAt(*m_expected, offset)) << "offset " << offset;
        }
        // And the same through the host.
        ArbHost host;
        PF_Handle value = Unflatten(host, m_old);
        EXPECT_EQ(host.Bytes(value), BytesOf(*out));
    }
    std::vector<uint8_t>& old() { return m_old; }

private:
    std::vector<uint8_t> m_old;
    std::unique_ptr<CorrectionSettings> m_expected;
    std::vector<size_t> m_checked;
};

// The fields of an 18,404-byte record, each with a value of its own.
void FillVersion3(Legacy& v, size_t base, size_t tail) {
    // base: where the version-3 record starts in the older record (0 for version 3 itself); the
    // groups before the curves are at the same offsets in versions 2 and 3.
    v.Copy(4, base + 4, 1);
    v.Copy(8, base + 8, 1);
    for (int r = 0; r < 4; ++r) {
        const size_t to = 12 + 40 * r;
        const size_t from = base + 12 + 36 * r;
        v.Copy(to, from, r + 1);
        v.Fixed(to + 4, from + 4, -10.5 * r - 1);
        v.Fixed(to + 8, from + 8, 50 + r);
        for (int f = 0; f < 6; ++f) v.Fixed(to + 16 + 4 * f, from + 12 + 4 * f, 0.25 * (f + r));
    }
    const size_t sets[][3] = {{172, 156, 176}, {384, 368, 388}, {596, 580, 600}};
    for (const auto& set : sets) {
        v.Copy(set[0], base + set[1], 1);
        for (int r = 0; r < 4; ++r) {
            v.Copy(set[2] + 52 * r, base + set[1] + 4 + 52 * r, 1);
            for (int f = 0; f < 12; ++f) v.Fixed(set[2] + 4 + 52 * r + 4 * f, base + set[1] + 8 + 52 * r + 4 * f, f / 8.0);
        }
    }
    v.Copy(808, base + 792, 1);
    v.Copy(812, base + 796, 7);
    for (int w = 0; w < 4; ++w) {
        v.Copy(816 + 12 * w, base + 800 + 12 * w, 20 + w);
        v.Fixed(820 + 12 * w, base + 804 + 12 * w, 90.0 * w);
        v.Fixed(824 + 12 * w, base + 808 + 12 * w, 0.125 * w);
    }
    v.Copy(864, base + 848, 1);
    for (int g = 0; g < 5; ++g) {
        v.Copy(868 + 32 * g, base + 852 + 32 * g, 30 + g);
        v.Copy(872 + 32 * g, base + 856 + 32 * g, 1);
        for (int f = 0; f < 6; ++f) v.Fixed(876 + 32 * g + 4 * f, base + 860 + 32 * g + 4 * f, 0.125 * f + g);
    }
    v.Copy(29860, base + 1012, 1);
    v.Copy(1028, base + 1016, 1);
    // The tail: 29832 ... 29856 and 17468 ... 17500, the secondaries, the limiter.
    for (int i = 0; i < 9; ++i) v.Copy(17468 + 4 * i, tail + 4 * i, 0x100 + i);
    for (int i = 0; i < 7; ++i) v.Copy(29832 + 4 * i, tail + 36 + 4 * i, 0x200 + i);
    for (int k = 0; k < 6; ++k) {
        const size_t to = 29868 + 124 * k;
        const size_t from = tail + 64 + 120 * k;
        v.Copy(to, from, k % 2);
        v.Fixed(to + 4, from + 4, 0.5);
        v.Old(from + 16, 9);
        v.Expect(to + 16, 1);
        v.Copy(to + 24, from + 20, 1);
        v.Fixed(to + 40, from + 36, -45);
        v.Copy(to + 48, from + 44, 0x300 + k);
        v.Fixed(to + 112, from + 108, 1.5);
        v.Fixed(to + 120, from + 116, 0.0625);
    }
    v.Copy(33376, tail + 792, 1);
    v.Fixed(33384, tail + 800, 105);
    v.Copy(33396, tail + 812, 1);
    v.Fixed(33408, tail + 824, 125);
    v.Copy(33416, tail + 832, 2);
    for (int i = 0; i < 20; ++i) v.Copy(33424 + 4 * i, tail + 836 + 4 * i, 0x400 + i);
}

TEST(ArbData, Version3RecordsConvertGroupByGroup) {
    Legacy v(kSettingsV3Size);
    FillVersion3(v, 0, 17452);
    v.Copy(1040, 1024, 3);
    v.Copy(1048, 1032, 3);
    for (int i = 0; i < 3; ++i) {
        v.Copy(1052 + 4 * i, 1036 + 4 * i, std::bit_cast<uint32_t>(i / 2.0f));
        v.Copy(1116 + 4 * i, 1100 + 4 * i, std::bit_cast<uint32_t>(1.0f - i / 2.0f));
    }
    v.Check();
}

TEST(ArbData, Version2RecordsMoveTheirCurvesAndTailThroughVersion3) {
    Legacy v(kSettingsV2Size);
    FillVersion3(v, 0, 1580);
    // Curves of 140 bytes: the count at +4, x at +12, y at +76. Only the first reaches the record.
    v.Old(1020 + 4, 3);
    v.Expect(1040, 3);
    v.Expect(1048, 3);
    for (int i = 0; i < 3; ++i) {
        v.Copy(1052 + 4 * i, 1020 + 12 + 4 * i, std::bit_cast<uint32_t>(i / 2.0f));
        v.Copy(1116 + 4 * i, 1020 + 76 + 4 * i, std::bit_cast<uint32_t>(i * i / 4.0f));
    }
    v.Old(1160 + 4, 5);  // the Red curve: not carried on
    v.Check();
}

TEST(ArbData, Version1RecordsSpreadTheirSecondariesThroughVersion2) {
    Legacy v(kSettingsV1Size);
    v.Copy(4, 4, 1);
    v.Fixed(52 + 8, 48 + 8, 75);
    for (int k = 0; k < 6; ++k) {
        const size_t to = 29868 + 124 * k;
        const size_t from = 1644 + 108 * k;
        v.Copy(to, from, 1);
        v.Fixed(to + 4, from + 4, 0.25 * k);
        v.Copy(to + 108, from + 104, 0x500 + k);  // the fourth reference colour's blue: the last old word
        // Gain, gamma and pedestal were not in the 27-word form: the defaults' 1, 1, 0.
        v.ExpectFloat(to + 112, 1.0f);
        v.ExpectFloat(to + 116, 1.0f);
        v.ExpectFloat(to + 120, 0.0f);
    }
    v.Copy(33376, 2300, 1);      // what followed the secondaries moves with them
    v.Fixed(33384, 2308, 99.5);
    v.Check();
}

}  // namespace
}  // namespace vt
