#include "host/notices/Bus.h"

#include <algorithm>
#include <cstdint>
#include <system_error>
#include <utility>

#include "host/notices/NoticeError.h"
#include "platform/SerialQueue.h"

namespace nimbo {

int busResult(int result) {
  if (result < 0) throw std::system_error(-result, std::generic_category(), "sd-bus");
  return result;
}

struct Bus::Source {
  GSource base;
  Bus* bus;

  static Bus& busOf(GSource* source) { return *reinterpret_cast<Source*>(source)->bus; }
};

Outcome<std::unique_ptr<Bus>> Bus::open() {
  sd_bus* opened = nullptr;
  if (const int result = sd_bus_open_user(&opened); result < 0)
    return noticeError(NoticeError::noBus, std::generic_category().message(-result));
  return std::unique_ptr<Bus>(new Bus(BusHandle(opened)));
}

Bus::Bus(BusHandle bus) : _bus(std::move(bus)) {
  static GSourceFuncs functions{
      [](GSource* source, gint* timeout) -> gboolean { return Source::busOf(source).prepare(timeout); },
      [](GSource* source) -> gboolean { return Source::busOf(source).isReady(); },
      [](GSource* source, GSourceFunc, gpointer) -> gboolean {
        Source::busOf(source).work();
        return G_SOURCE_CONTINUE;
      },
      nullptr,
      nullptr,
      nullptr};
  _source = g_source_new(&functions, sizeof(Source));
  reinterpret_cast<Source*>(_source)->bus = this;
  g_source_attach(_source, nullptr);
}

Bus::~Bus() {
  _ended = nullptr;
  end();
}

void Bus::end() {
  if (!_source) return;
  g_source_destroy(_source);
  g_source_unref(std::exchange(_source, nullptr));
  if (const auto ended = std::exchange(_ended, nullptr)) runGuarded("end of the bus", ended);
}

bool Bus::prepare(int* timeout) {
  const int events = sd_bus_get_events(_bus.get()), fd = sd_bus_get_fd(_bus.get());
  if (events < 0 || fd < 0) return true;  // its end
  if (fd != std::exchange(_fd, fd)) {
    // The bus of the second address, where the first did not answer.
    if (_descriptor) g_source_remove_unix_fd(_source, _descriptor);
    _descriptor = g_source_add_unix_fd(_source, fd, static_cast<GIOCondition>(events));
  } else {
    g_source_modify_unix_fd(_source, _descriptor, static_cast<GIOCondition>(events));
  }
  std::uint64_t due = UINT64_MAX;  // microseconds of the monotonic clock
  if (sd_bus_get_timeout(_bus.get(), &due) <= 0 || due == UINT64_MAX) return false;
  const auto now = static_cast<std::uint64_t>(g_get_monotonic_time());
  constexpr std::uint64_t kMillisecond = 1000, kLongest = 60'000;
  *timeout = due <= now ? 0 : static_cast<int>(std::min((due - now) / kMillisecond + 1, kLongest));
  return *timeout == 0;
}

bool Bus::isReady() const { return _descriptor && g_source_query_unix_fd(_source, _descriptor) != 0; }

void Bus::work() {
  // One message, or one step of the connection. Where there is more, `prepare` says so.
  if (sd_bus_process(_bus.get(), nullptr) >= 0 && sd_bus_get_events(_bus.get()) >= 0) return;
  for (auto calls = std::exchange(_calls, {}); const Call& call : calls)
    runGuarded("answer of the bus", [&] { call.answer(nullptr); });
  end();
}

BusMessageHandle Bus::newCall(const char* destination, const char* path, const char* interface,
                              const char* member) const {
  sd_bus_message* message = nullptr;
  busResult(sd_bus_message_new_method_call(_bus.get(), &message, destination, path, interface, member));
  return BusMessageHandle(message);
}

int Bus::takeAnswer(sd_bus_message* message, void* data, sd_bus_error*) {
  auto& calls = static_cast<Call*>(data)->bus->_calls;
  const auto call = std::ranges::find(calls, data, [](const Call& each) -> const void* { return &each; });
  const Answer answer = std::move(call->answer);
  calls.erase(call);
  runGuarded("answer of the bus", [&] { answer(message); });
  return 0;
}

void Bus::call(const BusMessageHandle& message, Answer answer) {
  Call& call = _calls.emplace_back(Call{this, std::move(answer), nullptr});
  sd_bus_slot* slot = nullptr;
  // Without a limit of the library's: that stands still while a bus that says nothing is being connected to.
  const int result = sd_bus_call_async(_bus.get(), &slot, message.get(), takeAnswer, &call, UINT64_MAX);
  call.slot.reset(slot);
  // A bus that has gone ends its calls itself.
  if (result < 0 && result != -ENOTCONN && result != -ECONNRESET) {
    _calls.pop_back();
    busResult(result);
  }
}

void Bus::listen(const char* rule, Listener listener) {
  const auto hear = [](sd_bus_message* message, void* data, sd_bus_error*) {
    runGuarded("signal of the bus", [&] { (*static_cast<Listener*>(data))(message); });
    return 0;
  };
  sd_bus_slot* slot = nullptr;
  busResult(
      sd_bus_add_match_async(_bus.get(), &slot, rule, hear, nullptr, &_listeners.emplace_back(std::move(listener))));
  _listening.emplace_back(slot);
}

}  // namespace nimbo
