// Font files for the font manager, through the client's resource handler.
#pragma once

#include "layout/fonts/font_resource_loader.h"
#include "resources/resource_context.h"

namespace qorvex {

class FontLoader final : public layout::IFontResourceLoader {
  public:
    explicit FontLoader(ResourceContext& context) : context_(context) {}
    TaskPtr RequestFont(const URL& url, Callback done) override;

  private:
    ResourceContext& context_;
};

}  // namespace qorvex
