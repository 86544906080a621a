// How translators are spoken to through the kernel. A translator is a kernel object of one of two
// classes, which takes three messages. Parameters and results are in the dictionary that is
// delivered with the message. 0 is the result of a message that was taken, kVRKNotHandled that of
// one that no translator took, and with any other no result is written.
#pragma once

namespace Varnel {

// Every object has a translator of its own.
inline constexpr char kClassStringTranslator[] =
    "class:orvane.localizable-strings.string-translator";

// Every object shares the translator that is the default when the object is created. Once that
// translator is dead, all messages to the object fail with kResultInvariantViolation. So do the
// creation of objects of this class and the coercion of keys as long as the default translator is a
// dead one, until another is made the default.
inline constexpr char kClassDefaultStringTranslator[] =
    "class:orvane.localizable-strings.string-translator.default";

// Makes the object's translator the default. Takes nothing and answers nothing.
inline constexpr char kMessageMakeDefault[] = "message:orvane.localizable-strings.make-default";

// Loads kParameterTranslations: the image of a dictionary, as data that can be coerced to
// "type:orvane.vrk.utf16". The bytes of that data, in memory's order, are the image. Answers
// nothing; a damaged image is no failure.
inline constexpr char kMessageSetTranslations[] =
    "message:orvane.localizable-strings.set-translations";
inline constexpr char kParameterTranslations[] =
    "parameter:orvane.localizable-strings.translations";

// Translates kParameterTranslationKey: a key in UTF-8, as data that can be coerced to
// "type:orvane.vrk.utf8", with or without a terminating NUL. Answers with kParameterMessageResult,
// "type:orvane.vrk.utf16le" data of the translation and one 0 unit.
inline constexpr char kMessageTranslateString[] =
    "message:orvane.localizable-strings.translate-string";
inline constexpr char kParameterTranslationKey[] =
    "parameter:orvane.localizable-strings.translation-key";
inline constexpr char kParameterMessageResult[] = "parameter:orvane.vrk.message-result";

// Data that holds a key in UTF-8, and that the kernel coerces to text of other types by having the
// default translator translate it.
inline constexpr char kTypeLocaleIndependentUTF8[] =
    "type:orvane.localizable-strings.locale-independent-utf8";

}  // namespace Varnel
