// A host memory handle held locked for the life of a scope.
#pragma once

#include <cstddef>

#include "sdk/ae_effect.h"

namespace vt {

class LockedHandle {
public:
    LockedHandle(const PF_InData* in_data, PF_Handle handle) : m_inData(in_data), m_handle(handle) {
        if (m_handle && m_inData && m_inData->utils && m_inData->utils->host_lock_handle) {
            m_pointer = m_inData->utils->host_lock_handle(m_handle);
            if (m_inData->utils->host_get_handle_size) {
                m_size = static_cast<size_t>(m_inData->utils->host_get_handle_size(m_handle));
            }
        }
    }
    ~LockedHandle() {
        if (m_pointer) m_inData->utils->host_unlock_handle(m_handle);
    }
    LockedHandle(const LockedHandle&) = delete;
    LockedHandle& operator=(const LockedHandle&) = delete;

    void* get() const { return m_pointer; }
    size_t size() const { return m_pointer ? m_size : 0; }
    // The block as a T, when it is at least that large; else null.
    template <typename T>
    T* as() const {
        return m_pointer && m_size >= sizeof(T) ? static_cast<T*>(m_pointer) : nullptr;
    }

private:
    const PF_InData* m_inData;
    PF_Handle m_handle;
    void* m_pointer = nullptr;
    size_t m_size = 0;
};

}  // namespace vt
