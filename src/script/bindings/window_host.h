// What the globals of a page ask of its view. Implemented by the view; outlives the window.
#pragma once

#include <qorvex/logging.h>

#include <string_view>

namespace qorvex::dom {

class IWindowHost {
  public:
    virtual ~IWindowHost() = default;

    // The view's present time in milliseconds: the client's time callback, else the time of the last Advance.
    virtual double GetTime() const = 0;
    virtual const char* GetUserAgent() const = 0;
    // A console call of the page. True: the host has taken the line, and it stays out of the log.
    virtual bool OnConsoleLine(Logging::Severity, std::string_view) { return false; }
};

}  // namespace qorvex::dom
