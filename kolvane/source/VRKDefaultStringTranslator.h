// The process-wide default translator.
#pragma once

#include <boost/shared_ptr.hpp>
#include <boost/weak_ptr.hpp>

#include "kolvane/api/VRKStringTranslatorInterface.h"
#include "wrapper-framework/source/Values.h"

namespace Varnel::LocalizableStrings {

class StringTranslatorImpl;

// The latest default translator. Expired if it was destroyed; empty until there is one.
extern boost::weak_ptr<StringTranslatorImpl> gDefaultStringTranslator;

// Locks the translator for an operation. Throws: InvariantViolation if it was destroyed.
boost::shared_ptr<StringTranslatorInterface> LockTranslator(
    const boost::weak_ptr<StringTranslatorImpl>& translator);

// Returns a translator that forwards to the current default translator, also if another one becomes
// the default later. It does not keep that translator alive: its operations throw
// InvariantViolation once that is destroyed. `parameters` are ignored. Throws: InvariantViolation
// if there is no default translator.
boost::shared_ptr<StringTranslatorInterface> GetDefaultStringTranslator(
    orvane::dictionary_t const& parameters);

}  // namespace Varnel::LocalizableStrings
