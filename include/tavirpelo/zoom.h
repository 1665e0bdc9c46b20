/*
 * Zoom and pan over a large JPEG on a small display. A start decodes the picture once, within a memory
 * budget; every later view is scaled from that zoom image into the caller's display buffer.
 *
 * Display buffers hold width x height pixels of the object's outFormat, TAVIRPELO_RGB565 or
 * TAVIRPELO_RGB888, in packed rows. Sizes and positions are pixels. An object has at most one zoom, and is
 * used by one thread. A decode task, where the task layer has tasks, writes the zoom image, the decode state
 * and, like every decode, the object's picture sizes and gTAVIRPELO_Error; a view drawn meanwhile may mix
 * pixels of the preview and of the picture.
 *
 * Unless said otherwise a function returns 0 on failure, with gTAVIRPELO_Error 1 for a missing object, zoom,
 * display or result, or a display or map size below 1.
 */
#ifndef TAVIRPELO_ZOOM_H
#define TAVIRPELO_ZOOM_H

#include <stdint.h>

#include "tavirpelo/decinfo.h"

/* Controls of TAVIRPELO_ControlZoom. */
enum {
  TAVIRPELO_ZOOM_IN = 0,
  TAVIRPELO_ZOOM_OUT = 1,
  TAVIRPELO_ZOOM_UP = 2, /* moves by 30 pixels */
  TAVIRPELO_ZOOM_DOWN = 3,
  TAVIRPELO_ZOOM_LEFT = 4,
  TAVIRPELO_ZOOM_RIGHT = 5,
  TAVIRPELO_ZOOM_UP_LEFT = 6,
  TAVIRPELO_ZOOM_UP_RIGHT = 7,
  TAVIRPELO_ZOOM_DOWN_RIGHT = 8,
  TAVIRPELO_ZOOM_DOWN_LEFT = 9,
  TAVIRPELO_ZOOM_REFRESH = 10
};

/* How a zoom turns the picture: option bits read when it starts. */
enum {
  TAVIRPELO_ZOOM_ROTATE_MASK = 0x30, /* 0x10, 0x20, 0x30: 90, 180, 270 degrees clockwise */
  TAVIRPELO_ZOOM_ROTATE_AUTO = 0x40  /* a quarter turn only when the picture then lies as the display does */
};

/* Values of decodeState. */
enum {
  TAVIRPELO_ZOOM_NOT_STARTED = 0,
  TAVIRPELO_ZOOM_DECODING = 1,
  TAVIRPELO_ZOOM_DECODED = 2
};

/* State of a zoom, 32-bit words on 32-bit targets. */
typedef struct TAVIRPELO_ZOOMINFO {
  int32_t sourceWidth;  /* the picture, turned */
  int32_t sourceHeight;
  int32_t imageWidth;   /* the zoom image: the picture as decoded */
  int32_t imageHeight;
  int32_t zoomedWidth;  /* the whole picture at the current zoom */
  int32_t zoomedHeight;
  int32_t viewWidth;    /* its visible part */
  int32_t viewHeight;
  int32_t maxWidth;     /* largest zoomed size */
  int32_t maxHeight;
  int32_t minWidth;     /* smallest: the picture fitted into the display */
  int32_t minHeight;
  int32_t previewFlag;  /* 1: the picture is no larger than the caller's preview */
  uint32_t background;  /* RGB565 in the low 16 bits, or 0xRRGGBB */
  int32_t zoomScale;    /* multiplies zoomStep */
  int32_t zoomLevel;    /* zoom-in steps taken; 20 at the maximum */
  int32_t viewX;        /* the view's corner in the zoomed picture */
  int32_t viewY;
  int32_t zoomRatio;    /* zoomed width in percent of minWidth */
  void* pZoomImage;     /* owned, imageWidth x imageHeight pixels */
  void* pZoomedImage;   /* owned, only with TAVIRPELO_StartZoomWithZoomImage: the largest zoomed size */
  int32_t zoomStep;     /* a tenth of the display's width */
  int32_t mapStepY;
  int32_t mapStepX;
  int32_t taskId;       /* decode task, -1: none */
  int32_t decodeState;  /* shared with the decode task */
  int32_t stopRequest;  /* shared with the decode task */
  int32_t renderedWidth; /* size of the picture in pZoomedImage; 0: none */
  int32_t renderedHeight;
  int32_t format;       /* pixel format of both buffers */
} TAVIRPELO_ZOOMINFO;

/* ---- start and end ---- */

/* Starts a zoom and draws the whole picture. `budget` bounds the zoom image's bytes, less 0x30000 for the
 * decoder, and with it the largest zoomed size, at most zoomFactor times the picture. With a preview of the
 * picture (previewWidth x previewHeight pixels, the picture centred in it; may be null) and a priority
 * that is not negative, a decode task fills the zoom image while the preview stands in for it. Errors: 4
 * (memory or budget), 17 (a zoom is active; nothing is changed), the decoder's; none for another outFormat
 * or an unreadable header. A failure leaves the object without zoom. */
TAVIRPELO_API int TAVIRPELO_StartZoom(TAVIRPELO_DECINFO* decInfo, const void* preview, int previewWidth,
                                      int previewHeight, void* display, int displayWidth,
                                      int displayHeight, uint32_t background, int budget, int zoomFactor,
                                      int taskPriority);

/* The same with half the budget, and a buffer for TAVIRPELO_MakeZoomImage...Quality. */
TAVIRPELO_API int TAVIRPELO_StartZoomWithZoomImage(TAVIRPELO_DECINFO* decInfo, const void* preview,
                                                   int previewWidth, int previewHeight, void* display,
                                                   int displayWidth, int displayHeight,
                                                   uint32_t background, int budget, int zoomFactor,
                                                   int taskPriority);

/* Ends the zoom once its decode task has finished. option becomes userOption, CheckFn
 * TAVIRPELO_CheckFn. 1. */
TAVIRPELO_API int TAVIRPELO_StopZoom(TAVIRPELO_DECINFO* decInfo);

/* Attaches a zoom state with its buffers, nothing decoded; the first half of a start. */
TAVIRPELO_API int PELO_InitZoom(TAVIRPELO_DECINFO* decInfo, int displayWidth, int displayHeight, int budget,
                                int zoomFactor, int withZoomedImage);

/* ---- views ----
 * Each draws the view into the display. A smaller display than the zoom's shows the view's upper left part;
 * a view smaller than the display stands in its centre, on the background colour. */

/* One step. 1, or 2 when a limit was reached; error 18 for an unknown control. */
TAVIRPELO_API int TAVIRPELO_ControlZoom(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height,
                                        int control);

/* Zoom to a percentage of the fitted size, about the view's centre. 1, or 2 at the fitted size. The fast
 * form takes nearest samples in RGB565; PELO_ZoomRatioEx has the choice. */
TAVIRPELO_API int TAVIRPELO_ZoomRatio(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height,
                                      int ratio);
TAVIRPELO_API int TAVIRPELO_FastZoomRatio(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height,
                                          int ratio);
TAVIRPELO_API int PELO_ZoomRatioEx(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height,
                                   int ratio, int fast);

/* Move the view's corner to (x, y), kept inside the picture. 1. */
TAVIRPELO_API int TAVIRPELO_PanPosition(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height,
                                        int x, int y);
TAVIRPELO_API int TAVIRPELO_FastPanPosition(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height,
                                            int x, int y);
TAVIRPELO_API int PELO_PanPositionEx(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height,
                                     int x, int y, int fast);

/* Zooms to {level, x, y}: so many steps from the fitted size, the view's corner at (x, y). 1. */
TAVIRPELO_API int TAVIRPELO_JumpZoom(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height,
                                     const int target[3]);

/* Moves the view by (dx, dy), then acts as TAVIRPELO_ZOOM_REFRESH. */
TAVIRPELO_API int TAVIRPELO_SetDisplayOnPosition(TAVIRPELO_DECINFO* decInfo, void* display, int ignored,
                                                 int width, int height, int dx, int dy);

/* Centres the view on point (x, y) of a map of the whole picture, then acts as TAVIRPELO_ZOOM_REFRESH. */
TAVIRPELO_API int TAVIRPELO_SetMapOnPosition(TAVIRPELO_DECINFO* decInfo, void* display, const int mapSize[2],
                                             int width, int height, int x, int y);

/* Redraws while a task decodes; call it until it returns 0. 1: call again. Where no task ever starts
 * decoding it stays 1. */
TAVIRPELO_API int TAVIRPELO_RefreshZoom(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height);

/* ---- the whole picture at the current zoom, for panning without scaling ---- */

/* Render it, with nearest samples, averages, or (medium) averages when it is much smaller than the zoom
 * image. RGB888 is always averaged. 1; 0 without a code for a zoom without that buffer. */
TAVIRPELO_API int TAVIRPELO_MakeZoomImageLowQuality(TAVIRPELO_DECINFO* decInfo);
TAVIRPELO_API int TAVIRPELO_MakeZoomImageMediumQuality(TAVIRPELO_DECINFO* decInfo);
TAVIRPELO_API int TAVIRPELO_MakeZoomImageHighQuality(TAVIRPELO_DECINFO* decInfo);

/* Moves the view and copies it from there. 1; 0 without a code when nothing was rendered since the last
 * change of the zoom. */
TAVIRPELO_API int TAVIRPELO_PanWithZoomImage(TAVIRPELO_DECINFO* decInfo, void* display, int width,
                                             int height, int x, int y);

/* ---- questions and settings ---- */

/* The view in a mapWidth x mapHeight map that shows the picture fitted and centred: {map width, map
 * height, x, y, width, height}. 1. */
TAVIRPELO_API int TAVIRPELO_GetMapOnArea(TAVIRPELO_DECINFO* decInfo, int mapWidth, int mapHeight,
                                         int area[6]);

/* The view's corner and the zoom ratio in percent; null results are left out. 1. */
TAVIRPELO_API int TAVIRPELO_GetZoomStatus(TAVIRPELO_DECINFO* decInfo, int* x, int* y, int* ratio);

/* Zoom-in steps from the fitted size to the largest. 1. */
TAVIRPELO_API int TAVIRPELO_GetMaxZoomLevel(TAVIRPELO_DECINFO* decInfo, int* level);

/* The largest zoom ratio in percent. 1. */
TAVIRPELO_API int TAVIRPELO_GetMaxZoomRatio(TAVIRPELO_DECINFO* decInfo, int* ratio);

/* The zoom image, or null. */
TAVIRPELO_API void* TAVIRPELO_GetZoomBuffer(TAVIRPELO_DECINFO* decInfo);

/* Multiplies the zoom step by `scale`, at least 1; 1, or 0 (without a code) for less. */
TAVIRPELO_API int TAVIRPELO_SetZoomScale(TAVIRPELO_DECINFO* decInfo, int scale);

/* Bytes that a zoom of the picture on such a display asks for, 0x30000 for the decoder included. Without an
 * active zoom its step is derived from displayWidth. -1 for another output format or an unreadable
 * header, 0 for a null object. */
TAVIRPELO_API int TAVIRPELO_GetZoomMemRequirement(TAVIRPELO_DECINFO* decInfo, int displayWidth,
                                                  int displayHeight);

/* ---- parts of the engine ---- */

/* Draw the view of an RGB565 (averaged, or `fast`: nearest samples) or RGB888 zoom. 1; 0 for a zoom of the
 * other format or without zoom image. */
TAVIRPELO_API int PELO_MakeDisplay(const TAVIRPELO_ZOOMINFO* zoom, void* display, int width, int height,
                                   int fast);
TAVIRPELO_API int PELO_MakeRGB888Display(const TAVIRPELO_ZOOMINFO* zoom, void* display, int width,
                                         int height);

/* Fill width x height pixels with the low 16 bits of a colour, or with 0xRRGGBB. */
TAVIRPELO_API void PELO_SetOutBuff(void* display, int width, int height, uint32_t colour);
TAVIRPELO_API void PELO_SetRGB888OutBuff(void* display, int width, int height, uint32_t colour);

/* Raises the sides of the zoom image, the zoomed picture and the view from 0 to 1. */
TAVIRPELO_API void PELO_CheckInvalidSize(TAVIRPELO_ZOOMINFO* zoom);

/* ---- task layer ----
 * This platform has no tasks: TAVIRPELO_CreateTask returns -1, the others 0, and do nothing. */

/* What a decode task is told: decode the object's picture into a width x height buffer. */
typedef struct TAVIRPELO_TASKMESSAGE {
  TAVIRPELO_DECINFO* decInfo;
  void* buffer;
  int width;
  int height;
  int previewFlag;
} TAVIRPELO_TASKMESSAGE;

typedef void (*TAVIRPELO_TASKFN)(void);

/* A task that is to run `entry`; its id, or -1. */
TAVIRPELO_API int TAVIRPELO_CreateTask(int priority, TAVIRPELO_TASKFN entry);
TAVIRPELO_API int TAVIRPELO_StartTask(int task);
/* Copies a message to a task. */
TAVIRPELO_API int TAVIRPELO_SendMessage(int task, const TAVIRPELO_TASKMESSAGE* message);
/* The calling task's next message, after at most `timeout` ms (-1: no limit). */
TAVIRPELO_API int TAVIRPELO_ReceiveMessage(int timeout, TAVIRPELO_TASKMESSAGE* message);
/* Ends a task that waits for a message. */
TAVIRPELO_API int TAVIRPELO_DestroyTask(int task);

/* Body of a decode task: decodes as messages say, until one without object or zoom comes. */
TAVIRPELO_API void PELO_AsyncDecodeJPEG(void);

#endif
