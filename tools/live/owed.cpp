// SPDX-License-Identifier: MIT

#include "owed.h"

#include <algorithm>
#include <utility>

namespace tool::live {

Owed::Owed(uint32 width, uint32 height) : pixels(width, height) { pixels.addAll(); }

/// Whether more of what is to be moved is there than is not.
bool Owed::hasMostOf(const std::vector<Move>& wanted) const {
  uint64 area = 0;
  uint64 missing = 0;
  for (const Move& move : wanted) {
    area += areaOf(move.to);
    for (const Rect& rect : pixels.within(move.from())) missing += areaOf(rect);
  }
  return 2 * missing < area;
}

/// What is wrong where a move comes from is wrong where it goes to.
void Owed::add(const Move& move, const Rect& foreign) {
  const Rect from = move.from();
  std::vector<Rect> wrong = pixels.within(from);
  Rect inside;
  if (Rect_Intersect(&inside, &foreign, &from)) wrong.push_back(inside);
  pixels.subtract(move.to);
  for (const Rect& rect : wrong)
    pixels.add(Rect{rect.left, rect.top + move.down, rect.right, rect.bottom + move.down});
  if (Rect_Intersect(&inside, &foreign, &move.to)) pixels.add(inside);
  moves.push_back(move);
}

void Owed::add(const Changes& changes, const Rect& foreign) {
  constexpr size_t kMostMoves = 16;  // while a viewer does not read
  if (moves.size() + changes.moves.size() > kMostMoves) forgetMoves();
  if (changes.moves.empty() || !hasMostOf(changes.moves)) {
    pixels.add(changes.all);
    return;
  }
  ChangeList others = changes.all;
  for (const Move& move : changes.moves) {
    add(move, foreign);
    others.subtract(move.to);
  }
  pixels.add(others);
}

void Owed::forgetMoves() {
  for (const Move& move : moves) pixels.add(move.to);
  moves.clear();
}

std::vector<Move> Owed::takeMoves(const Rect& part) {
  const bool isWithin = std::all_of(moves.begin(), moves.end(), [&](const Move& move) {
    const Rect from = move.from();
    return Rect_ContainsRect(&part, &move.to) && Rect_ContainsRect(&part, &from);
  });
  if (!isWithin) forgetMoves();
  return std::exchange(moves, {});
}

}  // namespace tool::live
