// One thing that is done to every frame between source and sink.
#ifndef TOOLS_STAGE_H
#define TOOLS_STAGE_H

#include <string>

#include "tools/picture.h"

namespace tools {

class stage {
  public:
    virtual ~stage() = default;
    // The shape of what run() returns.
    virtual picture_shape out() const = 0;
    // The result stays valid until the next call.
    virtual picture &run(picture &from) = 0;
    // For --verbose.
    virtual std::string text() const = 0;
};

}  // namespace tools

#endif
