#pragma once

#include "rklib/rklib_export.h"

#include <cstddef>

// The core runtime layer's allocator; rkmalloc/rkrealloc throw std::bad_alloc on exhaustion.
RKLIB_EXPORT void* rkmalloc(std::size_t inSize);
RKLIB_EXPORT void* rkrealloc(void* inBlock, std::size_t inSize);
RKLIB_EXPORT void rkfree(void* inBlock);
