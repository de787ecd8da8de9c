// Text in a caller's buffer: never allocates, never frees, silently truncates.
//
//   char out[32];
//   BufferString text(out, sizeof out);
//   text = "written into out";
//
// A size given as negative means unknown: the buffer is then taken to hold exactly its current
// text and terminator. A read-only buffer string is for reading a caller's constant text.
#pragma once

#include "tekit/strings/String.h"

namespace tekit {

class TEKIT_API BufferString : public String {
public:
    BufferString();
    /// The buffer keeps its contents: it may already hold the text to work on.
    BufferString(char* buffer, int size);
    /// Read-only view of constant text.
    BufferString(char const* buffer, int size);
    BufferString(char* buffer, char const* initial, int size);
    BufferString(char* buffer, String const& initial, int size);

    virtual BufferString& operator=(String const& other);
    BufferString& operator=(char const* text);

    void SetBuffer(char* buffer, int size);
    void SetBuffer(char const* buffer, int size);
    void SetReadOnly(bool readOnly) { m_readOnly = readOnly; }
    bool GetReadOnly() const { return m_readOnly; }
    /// Moves the start of the buffer forward by `numChars` characters, never past the
    /// terminator of the text in it: for writing a sequence of strings into one buffer.
    void AdvanceBuffer(int numChars);

    char const* GetBufferReadPtr() const override;
    /// Raises TE_PROGRAM_ERROR through the string assertion when the buffer is read-only.
    char* GetBufferWritePtr() override;
    int GetBufferSize() const override;
    int RequestBufferSize(int numBytes, bool keepContents, bool exactSize) override;

private:
    char* m_buffer = nullptr;
    int m_size = 0;
    bool m_readOnly = false;
};

} // namespace tekit
