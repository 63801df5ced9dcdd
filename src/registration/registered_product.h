// The product as the registry knows it: what the setup program reads, writes and tests there.
#pragma once

#include <cstdint>

#include "core/context.h"

// Reads the product's directory and language into the record, and sets its productFound. Returns 1,
// or 0 when no tree or no directory is registered; with a null record 1 for any tree.
int ReadRegisteredProduct(SetupRequest* record);

// Makes the tree if there is none and writes directory and language. Returns 1 or
// StatusNotRegistered, also for a null context or an empty installDir.
StatusCode RegisterProduct(const SetupContext* context);

// Deletes the tree, unless a service is registered. Always 1.
int UnregisterProduct();

// 1 when no service is registered; else 0, with the names joined by "," in the buffer: those ahead
// of the first one that 519 bytes can't take. 0 with an empty text when the list can't be read to
// its end. The buffer may be null, and stays as it was when the text doesn't fit in `size` bytes.
int CheckDependingServices(char* buffer, int32_t size);

// Between the registry's language numbers and the run's: an unknown number is French, an unknown
// language English.
int32_t LanguageFromRegistry(int32_t number);
int32_t LanguageToRegistry(int32_t language);
