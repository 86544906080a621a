// The message protocol of translator objects: two classes and three messages. A translator object
// is the kernel object that receives the messages; a translator is the plug-in's C++ object behind
// it. Parameters and results are entries of the message's parameter dictionary (VRKDictionary). A
// delivery returns 0 if the message was handled, kVRKNotHandled if no translator handled it, and
// otherwise a failure code; a failed message stores no result. A missing parameter fails with
// kVRKNotFound, and one that cannot be coerced with kResultInputContractViolation.
#pragma once

namespace Varnel {

// Each object has its own translator.
inline constexpr char kClassStringTranslator[] =
    "class:orvane.localizable-strings.string-translator";

// Each object shares the translator that is the default when the object is created. Once that
// translator is destroyed, all messages to the object fail with kResultInvariantViolation. Creating
// objects of this class and coercing keys fail with it until another translator is the default.
inline constexpr char kClassDefaultStringTranslator[] =
    "class:orvane.localizable-strings.string-translator.default";

// Makes the object's translator the default. No parameters, no result.
inline constexpr char kMessageMakeDefault[] = "message:orvane.localizable-strings.make-default";

// Loads the dictionary image in kParameterTranslations, data that can be coerced to
// "type:orvane.vrk.utf16". The bytes of the coerced data are the image. No result. A damaged image
// is no failure.
inline constexpr char kMessageSetTranslations[] =
    "message:orvane.localizable-strings.set-translations";
inline constexpr char kParameterTranslations[] =
    "parameter:orvane.localizable-strings.translations";

// Translates the key in kParameterTranslationKey, data that can be coerced to
// "type:orvane.vrk.utf8", with or without a terminating NUL. Stores kParameterMessageResult:
// "type:orvane.vrk.utf16le" data of the translation followed by one 0 unit.
inline constexpr char kMessageTranslateString[] =
    "message:orvane.localizable-strings.translate-string";
inline constexpr char kParameterTranslationKey[] =
    "parameter:orvane.localizable-strings.translation-key";
inline constexpr char kParameterMessageResult[] = "parameter:orvane.vrk.message-result";

// The type of data that holds a UTF-8 key. The kernel coerces it to text by translating the key
// with the default translator.
inline constexpr char kTypeLocaleIndependentUTF8[] =
    "type:orvane.localizable-strings.locale-independent-utf8";

}  // namespace Varnel
