/* The minimal host in plain C. It needs only the kernel's two headers.
 *
 *   host PLUG-IN DICTIONARY KEY
 */
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "VarnelKernel.h"
#include "VarnelKernelHost.h"

#define TRANSLATOR "orvane.localizable-strings."

/* Exits if a call fails. */
static void Check(VRKResult result, const char* what) {
  if (result == 0) return;
  fprintf(stderr, "host: %s (result %u)\n", what, result);
  exit(1);
}

static VRKToken Token(const char* text) {
  VRKToken token;
  Check(VRKTokenCreate(text, 0, &token), text);
  return token;
}

/* Reads a file of less than 1 MiB into 16-bit units. A 0 follows an odd last byte. */
static char* ReadUnits(const char* name, uint32_t* outByteCount) {
  static char bytes[1 << 20];
  FILE* const file = fopen(name, "rb");
  const size_t size = file != NULL ? fread(bytes, 1, sizeof bytes, file) : 0;
  Check(file != NULL && feof(file) && !ferror(file) ? 0 : kVRKNotFound, name);
  fclose(file);
  *outByteCount = (uint32_t)(size + size % 2);
  return bytes;
}

/* Sends a message with at most one parameter. Returns the parameters, which hold the result. */
static VRKDictionary Send(VRKObject object, const char* message, const char* parameter,
                          VRKData data) {
  VRKDictionary parameters;
  Check(VRKDictionaryCreate(0, &parameters), message);
  if (parameter != NULL) {
    Check(VRKDictionarySetEntry(parameters, Token(parameter), data), parameter);
  }
  Check(VRKObjectDeliverMessage(object, Token(message), parameters, 1), message);
  VRKDataRelease(data);
  return parameters;
}

static VRKData NewData(const char* type, const void* bytes, uint32_t byteCount) {
  VRKData data;
  Check(VRKDataCreate(Token(type), bytes, byteCount, 0, &data), type);
  return data;
}

static void Print(const char* way, VRKData data) {
  VRKData text;
  const void* bytes;
  uint32_t byteCount;
  Check(VRKDataCoerce(data, Token("type:orvane.vrk.utf8"), &text), way);
  Check(VRKDataGetData(text, &bytes, &byteCount, NULL), way);
  printf("%s: %.*s\n", way, (int)byteCount, (const char*)bytes);
  VRKDataRelease(text);
}

static void Translate(VRKObject translator, const char* dictionary, const char* key) {
  uint32_t byteCount;
  const char* const image = ReadUnits(dictionary, &byteCount);
  const uint32_t keyLength = (uint32_t)strlen(key);
  VRKDictionary parameters;
  VRKData data, result;

  /* The dictionary is sent byte for byte, as units. */
  data = NewData("type:orvane.vrk.utf16", image, byteCount);
  VRKDictionaryRelease(Send(translator, "message:" TRANSLATOR "set-translations",
                            "parameter:" TRANSLATOR "translations", data));

  /* By message. The translation ends in a 0 unit. */
  data = NewData("type:orvane.vrk.utf8", key, keyLength);
  parameters = Send(translator, "message:" TRANSLATOR "translate-string",
                    "parameter:" TRANSLATOR "translation-key", data);
  Check(VRKDictionaryGetEntry(parameters, Token("parameter:orvane.vrk.message-result"), &result),
        "result");
  Print("message", result);
  VRKDictionaryRelease(parameters);

  /* By coercion: reading key data as text translates it with the default translator. */
  VRKDictionaryRelease(Send(translator, "message:" TRANSLATOR "make-default", NULL, 0));
  data = NewData("type:" TRANSLATOR "locale-independent-utf8", key, keyLength);
  Print("coercion", data);
  VRKDataRelease(data);
}

int main(int argc, char** argv) {
  static const VRKHostLiveCounts nothing;
  VRKHostLiveCounts left;
  VRKPlugIn plugIn;
  VRKObject translator;
  VRKResult loaded;
  if (argc != 4) return fputs("usage: host PLUG-IN DICTIONARY KEY\n", stderr), 2;
  Check(VRKHostStart(), "start");
  loaded = VRKHostPlugInLoad(argv[1], "VRKKolvanes", &plugIn);
  Check(loaded, loaded == kVRKNotFound ? VRKHostLoadError() : argv[1]);
  Check(VRKHostPlugInInitialize(plugIn), "initialise");
  Check(VRKObjectCreate(Token("class:" TRANSLATOR "string-translator"), 0, &translator), "create");
  Translate(translator, argv[2], argv[3]);
  Check(VRKObjectRelease(translator), "release");
  Check(VRKHostPlugInTerminate(plugIn), "terminate");
  Check(VRKHostPlugInUnload(plugIn), "unload");
  Check(VRKHostShutDown(&left), "shut down");
  return memcmp(&left, &nothing, sizeof left) != 0;
}
