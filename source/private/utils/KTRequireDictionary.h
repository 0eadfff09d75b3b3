// KTRequireDictionary.h: what becomes of a process-wide dictionary that could not be made.

#pragma once

class IKTStringDictionary;
class KTStringDictionary;

/// The dictionary as a reference. Null is reported as an assertion and thrown as KTLCException (kKTErrorInternal).
IKTStringDictionary &KTRequireDictionary(KTStringDictionary *dictionary);
