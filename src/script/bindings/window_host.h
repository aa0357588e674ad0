// What the globals of a page ask of its view. Implemented by the view; outlives the window.
#pragma once

namespace qorvex::dom {

class IWindowHost {
  public:
    virtual ~IWindowHost() = default;

    // The view's present time in milliseconds: the client's time callback, else the time of the last Advance.
    virtual double GetTime() const = 0;
    virtual const char* GetUserAgent() const = 0;
};

}  // namespace qorvex::dom
