// SPDX-License-Identifier: MIT

#include "server.h"

#include <poll.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <utility>

#include "failure.h"
#include "drawnCursor.h"
#include "inputPlayer.h"

namespace tool::live {
namespace {

using std::chrono::milliseconds;

constexpr milliseconds kUnreadListening(50);  // while no viewer reads
constexpr milliseconds kListeningAgain(10);
constexpr size_t kMostViewers = 64;

Listener listenerFor(const ServeOptions& options) {
  return options.socketPath.empty() ? Listener::onPort(options.address, options.anyone)
                                    : Listener::onPath(options.socketPath);
}

unsigned long long shown(uint64 number) { return number; }

}  // namespace

Server::Server(const ServeOptions& chosen)
    : options(chosen), listener(listenerFor(chosen)), screen(chosen) {
  changed = Changes(screen.width(), screen.height());
  if (!options.recording.empty())
    recorder.emplace(options.recording, screen.width(), screen.height());
  if (options.input) InputPlayer(screen).pointer(0, {-1, -1});  // fails now when it cannot be
}

void Server::run() {
  printf("listening on %s\n", listener.address().c_str());
  fflush(stdout);
  if (recorder) screen.begin(Clock::now());
  while (turn()) {
  }
  for (Connection& viewer : viewers) retire(viewer);
  viewers.clear();
  if (recorder) recorder->finish();
  if (options.stats) printStatistics();
}

void Server::printStatistics() const {
  printf("damaged %llu rectangles, %llu pixels\n", shown(screen.damagedRects()),
         shown(screen.damagedPixels()));
  printf("compared %llu tiles, %llu equal\n", shown(screen.tiles().compared),
         shown(screen.tiles().equal));
  printf("sent %llu pixels, %llu bytes, to %llu viewers\n", shown(sentPixels), shown(sentBytes),
         shown(viewerCount));
  printf("moved %llu pixels at the viewers\n", shown(movedPixels));
  fflush(stdout);
}

/// Waits for something and does what it asks for; false at the end.
bool Server::turn() {
  const Clock::time_point before = Clock::now();
  const bool listens = !isCaptureCertain() && before >= nextListening;
  const bool admits = viewers.size() < kMostViewers && !(options.once && viewerCount != 0);
  std::vector<pollfd> polled = {{signals.descriptor(), POLLIN, 0},
                                {admits ? listener.descriptor() : -1, POLLIN, 0},
                                {listens ? screen.descriptor() : -1, POLLIN, 0}};
  constexpr ptrdiff_t kFirstViewer = 3;
  for (const Connection& viewer : viewers) {
    const int events = viewer.hasUnsent() ? POLLIN | POLLOUT : POLLIN;
    polled.push_back({viewer.descriptor(), static_cast<short>(events), 0});
  }
  if (poll(polled.data(), polled.size(), timeout(before)) < 0 && errno != EINTR)
    throw Failure("cannot wait for viewers");
  if (polled[0].revents != 0) return false;
  auto polledViewer = polled.begin() + kFirstViewer;
  dropIf([&](Connection& viewer) {
    const short events = (polledViewer++)->revents;
    if ((events & POLLOUT) != 0 && !viewer.flush()) return true;
    return (events & (POLLIN | POLLHUP | POLLERR)) != 0 && !viewer.receive();
  });
  if (polled[1].revents != 0) admit();
  attend(Clock::now());
  return !options.once || viewerCount == 0 || !viewers.empty();
}

/// Does for the screen and the viewers what is due.
void Server::attend(Clock::time_point now) {
  // Before it is listened to: what waits for an answer of the display may take in other news.
  screen.followPointer(isAnyViewer(&Session::needsPointer));
  if (now >= nextListening) listenToScreen(now);
  if (!isWatched()) return;
  const bool captures = isCapturePending() && now >= screen.captureTime();
  if (captures) {
    listenToScreen(now);
    screen.seekMoves(isAnyViewer(&Session::takesMoves));
    screen.capture(now, changed);
  }
  screen.expire(now, changed.all);
  tellChanges();
  if (screen.hasPicture()) update();
  if (!captures) return;
  screen.rest(now);
  nextListening = screen.restsUntil();
}

int Server::timeout(Clock::time_point now) const {
  constexpr Clock::time_point kNever = Clock::time_point::max();
  Clock::time_point next = kNever;
  if (isWatched() && isCapturePending()) next = screen.captureTime();
  if (!isCaptureCertain() && now < nextListening) next = std::min(next, nextListening);
  if (isWatched()) next = std::min(next, screen.nextExpiry().value_or(kNever));
  if (next == kNever) return -1;
  // Rounded up, so that it does not wake just before.
  return static_cast<int>(std::max<int64>(0, std::chrono::ceil<milliseconds>(next - now).count()));
}

template <class Condition> void Server::dropIf(Condition isGone) {
  const bool wasWatched = isWatched();
  for (auto viewer = viewers.begin(); viewer != viewers.end();) {
    if (isGone(*viewer)) {
      retire(*viewer);
      viewer = viewers.erase(viewer);
    } else {
      ++viewer;
    }
  }
  if (wasWatched && !isWatched()) {
    screen.end();
    nextListening = {};
  }
}

void Server::retire(Connection& viewer) {
  sentPixels += viewer.viewer().sentPixels();
  sentBytes += viewer.sentBytes();
  movedPixels += viewer.viewer().movedPixels();
}

void Server::admit() {
  Descriptor socket = listener.accept();
  if (socket.get() < 0) return;
  const bool wasWatched = isWatched();
  ++viewerCount;
  viewers.emplace_back(std::move(socket), static_cast<uint32>(viewerCount), screen.width(),
                       screen.height(), "rastertool " + options.display,
                       options.input ? std::make_unique<InputPlayer>(screen) : nullptr);
  if (!wasWatched) screen.begin(Clock::now());
  dropIf([](Connection& viewer) { return !viewer.flush(); });
}

void Server::listenToScreen(Clock::time_point now) {
  if (screen.listen(now)) {
    changed = Changes(screen.width(), screen.height());
    if (recorder) recorder->resize(now, screen.width(), screen.height());
    dropIf([&](Connection& viewer) {
      return !viewer.viewer().resize(screen.width(), screen.height()) &&
             !viewer.drop("the screen has another size, and it cannot be told");
    });
  }
  if (screen.mayHaveMore()) nextListening = now + kListeningAgain;
  if (screen.hasHeard() && !isAnyoneReady()) nextListening = now + kUnreadListening;
}

void Server::tellChanges() {
  if (changed.all.isEmpty()) return;
  for (Connection& viewer : viewers) viewer.viewer().addChanges(changed);
  if (recorder) recorder->record(Clock::now(), screen.scene().pixels, changed.all);
  changed.clear();
}

bool Server::isAnyViewer(bool (Session::*is)() const) const {
  return std::any_of(viewers.begin(), viewers.end(),
                     [is](const Connection& viewer) { return (viewer.viewer().*is)(); });
}

bool Server::isAnyoneReady() const {
  return recorder || std::any_of(viewers.begin(), viewers.end(),
                                 [](const Connection& viewer) { return viewer.isReady(); });
}

void Server::update() {
  updateThose(false);
  const bool needsCursor =
      std::any_of(viewers.begin(), viewers.end(), [](const Connection& viewer) {
        return viewer.isReady() && viewer.viewer().needsDrawnCursor();
      });
  const Scene scene = screen.scene();
  if (!needsCursor || scene.cursor == nullptr) {
    if (needsCursor) updateThose(true);
    return;
  }
  const PixelView& picture = scene.pixels;
  const DrawnCursor drawn(screen.pixels(), picture.pitch, picture.width, picture.height,
                          *scene.cursor, scene.pointer);
  updateThose(true);
}

void Server::updateThose(bool withCursor) {
  const Scene scene = screen.scene();
  dropIf([&](Connection& viewer) {
    return viewer.isReady() && viewer.viewer().needsDrawnCursor() == withCursor &&
           !viewer.update(scene);
  });
}

}  // namespace tool::live
