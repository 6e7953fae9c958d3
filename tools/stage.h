// One thing that is done to every frame between source and sink.
#pragma once

#include <string>

#include "tools/picture.h"

namespace tools {

class Stage {
  public:
    virtual ~Stage() = default;
    /// The shape of what run() returns.
    virtual Shape out() const = 0;
    /// The result stays valid until the next call.
    virtual Picture &run(Picture &from) = 0;
    /// For --verbose.
    virtual std::string text() const = 0;
};

}  // namespace tools
