// How to read this room: layout.cpp fixes the sizes at the start, view.cpp says what each control makes
// of them; both are arithmetic on the state alone. start.cpp decodes, control.cpp takes a step and
// draws, draw.cpp scales from the zoom image into the caller's display; zoomed_image.cpp and refresh.cpp
// serve panning and polling, query.cpp answers questions. session.h has what they share, task.h what a
// decode task does. The functions here are those behind the given names of tavirpelo/zoom.h, where they
// are documented.
#pragma once

#include "tavirpelo/zoom.h"

namespace pelo::zoom {

// ---- start and end ----

int init(TAVIRPELO_DECINFO* decInfo, int displayWidth, int displayHeight, int budget, int zoomFactor,
         int withZoomedImage);
int start(TAVIRPELO_DECINFO* decInfo, const void* preview, int previewWidth, int previewHeight,
          void* display, int displayWidth, int displayHeight, uint32_t background, int budget,
          int zoomFactor, int taskPriority);
int start_with_image(TAVIRPELO_DECINFO* decInfo, const void* preview, int previewWidth,
                     int previewHeight, void* display, int displayWidth, int displayHeight,
                     uint32_t background, int budget, int zoomFactor, int taskPriority);
int stop(TAVIRPELO_DECINFO* decInfo);

// ---- views ----

int control(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int control);
int zoom_ratio(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int ratio, int fast);
int pan(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int x, int y, int fast);
int jump_to(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, const int target[3]);
int shift_display(TAVIRPELO_DECINFO* decInfo, void* display, int, int width, int height, int dx, int dy);
int centre_on_map(TAVIRPELO_DECINFO* decInfo, void* display, const int mapSize[2], int width, int height,
                  int x, int y);
int refresh(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height);

// ---- the whole picture at the current zoom ----

int render_low(TAVIRPELO_DECINFO* decInfo);
int render_medium(TAVIRPELO_DECINFO* decInfo);
int render_high(TAVIRPELO_DECINFO* decInfo);
int pan_rendered(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int x, int y);

// ---- questions and settings ----

int map_area(TAVIRPELO_DECINFO* decInfo, int mapWidth, int mapHeight, int area[6]);
int status(TAVIRPELO_DECINFO* decInfo, int* x, int* y, int* ratio);
int top_level(TAVIRPELO_DECINFO* decInfo, int* level);
int top_ratio(TAVIRPELO_DECINFO* decInfo, int* ratio);
void* buffer(TAVIRPELO_DECINFO* decInfo);
int set_scale(TAVIRPELO_DECINFO* decInfo, int scale);
int needed_memory(TAVIRPELO_DECINFO* decInfo, int displayWidth, int);

// ---- parts ----

int make_display(const TAVIRPELO_ZOOMINFO* zoom, void* display, int width, int height, int fast);
int make_rgb888_display(const TAVIRPELO_ZOOMINFO* zoom, void* display, int width, int height);
void fill565(void* display, int width, int height, uint32_t colour);
void fill888(void* display, int width, int height, uint32_t colour);
void raise_empty_sides(TAVIRPELO_ZOOMINFO* zoom);

// ---- tasks ----

void run_task();
int create_task(int, TAVIRPELO_TASKFN);
int start_task(int);
int send_message(int, const TAVIRPELO_TASKMESSAGE*);
int receive_message(int, TAVIRPELO_TASKMESSAGE*);
int destroy_task(int);

}  // namespace pelo::zoom
