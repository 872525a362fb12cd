#pragma once

#include <arpa/inet.h>
#include <poll.h>
#include <sys/socket.h>

#include <functional>
#include <list>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "desktop/raii/FileDescriptor.h"

namespace nimbo {

/// An HTTP server of the test's own on 127.0.0.1: each connection brings one request and gets what the handler makes of
/// it, on a thread of its own.
class LoopbackServer {
 public:
  /// What goes back, byte for byte.
  struct Answer {
    std::string bytes;
    bool isEndless = false;  ///< again and again, until the client has enough
    bool isSlow = false;     ///< each byte after a look whether the client has had enough
  };
  using Handler = std::function<Answer(const std::string& request)>;

  explicit LoopbackServer(Handler handler)
      : _handler(std::move(handler)), _socket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t size = sizeof address;
    auto* plain = reinterpret_cast<sockaddr*>(&address);
    if (::bind(_socket.get(), plain, size) != 0 || ::listen(_socket.get(), 16) != 0 ||
        ::getsockname(_socket.get(), plain, &size) != 0)
      throw std::runtime_error("no loopback server");
    _port = ntohs(address.sin_port);
    _accepting = std::thread([this] { acceptAll(); });
  }

  /// Hands connections over as they come, which then are no requests. Before the first of them.
  void speakTLS(std::function<void(int connection)> serve) { _tls = std::move(serve); }

  /// Lets each answer that is on its way end first.
  ~LoopbackServer() {
    ::shutdown(_socket.get(), SHUT_RDWR);
    _accepting.join();
    for (std::thread& thread : _connections) thread.join();
  }

  std::string address(const std::string& path = "/") const {
    return "http://127.0.0.1:" + std::to_string(_port) + path;
  }
  std::vector<std::string> requests() const {
    const std::lock_guard guard(_lock);
    return _requests;
  }

  static std::string answer(const std::string& head, const std::string& body) {
    return "HTTP/1.1 " + head + "\r\nContent-Length: " + std::to_string(body.size()) + "\r\nConnection: close\r\n\r\n" +
           body;
  }

 private:
  void acceptAll() {
    for (;;) {
      const int connection = ::accept4(_socket.get(), nullptr, nullptr, SOCK_CLOEXEC);
      if (connection < 0) return;
      _connections.emplace_back([this, connection] { serve(FileDescriptor(connection)); });
    }
  }

  void serve(const FileDescriptor& connection) {
    if (_tls) return _tls(connection.get());
    std::string request;
    char buffer[4096];
    while (request.find("\r\n\r\n") == std::string::npos && !request.starts_with('\x16')) {  // or TLS begins
      const ssize_t count = ::recv(connection.get(), buffer, sizeof buffer, 0);
      if (count <= 0) return;
      request.append(buffer, static_cast<std::size_t>(count));
    }
    {
      const std::lock_guard guard(_lock);
      _requests.push_back(request);
    }
    const Answer answer = _handler(request);
    bool isTaken = true;
    pollfd client{connection.get(), POLLIN, 0};
    do {
      for (std::size_t sent = 0; isTaken && sent < answer.bytes.size();) {
        if (answer.isSlow && ::poll(&client, 1, 20) != 0) return;
        const std::size_t piece = answer.isSlow ? 1 : answer.bytes.size() - sent;
        const ssize_t count = ::send(connection.get(), answer.bytes.data() + sent, piece, MSG_NOSIGNAL);
        isTaken = count > 0;
        sent += isTaken ? static_cast<std::size_t>(count) : 0;
      }
    } while (isTaken && answer.isEndless);
    ::shutdown(connection.get(), SHUT_WR);
    while (::recv(connection.get(), buffer, sizeof buffer, 0) > 0) {  // until the client closes: nothing is reset
    }
  }

  Handler _handler;
  std::function<void(int)> _tls;
  FileDescriptor _socket;
  std::uint16_t _port = 0;
  mutable std::mutex _lock;
  std::vector<std::string> _requests;
  std::list<std::thread> _connections;  // of the accepting thread, then of the destructor
  std::thread _accepting;
};

}  // namespace nimbo
