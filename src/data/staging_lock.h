#ifndef KESTREL_DATA_STAGING_LOCK_H_
#define KESTREL_DATA_STAGING_LOCK_H_

// The exclusive flock(2) on /var/db/timezone/.kestrel-data.lock that one
// staging holds from its checks to its end, and every other kestrel-data
// command that changes the device (set-zone, clean) for as long. The file is
// made by the first taker and stays: removing a lock file races with its
// next taker.
class staging_lock {
 public:
  // Raises std::runtime_error when another command holds the lock, with busy
  // as its text.
  explicit staging_lock(
      const char* busy = "another staging is running; nothing staged");
  ~staging_lock();
  staging_lock(const staging_lock&) = delete;
  staging_lock& operator=(const staging_lock&) = delete;

 private:
  int fd;
};

#endif  // KESTREL_DATA_STAGING_LOCK_H_
