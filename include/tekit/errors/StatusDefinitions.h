// Row macros for status-code definition files.
//
// A family of codes (the TEError codes, and each flat interface's status codes) is listed once,
// in a `.def` file whose rows name the symbol, the value, the message key and the English text.
// Its enum, its lookup table and its message-table section are generated from that one file by
// defining the row macro before each include:
//
//   enum IniStatus : std::int32_t {
//   #define INI_STATUS(symbol, value, key, text) TEKIT_STATUS_ENUMERATOR(symbol, value)
//   #include "tekit/ini/IniStatus.def"
//   };
//
// The generated lists always agree, and adding a code is one row of one file.
#pragma once

/// `symbol = value,`: one enumerator.
#define TEKIT_STATUS_ENUMERATOR(symbol, value) symbol = value,
/// `{"KEY", "text"},`: one row of a message-table section.
#define TEKIT_STATUS_MESSAGE(key, text) {key, text},
