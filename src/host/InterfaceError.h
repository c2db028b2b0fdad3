#pragma once

#include <cstdint>
#include <stdexcept>
#include <string>

namespace host
{

/// A call of the host that failed. It passes through the component up to its border, where the host shows it.
class InterfaceError : public std::runtime_error
{
public:
    InterfaceError(std::int32_t result, std::string interfaceName)
        : std::runtime_error(interfaceName + " failed with " + std::to_string(result)),
          resultCode(result),
          interfaceId(std::move(interfaceName))
    {
    }

    std::int32_t ResultCode() const { return resultCode; }
    const std::string& InterfaceId() const { return interfaceId; }

private:
    std::int32_t resultCode;
    std::string interfaceId;
};

} // namespace host
