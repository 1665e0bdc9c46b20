// The decode task, and a task layer for a platform without tasks.
#include "codec/zoom/task.h"

#include "codec/formats/jpeg/decoder/driver.h"
#include "codec/zoom/zoom.h"
#include "tavirpelo/decode.h"

namespace pelo::zoom {
namespace {

constexpr int kWidthLimit = 5000;  // of pictures that a task decodes
constexpr int kForever = -1;

void decode(const TAVIRPELO_TASKMESSAGE& message) {
  TAVIRPELO_ZOOMINFO& zoom = *message.decInfo->pZoomInfo;
  if (message.width > 0 && message.width < kWidthLimit) {
    store_shared(zoom.decodeState, TAVIRPELO_ZOOM_DECODING);
    if (load_shared(zoom.stopRequest) == 0) {
      jpeg::decode(message.decInfo, message.buffer, message.width, message.height);
    }
  }
  // Whatever became of the picture: the end of the zoom waits for this.
  store_shared(zoom.decodeState, TAVIRPELO_ZOOM_DECODED);
}

}  // namespace

TaskLayer taskLayer{TAVIRPELO_CreateTask,     TAVIRPELO_StartTask,   TAVIRPELO_SendMessage,
                    TAVIRPELO_ReceiveMessage, TAVIRPELO_DestroyTask, TAVIRPELO_OsSleep};

void run_task(void) {
  for (;;) {
    TAVIRPELO_TASKMESSAGE message{};
    taskLayer.receive(kForever, &message);
    if (message.decInfo == nullptr || message.decInfo->pZoomInfo == nullptr) return;
    decode(message);
  }
}

int create_task(int, TAVIRPELO_TASKFN) {
  return -1;
}
int start_task(int) {
  return 0;
}
int send_message(int, const TAVIRPELO_TASKMESSAGE*) {
  return 0;
}
int receive_message(int, TAVIRPELO_TASKMESSAGE*) {
  return 0;
}
int destroy_task(int) {
  return 0;
}

}  // namespace pelo::zoom
