// Loads a fresh copy of the built module into a reference host presenting a chosen host identity.
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "refhost/host.h"

namespace vt::test {

// The module file under test: VELATONE_MODULE when set, else the one this build made.
std::string ModulePath();

// A persona by name, with an optional API version "major.minor".
refhost::HostPersona Persona(const std::string& name, const std::string& api = "");

// Loads the module into a host of the given persona; fails the test when it cannot.
std::unique_ptr<refhost::Host> LoadHost(const refhost::HostPersona& persona);

}  // namespace vt::test
