#include "refhost/handles.h"

#include <cstdlib>
#include <cstring>

namespace refhost {

namespace {
// Freed stores kept for reuse, at most this many bytes in all.
constexpr size_t kMaxRecycledBytes = size_t{512} << 20;
}  // namespace

HandleHeap::~HandleHeap() {
    for (auto& [handle, block] : m_live) {
        std::free(block->pointer);
        delete block;
    }
    for (auto& [size, stores] : m_freeStores) {
        for (void* store : stores) std::free(store);
    }
}

// malloc's 16-byte alignment on 64-bit systems is what hosts guarantee.
void* HandleHeap::AllocateStore(size_t size) { return std::malloc(size == 0 ? 1 : size); }

void** HandleHeap::New(size_t size, const char* what) {
    std::lock_guard<std::mutex> guard(m_mutex);
    if (m_failNext > 0) {
        --m_failNext;
        return nullptr;
    }
    if (size > m_limit) return nullptr;
    void* store = nullptr;
    if (auto found = m_freeStores.find(size); found != m_freeStores.end() && !found->second.empty()) {
        store = found->second.back();
        found->second.pop_back();
        m_freeBytes -= size;
    } else {
        store = AllocateStore(size);
        if (!store) return nullptr;
    }
    auto* block = new Block{store, size, 0, what ? what : ""};
    m_live.emplace(&block->pointer, block);
    return &block->pointer;
}

void* HandleHeap::Lock(void** handle) {
    std::lock_guard<std::mutex> guard(m_mutex);
    auto found = m_live.find(handle);
    if (found == m_live.end()) return nullptr;
    ++found->second->locks;
    return found->second->pointer;
}

void HandleHeap::Unlock(void** handle) {
    std::lock_guard<std::mutex> guard(m_mutex);
    auto found = m_live.find(handle);
    if (found != m_live.end() && found->second->locks > 0) --found->second->locks;
}

void HandleHeap::Dispose(void** handle) {
    std::lock_guard<std::mutex> guard(m_mutex);
    auto found = m_live.find(handle);
    if (found == m_live.end()) return;
    Block* block = found->second;
    m_live.erase(found);
    if (m_freeBytes + block->size <= kMaxRecycledBytes) {
        m_freeStores[block->size].push_back(block->pointer);
        m_freeBytes += block->size;
    } else {
        std::free(block->pointer);
    }
    delete block;
}

size_t HandleHeap::Size(void** handle) const {
    std::lock_guard<std::mutex> guard(m_mutex);
    auto found = m_live.find(handle);
    return found == m_live.end() ? 0 : found->second->size;
}

bool HandleHeap::Resize(void** handle, size_t size) {
    std::lock_guard<std::mutex> guard(m_mutex);
    auto found = m_live.find(handle);
    if (found == m_live.end() || size > m_limit) return false;
    Block* block = found->second;
    void* store = AllocateStore(size);
    if (!store) return false;
    std::memcpy(store, block->pointer, block->size < size ? block->size : size);
    std::free(block->pointer);
    block->pointer = store;
    block->size = size;
    return true;
}

bool HandleHeap::IsLive(void** handle) const {
    std::lock_guard<std::mutex> guard(m_mutex);
    return m_live.count(handle) != 0;
}

size_t HandleHeap::LiveCount() const {
    std::lock_guard<std::mutex> guard(m_mutex);
    return m_live.size();
}

size_t HandleHeap::LiveBytes() const {
    std::lock_guard<std::mutex> guard(m_mutex);
    size_t total = 0;
    for (const auto& [handle, block] : m_live) total += block->size;
    return total;
}

int HandleHeap::LockCount(void** handle) const {
    std::lock_guard<std::mutex> guard(m_mutex);
    auto found = m_live.find(handle);
    return found == m_live.end() ? 0 : found->second->locks;
}

std::string HandleHeap::What(void** handle) const {
    std::lock_guard<std::mutex> guard(m_mutex);
    auto found = m_live.find(handle);
    return found == m_live.end() ? std::string() : found->second->what;
}

void HandleHeap::FailNextAllocations(int count) {
    std::lock_guard<std::mutex> guard(m_mutex);
    m_failNext = count;
}

void HandleHeap::SetAllocationLimit(size_t bytes) {
    std::lock_guard<std::mutex> guard(m_mutex);
    m_limit = bytes;
}

}  // namespace refhost
