// MemoryBlock: a plain owned byte buffer for raw scratch memory.
#include "tekit/strings/MemoryBlock.h"

namespace tekit {

// The bytes come from array new; a failed allocation is not checked here (std::bad_alloc
// propagates), as callers of scratch memory expect.
MemoryBlock::MemoryBlock(unsigned int numBytes) {
    Alloc(numBytes);
}

MemoryBlock::~MemoryBlock() {
    Release();
}

void MemoryBlock::Alloc(unsigned int numBytes) {
    Release();
    m_numBytes = numBytes;
    m_data = new unsigned char[numBytes];
}

void MemoryBlock::Alloc() {
    if (!m_data)
        m_data = new unsigned char[m_numBytes];
}

void MemoryBlock::Release() {
    delete[] m_data;
    m_data = nullptr;
    m_numBytes = 0;
}

} // namespace tekit
