#pragma once

#include <Orvane/OVBase.h>
#include <Orvane/OVError.h>

#include <memory>
#include <stdexcept>
#include <string>

/// What the library throws at an application: a call failed that gives no other sign of failure,
/// or the application broke a rule of the interface. `what()` tells what happened, in English.
class OV_EXPORT OVException : public std::runtime_error {
 public:
    /// Without more than the text.
    explicit OVException(const std::string& text);
    /// The same with what it was that failed.
    OVException(const std::string& text, const OVError& error);
    OVException(const OVException&) = default;
    OVException& operator=(const OVException&) = default;
    /// Defined in the library, so that the class has one identity in it and all applications.
    ~OVException() override;

    /// What it was that failed; null where nothing more is known than the text. As long as this.
    const OVError* error() const { return mError.get(); }

 private:
    std::shared_ptr<const OVError> mError;
};
