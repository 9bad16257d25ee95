// Host memory handles as the reference host hands them out: a handle is the address of a master
// pointer to the block. Blocks are recycled by size, as real hosts recycle their memory, so a
// frame-sized allocation per render does not fault in fresh pages each time.
#pragma once

#include <cstddef>
#include <cstdint>
#include <mutex>
#include <string>
#include <unordered_map>
#include <vector>

namespace refhost {

class HandleHeap {
public:
    HandleHeap() = default;
    ~HandleHeap();
    HandleHeap(const HandleHeap&) = delete;
    HandleHeap& operator=(const HandleHeap&) = delete;

    // Returns the handle (a void**), or null when the size is refused (fail-next or limit set).
    void** New(size_t size, const char* what = nullptr);
    void* Lock(void** handle);
    void Unlock(void** handle);
    void Dispose(void** handle);
    size_t Size(void** handle) const;
    bool Resize(void** handle, size_t size);
    bool IsLive(void** handle) const;

    size_t LiveCount() const;
    size_t LiveBytes() const;
    int LockCount(void** handle) const;
    std::string What(void** handle) const;

    // Test controls: refuse the next `count` allocations, or every allocation above `bytes`.
    void FailNextAllocations(int count);
    void SetAllocationLimit(size_t bytes);

private:
    struct Block {
        void* pointer;  // the master pointer: a handle is its address
        size_t size;
        int locks;
        std::string what;
    };
    static void* AllocateStore(size_t size);

    mutable std::mutex m_mutex;  // guards everything below
    std::unordered_map<void**, Block*> m_live;
    std::unordered_map<size_t, std::vector<void*>> m_freeStores;
    size_t m_freeBytes = 0;
    int m_failNext = 0;
    size_t m_limit = SIZE_MAX;
};

}  // namespace refhost
