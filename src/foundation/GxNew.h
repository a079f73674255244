#pragma once

namespace Glimmer {

// Empty root of the library's small value classes, so that any of them can be
// deleted through a base pointer.
class GxNew {
public:
    virtual ~GxNew() {}
};

}  // namespace Glimmer
