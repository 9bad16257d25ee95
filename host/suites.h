// A host suite held for one use: acquired from the suite directory when constructed, released
// when the scope ends, as the host expects suites to be held only briefly.
#pragma once

#include <cstdint>

#include "sdk/sp_basic.h"

namespace vt {

template <typename Suite>
class SuiteRef {
public:
    SuiteRef(const SPBasicSuite* basic, const char* name, int32_t version)
        : m_basic(basic), m_name(name), m_version(version) {
        const void* suite = nullptr;
        if (m_basic && m_basic->AcquireSuite && m_basic->AcquireSuite(name, version, &suite) == kSPNoError && suite) {
            m_suite = static_cast<const Suite*>(suite);
        }
    }
    ~SuiteRef() {
        if (m_suite && m_basic->ReleaseSuite) m_basic->ReleaseSuite(m_name, m_version);
    }
    SuiteRef(const SuiteRef&) = delete;
    SuiteRef& operator=(const SuiteRef&) = delete;

    explicit operator bool() const { return m_suite != nullptr; }
    const Suite* operator->() const { return m_suite; }
    const Suite* get() const { return m_suite; }

private:
    const SPBasicSuite* m_basic;
    const char* m_name;
    int32_t m_version;
    const Suite* m_suite = nullptr;
};

}  // namespace vt
