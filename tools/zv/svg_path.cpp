// A recursive-descent reader of SVG path data.
#include "svg_path.h"

#include "svg_arc.h"

#include <cctype>
#include <cmath>
#include <cstdlib>
#include <vector>

namespace {
using P = ZvPoint2<float>;

class Reader {
 public:
  Reader(const std::string& s, ZvPath2f& path) : s(s), path(path) {}

  bool Run(std::string& error) {
    SkipSpace();
    if (pos == s.size()) return Fail("is empty", error);
    if (s[pos] != 'M' && s[pos] != 'm') return Fail("must start with M or m", error);
    while (true) {
      SkipSpace();
      if (pos == s.size()) return true;
      const char c = s[pos];
      if (std::isalpha(static_cast<unsigned char>(c))) {
        command = c;
        ++pos;
        if (!Command(true, error)) return false;
      } else if (command == 'Z' || command == 'z') {
        return Fail(std::string("has an unexpected '") + c + "'", error);
      } else if (!Command(false, error)) {
        return false;
      }
    }
  }

 private:
  bool Fail(const std::string& what, std::string& error) const {
    error = "path data " + what + " at offset " + std::to_string(pos);
    return false;
  }

  void SkipSpace() {
    while (pos < s.size() && (std::isspace(static_cast<unsigned char>(s[pos])) || s[pos] == ','))
      ++pos;
  }

  bool Number(float& v, std::string& error) {
    SkipSpace();
    const std::size_t start = pos;
    std::size_t i = pos;
    if (i < s.size() && (s[i] == '+' || s[i] == '-')) ++i;
    std::size_t digits = 0;
    while (i < s.size() && std::isdigit(static_cast<unsigned char>(s[i])))
      ++i, ++digits;
    if (i < s.size() && s[i] == '.') {
      ++i;
      while (i < s.size() && std::isdigit(static_cast<unsigned char>(s[i])))
        ++i, ++digits;
    }
    if (digits == 0) {
      if (pos == s.size()) return Fail("ends in the middle of a command", error);
      return Fail(std::string("expects a number, not '") + s[pos] + "'", error);
    }
    if (i < s.size() && (s[i] == 'e' || s[i] == 'E')) {
      std::size_t j = i + 1;
      if (j < s.size() && (s[j] == '+' || s[j] == '-')) ++j;
      if (j < s.size() && std::isdigit(static_cast<unsigned char>(s[j]))) {
        while (j < s.size() && std::isdigit(static_cast<unsigned char>(s[j])))
          ++j;
        i = j;
      }
    }
    const double d = std::strtod(s.substr(start, i - start).c_str(), nullptr);
    if (!std::isfinite(d) || std::fabs(d) > 1e30) return Fail("has a number out of range", error);
    v = static_cast<float>(d);
    pos = i;
    return true;
  }

  // An arc flag is one character, 0 or 1, so "0010" is two flags and a number.
  bool Flag(bool& v, std::string& error) {
    SkipSpace();
    if (pos < s.size() && (s[pos] == '0' || s[pos] == '1')) {
      v = s[pos++] == '1';
      return true;
    }
    if (pos == s.size()) return Fail("ends in the middle of a command", error);
    return Fail(std::string("expects an arc flag (0 or 1), not '") + s[pos] + "'", error);
  }

  bool Arc(bool rel, P& e, std::string& error) {
    float rx = 0, ry = 0, degrees = 0;
    bool large = false, sweep = false;
    if (!Number(rx, error) || !Number(ry, error) || !Number(degrees, error) ||
        !Flag(large, error) || !Flag(sweep, error) || !Point(e, rel, error))
      return false;
    if (rx == 0 || ry == 0) {
      if (!(e.x == current.x && e.y == current.y)) path.Lineto(e);
      return true;
    }
    std::vector<ZvPoint2<double>> c;
    const int n =
        ZvSvgArcToCubics({current.x, current.y}, rx, ry, degrees, large, sweep, {e.x, e.y}, c);
    auto f = [](const ZvPoint2<double>& q) {
      return P{static_cast<float>(q.x), static_cast<float>(q.y)};
    };
    for (int i = 0; i < n; ++i)
      path.Curveto(f(c[3 * i]), f(c[3 * i + 1]), i + 1 == n ? e : f(c[3 * i + 2]));
    return true;
  }

  bool Point(P& p, bool relative, std::string& error) {
    if (!Number(p.x, error) || !Number(p.y, error)) return false;
    if (relative) p = p + current;
    return true;
  }

  // One set of arguments of the current command; `first` after the letter itself.
  bool Command(bool first, std::string& error) {
    const bool rel = std::islower(static_cast<unsigned char>(command)) != 0;
    const char c = static_cast<char>(std::toupper(static_cast<unsigned char>(command)));
    P a, b, e;
    // A drawing command right after Z starts a new subpath at the closed one's start.
    if (last == 'Z' && c != 'M' && c != 'Z') path.Moveto(current);
    switch (c) {
      case 'M':
        if (!Point(e, rel, error)) return false;
        if (first) {
          path.Moveto(e);
          start = e;
          command = rel ? 'l' : 'L';  // further pairs are lines
        } else {
          path.Lineto(e);
        }
        break;
      case 'L':
        if (!Point(e, rel, error)) return false;
        path.Lineto(e);
        break;
      case 'H':
        e = current;
        if (!Number(e.x, error)) return false;
        if (rel) e.x += current.x;
        path.Lineto(e);
        break;
      case 'V':
        e = current;
        if (!Number(e.y, error)) return false;
        if (rel) e.y += current.y;
        path.Lineto(e);
        break;
      case 'C':
        if (!Point(a, rel, error) || !Point(b, rel, error) || !Point(e, rel, error)) return false;
        path.Curveto(a, b, e);
        control = b;
        break;
      case 'S':
        a = Reflected('C');
        if (!Point(b, rel, error) || !Point(e, rel, error)) return false;
        path.Curveto(a, b, e);
        control = b;
        break;
      case 'Q':
        if (!Point(a, rel, error) || !Point(e, rel, error)) return false;
        path.Curveto(a, e);
        control = a;
        break;
      case 'T':
        a = Reflected('Q');
        if (!Point(e, rel, error)) return false;
        path.Curveto(a, e);
        control = a;
        break;
      case 'Z':
        if (!first) return Fail("has numbers after Z", error);
        path.CloseSubpath(path.NumPoints() - 1);
        e = start;
        break;
      case 'A':
        if (!Arc(rel, e, error)) return false;
        break;
      default:
        --pos;
        return Fail(std::string("has an unknown command '") + command + "'", error);
    }
    last = c;
    current = e;
    return true;
  }

  // The smooth curves' first control point: the previous one mirrored, if the previous
  // command was of the same family, else the current point.
  P Reflected(char family) const {
    const bool same = family == 'C' ? (last == 'C' || last == 'S') : (last == 'Q' || last == 'T');
    if (!same) return current;
    return P{2 * current.x - control.x, 2 * current.y - control.y};
  }

  const std::string& s;
  ZvPath2f& path;
  std::size_t pos = 0;
  char command = 0;
  char last = 0;
  P current{0, 0};
  P start{0, 0};
  P control{0, 0};
};
}  // namespace

bool ZvParseSvgPath(const std::string& data, ZvPath2f& path, std::string& error) {
  Reader reader(data, path);
  return reader.Run(error);
}
