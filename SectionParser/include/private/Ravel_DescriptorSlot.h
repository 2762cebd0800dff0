// A table or record keeps the descriptors it knows in pointer members, one of
// each kind: a later descriptor of the same kind replaces the one held, and a
// copy of the object copies each one held through its class's copy constructor.
#ifndef RAVEL_DESCRIPTORSLOT_H
#define RAVEL_DESCRIPTORSLOT_H

// A copy of the descriptor, or null when there is none.
template <class T>
T* RavelDescriptorSlot_CopyOf(T* source) {
  return source != 0 ? new T(*source) : 0;
}

// Releases the descriptor held and leaves the slot empty.
template <class T>
void RavelDescriptorSlot_Release(T*& slot) {
  delete slot;
  slot = 0;
}

// Releases the descriptor held and keeps one built from `raw` instead.
template <class T>
void RavelDescriptorSlot_Replace(T*& slot, unsigned char* raw) {
  RavelDescriptorSlot_Release(slot);
  slot = new T(raw);
}

// Releases the descriptor held and keeps a copy of `source` (or none).
template <class T>
void RavelDescriptorSlot_CopyFrom(T*& slot, T* source) {
  RavelDescriptorSlot_Release(slot);
  slot = RavelDescriptorSlot_CopyOf(source);
}

#endif
