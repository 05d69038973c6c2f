#pragma once

// The key of encoded passwords.

struct aes_key_data;

namespace cfg32::tool {

struct settings;

/// The key that --key-file names, if it does, for as long as the object lives.
class key {
  public:
    explicit key(const settings& options);
    key(const key&) = delete;
    key& operator=(const key&) = delete;
    ~key();

    aes_key_data* get() const { return data_; }

  private:
    aes_key_data* data_ = nullptr;
};

}  // namespace cfg32::tool
