// ZvMipP2fP1dAgent: evaluation and editing of a shared mip path.
//
// Every operation takes the agent's lock, then the sequence's, and holds both to its end. The
// order never varies, so agents on several threads cannot deadlock on one sequence.
#include <zv/transfo4.h>

#include <cmath>

#include "core/scoped_lock.h"
#include "shape/mip_path_impl.h"

namespace {

// Both locks for the span of an operation, agent first, and the keys they guard.
struct AgentScope {
  AgentScope(ZvCriticalSection& agentLock, const ZvMipP2fP1dAgentData& data)
      : agent(agentLock), sequence(data.SequenceLock()), keys(data.Keys()) {}
  ZvScopedLock agent;
  ZvScopedLock sequence;
  ZvMipPath2fProp1dImpl& keys;
};

ZvPath2fProp1d& EvalVisible(ZvMipP2fP1dAgentData& data, const ZvMipPath2fProp1dImpl& keys, double t,
                            unsigned int begin, unsigned int end, double spacing,
                            double tolerance) {
  data.result = ZvPath2fProp1d(1);
  if (begin < end) keys.EvalInto(t, begin, end, spacing, tolerance, data.result);
  return data.result;
}

}  // namespace

ZvMipP2fP1dAgent::ZvMipP2fP1dAgent(ZvMipPath2fProp1d& mipPath)
    : data(new ZvMipP2fP1dAgentData(mipPath)) {}

ZvMipP2fP1dAgent::~ZvMipP2fP1dAgent() {
  delete data;
}

ZvPath2fProp1d& ZvMipP2fP1dAgent::Eval(double t, double spacing, double tolerance) {
  AgentScope scope(cs, *data);
  return EvalVisible(*data, scope.keys, t, 0, scope.keys.keys.size, spacing, tolerance);
}

ZvPath2fProp1d& ZvMipP2fP1dAgent::EvalInInterval(double t, double from, double to, int includeFrom,
                                                 int includeTo, double spacing, double tolerance) {
  AgentScope scope(cs, *data);
  unsigned int begin = 0, end = 0;
  scope.keys.GetIntervalRange(from, to, includeFrom, includeTo, begin, end);
  return EvalVisible(*data, scope.keys, t, begin, end, spacing, tolerance);
}

int ZvMipP2fP1dAgent::CreateKey(double t, const ZvPath2fProp1d& path) {
  // A parameter that is not finite has no place in the order.
  if (!std::isfinite(t)) return 0;
  AgentScope scope(cs, *data);
  int exact = 0;
  const unsigned int above = scope.keys.LocateParameter(t, exact);
  if (exact)
    scope.keys.ReplaceKeyPath(above - 1, path);
  else
    scope.keys.InsertKey(above, t, path);
  return 1;
}

int ZvMipP2fP1dAgent::CreateKeyFromEvaluation(double t) {
  AgentScope scope(cs, *data);
  if (data->result.NumPoints() == 0) return 0;
  return CreateKey(t, data->result);
}

int ZvMipP2fP1dAgent::MergeAndCreateKey(double t, double from, double to,
                                        const ZvPath2fProp1d& path, int includeFrom,
                                        int includeTo) {
  if (!std::isfinite(t)) return 0;
  AgentScope scope(cs, *data);
  ZvMipPath2fProp1dImpl& s = scope.keys;
  unsigned int begin = 0, end = 0;
  s.GetIntervalRange(from, to, includeFrom, includeTo, begin, end);
  // The new key must fall strictly between the keys kept on either side.
  const double same = ZvMipPath2fProp1dImpl::kSameParameter;
  if (begin > end) return 0;
  if (begin > 0 && !(t - s.keys[begin - 1].parameter > same)) return 0;
  if (end < s.keys.size && !(s.keys[end].parameter - t > same)) return 0;
  MPKey key;
  key.parameter = t;
  key.path = const_cast<ZvPath2fProp1d*>(&path);  // only copied
  return s.RemoveBodyAndCreateKeyBetweenExistingKeys(key, begin - 1, end);
}

int ZvMipP2fP1dAgent::RemoveKey(double t, double tolerance) {
  AgentScope scope(cs, *data);
  ZvMipPath2fProp1dImpl& s = scope.keys;
  if (s.keys.size == 0) return 1;
  unsigned int first = 0, last = 0;
  if (!s.GetKeyIndicesInInterval(t - tolerance, t + tolerance, first, last)) return 0;
  unsigned int nearest = first;
  for (unsigned int i = first + 1; i <= last; ++i) {
    if (std::fabs(t - s.keys[i].parameter) < std::fabs(t - s.keys[nearest].parameter)) nearest = i;
  }
  s.RemoveKeys(nearest, nearest + 1);
  return 1;
}

int ZvMipP2fP1dAgent::RemoveKeys(double from, double to, int includeFrom, int includeTo) {
  AgentScope scope(cs, *data);
  ZvMipPath2fProp1dImpl& s = scope.keys;
  if (s.keys.size == 0) return 1;
  unsigned int begin = 0, end = 0;
  s.GetIntervalRange(from, to, includeFrom, includeTo, begin, end);
  if (begin >= end) return 0;
  s.RemoveKeys(begin, end);
  return 1;
}

int ZvMipP2fP1dAgent::ShiftKeyParameters(double d) {
  AgentScope scope(cs, *data);
  for (unsigned int i = 0; i < scope.keys.keys.size; ++i)
    scope.keys.keys[i].parameter += d;
  return 1;
}

int ZvMipP2fP1dAgent::ScaleKeyParameterAxis(double s) {
  AgentScope scope(cs, *data);
  for (unsigned int i = 0; i < scope.keys.keys.size; ++i)
    scope.keys.keys[i].parameter *= s;
  return 1;
}

int ZvMipP2fP1dAgent::Transform(const ZvTransfo4& transform) {
  AgentScope scope(cs, *data);
  for (unsigned int i = 0; i < scope.keys.keys.size; ++i)
    scope.keys.keys[i].path->Transform(transform);
  return 1;
}
