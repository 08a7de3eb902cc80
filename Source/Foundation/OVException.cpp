#include <Orvane/OVException.h>

OVException::OVException(const std::string& text) : std::runtime_error(text) {}
OVException::~OVException() = default;
