// The translator that translates for all who have none of their own.
#pragma once

#include <boost/shared_ptr.hpp>
#include <boost/weak_ptr.hpp>

#include "VRKStringTranslatorInterface.h"
#include "Values.h"

namespace Varnel::LocalizableStrings {

class StringTranslatorImpl;

// The translator that was made the default last, which may have died since; empty until there is
// one.
extern boost::weak_ptr<StringTranslatorImpl> gDefaultStringTranslator;

// The translator, for the length of an operation. Throws InvariantViolation when it is dead.
boost::shared_ptr<StringTranslatorInterface> LiveTranslator(
    const boost::weak_ptr<StringTranslatorImpl>& translator);

// What stands for the translator that is the default now, whatever becomes the default later, and
// does not keep it alive: once that translator is dead, all operations throw InvariantViolation. So
// does this one. The parameters are not used.
boost::shared_ptr<StringTranslatorInterface> GetDefaultStringTranslator(
    orvane::dictionary_t const& parameters);

}  // namespace Varnel::LocalizableStrings
