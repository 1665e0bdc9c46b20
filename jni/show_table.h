// The shows that Java holds by handle: one table of slots for the process.
#pragma once

#include "slideshow/SlideShow.h"

namespace pelo::bridge {

constexpr int kSlots = 100;

// A handle is a slot's index; a slot is free when its show is. The table exists from the first attempt
// to create or open a show until it is destroyed.
extern SlideShow* gShowTable;
extern int gShowCount;         // slots in use
extern int gShowTableMissing;  // 1 while there is no table

// Makes the table unless it exists; false when memory is short.
[[nodiscard]] bool provide_table();
void destroy_table();

// The first free slot, kSlots when all are in use. The table exists.
int first_free_slot();

// The slot of the show, in front of the first free slot, that records this path; otherwise that free
// slot, kSlots when all are in use. The table exists.
int slot_for_path(const char* path);

// Counts the show in when `result`, of creating or opening it in that slot, is 1. The handle or the
// result.
int admit(int slot, int result);

// Frees a slot: 1, or SlideShow::kBadHandle. Takes handles up to gShowCount itself, so that the last of
// several shows can be deleted after one in front of it.
int delete_show(int handle);

// The slot of a handle below the number of open shows, which is the bound that every other operation
// keeps; null for others. The slot may be free.
SlideShow* slot_of(int handle);

}  // namespace pelo::bridge
