#include <algorithm>
#include <cmath>
#include <map>
#include <numbers>

#include "host/text/utf8_text.h"
#include "tools/report/drawing.h"

namespace SecPolicyTool {

namespace {

constexpr double kGap = 19;  // between neighbours on the circle
constexpr double kLeastRadius = 210;
constexpr double kDot = 6;

struct Circle {
  double count;  // of places
  double radius;
  double middle;

  // With so much room outside the circle.
  Circle(std::size_t size, double room)
      : count(static_cast<double>(size)),
        radius(std::max(kLeastRadius, kGap * count / (2 * std::numbers::pi))),
        middle(radius + room) {}

  // Of the place with this number, in radians, clockwise from the top.
  [[nodiscard]] double AngleOf(double place) const {
    return 2 * std::numbers::pi * place / count - std::numbers::pi / 2;
  }
  [[nodiscard]] Point At(double place, double distance) const {
    const double angle = AngleOf(place);
    return {middle + distance * std::cos(angle), middle + distance * std::sin(angle)};
  }
};

// For the longest name, beside its dot.
double RoomForNames(const TransitionGraph& graph, const std::vector<std::size_t>& domains) {
  constexpr double kCharacterWidth = 7.6;
  std::size_t longest = 0;
  for (const std::size_t domain : domains) {
    longest = std::max(longest, StandIn::CharacterCount(DrawnName(graph, domain)));
  }
  return static_cast<double>(longest) * kCharacterWidth + 32;
}

std::string Text(const Point& point) { return SvgNumber(point.x) + " " + SvgNumber(point.y); }

// A loop inside the circle.
std::string LoopAt(const Circle& circle, double place) {
  constexpr double kDepth = 64;
  const double aside = 26 * circle.count / (2 * std::numbers::pi * circle.radius);
  return "M" + Text(circle.At(place, circle.radius)) + "C" +
         Text(circle.At(place - aside, circle.radius - kDepth)) + " " +
         Text(circle.At(place + aside, circle.radius - kDepth)) + " " +
         Text(circle.At(place, circle.radius - kDot - kArrow));
}

// Bent towards the middle, so that those between neighbours stand out from the circle.
std::string PathOf(const Circle& circle, double from, double to) {
  const Point start = circle.At(from, circle.radius);
  const Point end = circle.At(to, circle.radius);
  const Point bend{(start.x + end.x) / 4 + circle.middle / 2,
                   (start.y + end.y) / 4 + circle.middle / 2};
  const double room = (kArrow + kDot) / std::hypot(bend.x - end.x, bend.y - end.y);
  return "M" + Text(start) + "Q" + Text(bend) + " " +
         Text({end.x + (bend.x - end.x) * room, end.y + (bend.y - end.y) * room});
}

}  // namespace

Drawing DrawCircle(const TransitionGraph& graph) {
  const std::vector<std::size_t> domains = SplitDomains(graph).linked;
  const Circle circle(domains.size(), RoomForNames(graph, domains));
  Drawing drawing;
  drawing.width = drawing.height = 2 * circle.middle;
  std::map<std::size_t, double> places;
  for (const std::size_t domain : domains) {
    const auto place = static_cast<double>(places.size());
    places[domain] = place;
    drawing.domains.push_back({domain, circle.At(place, circle.radius), 0, 0,
                               circle.AngleOf(place) * 180 / std::numbers::pi});
  }
  for (std::size_t i = 0; i < graph.Links().size(); ++i) {
    const double from = places.at(graph.Links()[i].from);
    const double to = places.at(graph.Links()[i].to);
    drawing.links.push_back(
        {i, from == to ? LoopAt(circle, from) : PathOf(circle, from, to), std::nullopt});
  }
  return drawing;
}

}  // namespace SecPolicyTool
