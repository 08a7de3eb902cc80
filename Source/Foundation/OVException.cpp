#include <Orvane/OVException.h>

OVException::OVException(const std::string& text) : std::runtime_error(text) {}
OVException::OVException(const std::string& text, const OVError& error)
    : std::runtime_error(text), mError(std::make_shared<const OVError>(error)) {}
OVException::~OVException() = default;
