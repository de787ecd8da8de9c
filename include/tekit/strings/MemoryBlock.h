// A plain owned byte buffer for callers that need raw scratch memory.
//
//   MemoryBlock scratch(256);
//   std::memset(scratch.GetPtr(), 0, scratch.GetNumBytes());
#pragma once

#include "tekit/Export.h"

#include <cstdint>

namespace tekit {

class TEKIT_API MemoryBlock {
public:
    MemoryBlock() = default;
    explicit MemoryBlock(unsigned int numBytes);
    MemoryBlock(MemoryBlock const&) = delete;
    MemoryBlock& operator=(MemoryBlock const&) = delete;
    ~MemoryBlock();

    /// Frees what is held, records `numBytes` and allocates that many bytes.
    void Alloc(unsigned int numBytes);
    /// Allocates the recorded byte count, only if nothing is held yet.
    void Alloc();
    /// Frees the bytes and sets pointer and count to 0.
    void Release();

    void* GetPtr() const { return m_data; }
    char* GetCharPtr() const { return reinterpret_cast<char*>(m_data); }
    std::int32_t* GetInt32Ptr() const { return reinterpret_cast<std::int32_t*>(m_data); }
    unsigned int GetNumBytes() const { return m_numBytes; }

private:
    unsigned char* m_data = nullptr;
    unsigned int m_numBytes = 0;
};

} // namespace tekit
