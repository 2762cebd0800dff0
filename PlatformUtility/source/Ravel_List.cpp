#include "Ravel_List.h"

#include <cstdlib>

extern "C" void list_initialize(list_head* head) {
  if (head == 0) return;
  head->count = 0;
  head->elements = 0;
  head->size = 0;
  head->capacity = 0;
  head->release = 0;
}

extern "C" void list_set_release(list_head* head, list_release_function release) {
  if (head != 0) head->release = release;
}

extern "C" void list_insert(list_head* head, void* element) {
  if (head == 0) return;
  if (head->size == head->capacity) {
    unsigned int capacity = head->capacity ? head->capacity * 2 : 4;
    void** grown = static_cast<void**>(std::realloc(head->elements, capacity * sizeof(void*)));
    if (grown == 0) return;
    head->elements = grown;
    head->capacity = capacity;
  }
  head->elements[head->size++] = element;
  head->count = static_cast<unsigned char>(head->size);
}

extern "C" void* list_element(list_head* head, int index) {
  if (head == 0 || index < 0 || static_cast<unsigned int>(index) >= head->size) return 0;
  return head->elements[index];
}

extern "C" void list_removeAll(list_head* head) {
  if (head == 0) return;
  if (head->release != 0) {
    for (unsigned int i = 0; i < head->size; ++i) head->release(head->elements[i]);
  }
  std::free(head->elements);
  head->elements = 0;
  head->size = 0;
  head->capacity = 0;
  head->count = 0;
}
