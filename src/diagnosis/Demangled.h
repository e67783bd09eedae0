#pragma once

#include <cstdlib>
#include <cxxabi.h>
#include <memory>
#include <string>

/// A class's name (std::type_info::name()) as its author wrote it; any other text as it is.
inline std::string DEMANGLED(std::string const& name)
{
    int status = 0;
    std::unique_ptr<char, decltype(&std::free)> const found(
        abi::__cxa_demangle(name.c_str(), nullptr, nullptr, &status), std::free);
    return found != nullptr ? found.get() : name;
}
