// A plain list of element pointers. The head's first member is the 8-bit element
// count that its users read directly. The list owns its elements: emptying it
// releases each one through the release function given at initialisation.
#ifndef RAVEL_LIST_H
#define RAVEL_LIST_H

typedef void (*list_release_function)(void* element);

typedef struct list_head {
  unsigned char count;  // wraps past 255, as the 8-bit field it is
  void** elements;
  unsigned int size;
  unsigned int capacity;
  list_release_function release;
} list_head;

#ifdef __cplusplus
extern "C" {
#endif

void list_initialize(list_head* head);
// Elements removed by list_removeAll are passed to `release` (none when it is null).
void list_set_release(list_head* head, list_release_function release);
void list_insert(list_head* head, void* element);
// Null when index is outside the list.
void* list_element(list_head* head, int index);
void list_removeAll(list_head* head);

#ifdef __cplusplus
}
#endif

#endif
