// SPDX-License-Identifier: MIT
//
// A window of SDL2 whose pixels this library draws, and of which only what has changed is shown: a
// ball over a tiled ground. Ends after the given number of frames, when the window is closed, or
// with a key. usage: window [FRAMES]

#include <SDL.h>
#include <raster.h>
#include <stdio.h>
#include <stdlib.h>

enum { kWidth = 480, kHeight = 320, kTile = 16, kBall = 48 };

static uint32 tile[kTile * kTile], ball[kBall * kBall];

static void drawPictures(void) {
  for (int i = 0; i < kTile * kTile; ++i)
    tile[i] = (i / kTile + i % kTile) % kTile < 2 ? 0xFF31597F : 0xFF2A4A6A;
  for (int y = 0; y < kBall; ++y)
    for (int x = 0; x < kBall; ++x) {
      const int dx = 2 * x + 1 - kBall, dy = 2 * y + 1 - kBall;
      ball[y * kBall + x] = dx * dx + dy * dy < kBall * kBall ? 0xFFE0A030 : 0;
    }
}

/// Where the ball is in a frame: it goes to and fro in both directions.
static SDL_Rect ballAt(int frame) {
  const int across = kWidth - kBall, down = kHeight - kBall;
  const int x = 5 * frame % (2 * across), y = 3 * frame % (2 * down);
  return (SDL_Rect){x < across ? x : 2 * across - x, y < down ? y : 2 * down - y, kBall, kBall};
}

/// The ground below a rectangle; the tiles begin at the window's corner.
static void drawGround(SDL_Surface* s, const SDL_Rect* r) {
  Raster_RectPixmapCopy(s->pixels, (uint32)s->pitch, (const uint8*)tile, 4 * kTile, 4,
                        (uint32)r->x % kTile, (uint32)r->y % kTile, kTile, kTile, (uint32)r->x,
                        (uint32)r->y, (uint32)r->w, (uint32)r->h);
}

/// Takes the ball away from where it was, draws it anew, and shows both places.
static bool drawFrame(SDL_Window* window, SDL_Surface* surface, int frame) {
  SDL_Rect changed[] = {ballAt(frame > 0 ? frame - 1 : 0), ballAt(frame)};
  drawGround(surface, &changed[0]);
  Raster_AlphaBlendOver(surface->pixels, (uint32)changed[1].x, (uint32)changed[1].y,
                        (uint32)surface->pitch, (const uint8*)ball, 0, 0, 4 * kBall, kBall, kBall,
                        24, 32, 0);
  return SDL_UpdateWindowSurfaceRects(window, changed, 2) == 0;
}

int main(int argc, char** argv) {
  const int frames = argc > 1 ? atoi(argv[1]) : 1 << 30;
  if (SDL_Init(SDL_INIT_VIDEO) != 0) return fprintf(stderr, "%s\n", SDL_GetError()), 1;
  SDL_Window* window = SDL_CreateWindow("raster", SDL_WINDOWPOS_UNDEFINED, SDL_WINDOWPOS_UNDEFINED,
                                        kWidth, kHeight, 0);
  SDL_Surface* surface = window != NULL ? SDL_GetWindowSurface(window) : NULL;
  bool shown = surface != NULL && surface->format->BytesPerPixel == 4;
  if (shown) {
    drawPictures();
    drawGround(surface, &(SDL_Rect){0, 0, kWidth, kHeight});
    shown = SDL_UpdateWindowSurface(window) == 0;
  }
  for (int frame = 0; shown && frame < frames; ++frame) {
    shown = drawFrame(window, surface, frame);
    SDL_Event event;
    if (SDL_WaitEventTimeout(&event, 16) != 0 &&
        (event.type == SDL_QUIT || event.type == SDL_KEYDOWN))
      break;
  }
  if (!shown) fprintf(stderr, "no window of four-byte pixels: %s\n", SDL_GetError());
  SDL_Quit();
  return shown ? 0 : 1;
}
