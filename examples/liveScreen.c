// SPDX-License-Identifier: MIT
//
// The heart of a live screen, without any protocol: what X says is damaged is collected in a list,
// captured, compared tile by tile with what the other side has, and what differs goes over.
//
//     liveScreen [UPDATES]     of the screen in DISPLAY, of 32 bits a pixel

#include <raster.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <xcb/damage.h>
#include <xcb/xcb.h>

enum { kTile = 32, kSkipped = 77 };

typedef struct Screen {
  xcb_connection_t* connection;
  xcb_window_t root;
  uint8 damageEvent;
  uint32 width;
  uint32 height;
  uint32 pitch;
  uint8* now;     // the screen's pixels, where they were captured
  uint8* remote;  // what the other side has
} Screen;

static bool hasWordPixels(const xcb_setup_t* setup, uint8 depth) {
  xcb_format_iterator_t format = xcb_setup_pixmap_formats_iterator(setup);
  for (; format.rem != 0; xcb_format_next(&format))
    if (format.data->depth == depth) return depth == 24 && format.data->bits_per_pixel == 32;
  return false;
}

static bool openScreen(Screen* screen) {
  screen->connection = xcb_connect(NULL, NULL);
  if (xcb_connection_has_error(screen->connection) != 0) return false;
  const xcb_setup_t* setup = xcb_get_setup(screen->connection);
  const xcb_screen_t* first = xcb_setup_roots_iterator(setup).data;
  const xcb_query_extension_reply_t* damage =
      xcb_get_extension_data(screen->connection, &xcb_damage_id);
  if (!hasWordPixels(setup, first->root_depth) || damage == NULL || damage->present == 0)
    return false;
  screen->root = first->root;
  screen->damageEvent = damage->first_event + XCB_DAMAGE_NOTIFY;
  screen->width = first->width_in_pixels;
  screen->height = first->height_in_pixels;
  screen->pitch = 4 * screen->width;
  screen->now = calloc(screen->height, screen->pitch);
  screen->remote = calloc(screen->height, screen->pitch);
  return screen->now != NULL && screen->remote != NULL;
}

static void closeScreen(Screen* screen) {
  free(screen->now);
  free(screen->remote);
  xcb_disconnect(screen->connection);
}

// From here on the server sends an event for every rectangle that is drawn, and first one for the
// whole screen.
static void watchDamage(const Screen* screen) {
  free(xcb_damage_query_version_reply(screen->connection,
                                      xcb_damage_query_version(screen->connection, 1, 1), NULL));
  xcb_damage_create(screen->connection, xcb_generate_id(screen->connection), screen->root,
                    XCB_DAMAGE_REPORT_LEVEL_RAW_RECTANGLES);
  xcb_flush(screen->connection);
}

// Waits for damage and takes all that is there. False when the display is gone.
static bool collectDamage(const Screen* screen, RectList* damage) {
  xcb_generic_event_t* event = xcb_wait_for_event(screen->connection);
  if (event == NULL) return false;
  for (; event != NULL; event = xcb_poll_for_event(screen->connection)) {
    if ((event->response_type & 0x7F) == screen->damageEvent) {
      const xcb_rectangle_t* area = &((const xcb_damage_notify_event_t*)event)->area;
      Raster_AddRect(damage, area->x, area->y, area->width, area->height);
    }
    free(event);
  }
  return true;
}

static void capture(const Screen* screen, const RectListEntry* rect) {
  xcb_get_image_reply_t* image = xcb_get_image_reply(
      screen->connection,
      xcb_get_image(screen->connection, XCB_IMAGE_FORMAT_Z_PIXMAP, screen->root, (int16)rect->x,
                    (int16)rect->y, (uint16)rect->width, (uint16)rect->height, ~0u),
      NULL);
  if (image == NULL) return;
  Raster_RectCopy(screen->now, screen->pitch, xcb_get_image_data(image), 4 * (uint32)rect->width, 4,
                  0, 0, (uint32)rect->x, (uint32)rect->y, (uint32)rect->width,
                  (uint32)rect->height);
  free(image);
}

static int32 smaller(int32 a, int32 b) { return a < b ? a : b; }

// Much of what is drawn is drawn as it was.
static void addChangedTiles(const Screen* screen, const RectListEntry* rect, RectList* changed) {
  for (int32 y = rect->y; y < rect->y + rect->height; y += kTile) {
    for (int32 x = rect->x; x < rect->x + rect->width; x += kTile) {
      const int32 width = smaller(kTile, rect->x + rect->width - x);
      const int32 height = smaller(kTile, rect->y + rect->height - y);
      if (Raster_ComparePixels(screen->now, screen->pitch, 32, screen->remote, screen->pitch, 32,
                               (uint32)x, (uint32)y, (uint32)x, (uint32)y, (uint32)width,
                               (uint32)height) != 0)
        Raster_AddRect(changed, x, y, width, height);
    }
  }
}

static void sendPixels(const Screen* screen, const RectListEntry* rect) {
  printf("  %dx%d at %d,%d\n", rect->width, rect->height, rect->x, rect->y);
  Raster_RectCopy(screen->remote, screen->pitch, screen->now, screen->pitch, 4, (uint32)rect->x,
                  (uint32)rect->y, (uint32)rect->x, (uint32)rect->y, (uint32)rect->width,
                  (uint32)rect->height);
}

static void update(const Screen* screen, const RectList* damage) {
  RectList changed;
  Raster_ClearRectList(&changed);
  for (int i = 0; i < RASTER_RECT_LIST_SIZE && damage->rects[i].width > 0; ++i) {
    capture(screen, &damage->rects[i]);
    addChangedTiles(screen, &damage->rects[i], &changed);
  }
  printf("update:\n");
  for (int i = 0; i < RASTER_RECT_LIST_SIZE && changed.rects[i].width > 0; ++i)
    sendPixels(screen, &changed.rects[i]);
  fflush(stdout);
}

int main(int argc, char** argv) {
  Screen screen = {0};
  if (!openScreen(&screen)) {
    fprintf(stderr, "no screen of 32 bits a pixel that tells what changes\n");
    closeScreen(&screen);
    return kSkipped;
  }
  watchDamage(&screen);
  bool isThere = true;
  for (long left = argc > 1 ? strtol(argv[1], NULL, 10) : 10; isThere && left > 0; --left) {
    RectList damage;
    Raster_ClearRectList(&damage);
    isThere = collectDamage(&screen, &damage);
    if (isThere) update(&screen, &damage);
  }
  closeScreen(&screen);
  return isThere ? 0 : 1;
}
