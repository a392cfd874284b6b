#pragma once

#include <string_view>

namespace zr {

/// Whether anybody wants reports: asked before a report's text is put together.
bool diagnosticsWanted();

/// Hands one report to whoever asked for them.
void diagnose(std::u16string_view report);

}  // namespace zr
