// Reading an effect property list as a host does, and describing its properties for people.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "refhost/host.h"

namespace refhost {

// A short label for a property key ("name", "eVER", ...).
std::string PropertyLabel(const std::string& key);

// The property's value as text: strings as they read, numbers in hex, versions decoded.
std::string DescribeProperty(const PiplEntry& entry);

// An effect version word as "3.0.10 release build 292 (0x00185724)".
std::string DescribeEffectVersion(uint32_t version);

}  // namespace refhost
