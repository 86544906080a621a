// What a command needs to know of the console it may be talking to.
#pragma once

namespace platform {

bool StandardInputIsTerminal() noexcept;

}  // namespace platform
