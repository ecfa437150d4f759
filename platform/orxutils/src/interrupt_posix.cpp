#include <csignal>
#include <thread>
#include <utility>

#include "orxutils/interrupt.h"

namespace orx {

void OnInterrupt(std::function<void()> work) {
  sigset_t awaited;
  sigemptyset(&awaited);
  for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
    struct sigaction action = {};
    sigaction(signal, nullptr, &action);
    if (action.sa_handler != SIG_IGN) sigaddset(&awaited, signal);
  }
  // Blocked in every thread, so that one can wait for them.
  pthread_sigmask(SIG_BLOCK, &awaited, nullptr);
  std::thread([awaited, work = std::move(work)] {
    int signal = 0;
    if (sigwait(&awaited, &signal) != 0) return;
    pthread_sigmask(SIG_UNBLOCK, &awaited, nullptr);
    work();
  }).detach();
}

}  // namespace orx
