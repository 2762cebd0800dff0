// The descriptor factory and copier offered to the caller, over one tag table of
// seventeen descriptor classes. The library's own tables construct the classes
// they know directly; stream-event loops must never use the factory, since
// tag 0x40 is a General Event there and a Network Name here.
#ifndef RAVEL_CDESCRIPTORS_H
#define RAVEL_CDESCRIPTORS_H

#include "Ravel_CDescriptorBase.h"

// A new descriptor of the class that the tag (byte 0) selects, owned by the
// caller; null for a null pointer or a tag outside the table.
RavelCDescriptorBase* RavelSM_GetDescriptor(unsigned char* raw);

// A deep copy of `source`, of the class that its header's tag selects, owned by
// the caller; null for a tag outside the table. `source` must not be null.
RavelCDescriptorBase* RavelSM_CopyDescriptor(RavelCDescriptorBase* source);

#endif
