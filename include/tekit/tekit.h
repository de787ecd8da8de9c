// tekit: the whole public interface in one include.
//
//   #include "tekit/tekit.h"
//
//   tekit::DynamicString name("report.txt");
//   char const* symbol = tekit::TEErrorToStringSymbol(tekit::TE_FILE_NOT_FOUND);
//
// Including one header per concept builds faster; this one is for programs that use much of
// the library, and it is what the package check compiles to prove every header is installed.
// Kept sorted: every header under include/tekit/<subsystem>/ is listed here.
#pragma once

#include "tekit/Export.h"

#include "tekit/errors/ComErrorInfo.h"
#include "tekit/errors/DebugOutput.h"
#include "tekit/errors/DiagnosticLevel.h"
#include "tekit/errors/LookupString.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/errors/TEError.h"
#include "tekit/errors/TEException.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/IsValidPath.h"
#include "tekit/paths/Path.h"
#include "tekit/paths/PathBase.h"
#include "tekit/paths/PathVector.h"
#include "tekit/paths/StaticPath.h"
#include "tekit/platform/WinTypes.h"
#include "tekit/strings/BufferString.h"
#include "tekit/strings/CopyOnWriteMemory.h"
#include "tekit/strings/DecimalPoint.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/FormatStringAnalysis.h"
#include "tekit/strings/GlobalConstantDynamicString.h"
#include "tekit/strings/MemoryBlock.h"
#include "tekit/strings/MultiByte.h"
#include "tekit/strings/StaticString.h"
#include "tekit/strings/String.h"
#include "tekit/strings/StringVector.h"
