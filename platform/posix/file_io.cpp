// Whole-file reads and writes through the POSIX calls; errno is reported as the Win32 error code
// that the same failure gives on Windows.
#include "platform/file_io.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <new>

namespace vt {

namespace {

uint32_t Win32Code(int error) {
    switch (error) {
        case ENOENT: return kFileErrorNotFound;
        case ENOTDIR: return kFileErrorPathNotFound;
        case EMFILE:
        case ENFILE: return kFileErrorTooManyOpen;
        case EACCES:
        case EPERM:
        case EISDIR: return kFileErrorAccessDenied;
        case ENOMEM: return kFileErrorOutOfMemory;
        case EROFS: return kFileErrorWriteProtect;
        case ENOSPC: return kFileErrorDiskFull;
        case ENAMETOOLONG: return kFileErrorNameTooLong;
        default: return kFileErrorGeneral;
    }
}

class FileDescriptor {
public:
    explicit FileDescriptor(int fd) : m_fd(fd) {}
    ~FileDescriptor() {
        if (m_fd >= 0) close(m_fd);
    }
    FileDescriptor(const FileDescriptor&) = delete;
    FileDescriptor& operator=(const FileDescriptor&) = delete;
    int get() const { return m_fd; }
    // Closes now, so that a failure to flush is seen; false with errno set on failure.
    bool Close() {
        const int fd = m_fd;
        m_fd = -1;
        return close(fd) == 0;
    }

private:
    int m_fd;
};

}  // namespace

uint32_t ReadFileBytes(const char* path, size_t maxBytes, FileShare /*share*/, std::vector<uint8_t>* bytes,
                       bool* complete) {
    if (bytes == nullptr) return kFileErrorGeneral;
    bytes->clear();
    if (complete) *complete = false;
    if (path == nullptr || *path == '\0') return kFileErrorNotFound;
    FileDescriptor file(open(path, O_RDONLY | O_CLOEXEC));
    if (file.get() < 0) return Win32Code(errno);
    struct stat info {};
    if (fstat(file.get(), &info) != 0) return Win32Code(errno);
    // A folder opens on POSIX but not on Windows: refuse it the way Windows does.
    if (S_ISDIR(info.st_mode)) return kFileErrorAccessDenied;
    try {
        // The size is a hint only (pipes and special files have none); the read decides.
        size_t hint = info.st_size > 0 ? static_cast<size_t>(info.st_size) : 0;
        bytes->reserve(hint < maxBytes ? hint : maxBytes);
        uint8_t chunk[65536];
        for (;;) {
            const ssize_t got = read(file.get(), chunk, sizeof chunk);
            if (got < 0) {
                if (errno == EINTR) continue;
                const uint32_t code = Win32Code(errno);
                bytes->clear();
                return code;
            }
            if (got == 0) {
                if (complete) *complete = true;
                break;
            }
            const size_t room = maxBytes - bytes->size();
            const size_t take = static_cast<size_t>(got) < room ? static_cast<size_t>(got) : room;
            bytes->insert(bytes->end(), chunk, chunk + take);
            if (take < static_cast<size_t>(got)) break;  // more than maxBytes: the rest stays unread
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
    FileDescriptor file(open(path, O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666));
    if (file.get() < 0) return Win32Code(errno);
    const auto* next = static_cast<const uint8_t*>(data);
    size_t left = size;
    while (left > 0) {
        const ssize_t put = write(file.get(), next, left);
        if (put < 0) {
            if (errno == EINTR) continue;
            return Win32Code(errno);
        }
        next += put;
        left -= static_cast<size_t>(put);
    }
    if (!file.Close()) return Win32Code(errno);
    return kFileErrorNone;
}

}  // namespace vt
