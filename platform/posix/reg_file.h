// The registry of the POSIX build: a text file in the Windows registry-export format.
//
//   Windows Registry Editor Version 5.00
//
//   [HKEY_CURRENT_USER\Software\Orvane\Velatone 3\Plug-in\Settings]
//   "Undo Depth"=dword:0000001e
//   "Video System"="PAL"
//   "Primary LUT"=hex:00,01,02,03,04     (long lists continue after a trailing backslash)
//   "Raw Text"=hex(1):50,41,4c
//
// Key paths and value names compare without regard to ASCII case, as Windows compares them.
#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "platform/registry.h"

namespace vt::posix {

struct RegValue {
    std::string name;
    RegistryType type = RegistryType::kNone;
    std::vector<uint8_t> data;
};

struct RegKey {
    std::string path;  // lower case, root spelled out: "hkey_current_user\software\..."
    std::vector<RegValue> values;
};

// Called once for every line that is skipped, with its 1-based number and the reason.
using RegSkipReporter = std::function<void(int line, const char* reason)>;

// Turns the file's bytes into text: UTF-16 little-endian files (with their byte-order mark), as
// the registry editor writes them, become single bytes; a UTF-8 byte-order mark is dropped.
std::string DecodeRegFileBytes(std::span<const uint8_t> bytes);

// Parses the text; a malformed line is reported and skipped, never stopping the other values.
std::vector<RegKey> ParseRegFile(std::string_view text, const RegSkipReporter& onSkip = {});

// The full lower-case path of a key under a root.
std::string RegKeyPath(RegistryRoot root, std::string_view path);

}  // namespace vt::posix
