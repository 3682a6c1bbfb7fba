#pragma once

// Result codes of the host's element operations (addProperty, addModifier, addShape, ...).
namespace SgResult {
inline constexpr int Ok = 0;          // the operation succeeded
inline constexpr int Failed = 1;      // invalid argument or the item is owned elsewhere
inline constexpr int NameExists = 82; // an item of that name already exists on the element
} // namespace SgResult
