#include "rklib/RkMemory.h"

#include <cstdlib>
#include <new>

void* rkmalloc(std::size_t inSize)
{
    void* block = std::malloc(inSize ? inSize : 1);
    if (!block)
        throw std::bad_alloc();
    return block;
}

void* rkrealloc(void* inBlock, std::size_t inSize)
{
    void* block = std::realloc(inBlock, inSize ? inSize : 1);
    if (!block)
        throw std::bad_alloc();
    return block;
}

void rkfree(void* inBlock)
{
    std::free(inBlock);
}
