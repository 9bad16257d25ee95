// Whole-file reads and writes through CreateFile; failures report GetLastError as it is.
#include "platform/file_io.h"

#include <windows.h>

#include <new>

namespace vt {

namespace {

class FileHandle {
public:
    explicit FileHandle(HANDLE handle) : m_handle(handle) {}
    ~FileHandle() {
        if (m_handle != INVALID_HANDLE_VALUE) CloseHandle(m_handle);
    }
    FileHandle(const FileHandle&) = delete;
    FileHandle& operator=(const FileHandle&) = delete;
    HANDLE get() const { return m_handle; }
    bool valid() const { return m_handle != INVALID_HANDLE_VALUE; }

private:
    HANDLE m_handle;
};

uint32_t LastError() {
    const DWORD error = GetLastError();
    return error != 0 ? static_cast<uint32_t>(error) : kFileErrorGeneral;
}

}  // namespace

uint32_t ReadFileBytes(const char* path, size_t maxBytes, FileShare share, std::vector<uint8_t>* bytes,
                       bool* complete) {
    if (bytes == nullptr) return kFileErrorGeneral;
    bytes->clear();
    if (complete) *complete = false;
    if (path == nullptr || *path == '\0') return kFileErrorNotFound;
    const DWORD shareMode = share == FileShare::kExclusive ? 0 : (FILE_SHARE_READ | FILE_SHARE_WRITE);
    FileHandle file(
        CreateFileA(path, GENERIC_READ, shareMode, nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file.valid()) return LastError();
    try {
        LARGE_INTEGER size{};
        if (GetFileSizeEx(file.get(), &size) && size.QuadPart > 0) {
            const auto hint = static_cast<unsigned long long>(size.QuadPart);
            bytes->reserve(hint < maxBytes ? static_cast<size_t>(hint) : maxBytes);
        }
        uint8_t chunk[65536];
        for (;;) {
            DWORD got = 0;
            if (!ReadFile(file.get(), chunk, sizeof chunk, &got, nullptr)) {
                const uint32_t code = LastError();
                bytes->clear();
                return code;
            }
            if (got == 0) {
                if (complete) *complete = true;
                break;
            }
            const size_t room = maxBytes - bytes->size();
            const size_t take = got < room ? got : room;
            bytes->insert(bytes->end(), chunk, chunk + take);
            if (take < got) break;  // more than maxBytes: the rest stays unread
        }
    } catch (const std::bad_alloc&) {
        bytes->clear();
        bytes->shrink_to_fit();
        return kFileErrorOutOfMemory;
    }
    return kFileErrorNone;
}

uint32_t WriteFileBytes(const char* path, const void* data, size_t size) {
    if (path == nullptr || *path == '\0') return kFileErrorPathNotFound;
    if (data == nullptr && size > 0) return kFileErrorGeneral;
    FileHandle file(CreateFileA(path, GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file.valid()) return LastError();
    const auto* next = static_cast<const uint8_t*>(data);
    size_t left = size;
    while (left > 0) {
        const DWORD step = left > 0x40000000 ? 0x40000000 : static_cast<DWORD>(left);
        DWORD put = 0;
        if (!WriteFile(file.get(), next, step, &put, nullptr)) return LastError();
        if (put == 0) return kFileErrorDiskFull;
        next += put;
        left -= put;
    }
    return kFileErrorNone;
}

}  // namespace vt
