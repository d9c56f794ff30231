#pragma once

#include <orv/devMDPropertyAny.h>
#include <orv/rcShdPtr.h>
#include <string>

namespace MediaHost {

/// Properties of any type as text; vectors of signed chars are texts.
///
/// - Errors: what the property and its device throw; MediaError for a text that is no value of its type.
namespace PropertyText {

using Property = Orv::RCShdPtr<Orv::DevMDPropertyAny>;

std::string getTypeName(const Property& property);  ///< Such as "double" or "float[]".

// These wait for the device, at most so long.
std::string get(const Property& property, double seconds);
void set(const Property& property, const std::string& value, double seconds);

}  // namespace PropertyText
}  // namespace MediaHost
