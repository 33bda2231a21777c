// Makes the parser fail in tests, as too little memory would.
#pragma once

#include <functional>

namespace kest::xml {

/// Sets a function that is called before each text is parsed. If it returns true, the text counts as unreadable. An
/// empty function turns this off.
void setParseFault(std::function<bool()> fault);

}  // namespace kest::xml
