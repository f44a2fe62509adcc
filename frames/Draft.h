// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <android-base/unique_fd.h>
#include <sys/stat.h>
#include <sys/types.h>

#include <optional>
#include <string>

namespace pemaro::frames {

/// A new file beside the one whose place it takes when it is complete: so the old one stays what it was
/// until then, and for good when there is no end.
class Draft {
  public:
    Draft() = default;
    /// Takes back a file that has not taken its place.
    ~Draft() { drop(); }
    Draft(const Draft&) = delete;
    Draft& operator=(const Draft&) = delete;

    /// Makes one under a name that no other has; beside what a link leads to, not beside the link. `old`
    /// is what is there, or null: the new one has its owner, and is for nobody else to read before it is
    /// complete. False, with errno, where there can be none: EPERM where the owner could not be kept.
    bool open(const std::string& path, const struct stat* old);

    /// To write it, and to read it again.
    const android::base::unique_fd& fd() const { return mFd; }

    /// Puts it in its place, with the old one's permissions. What is to be lost is replaced by what is on
    /// the disk; where nothing is lost, that can wait. False, with errno, and then it is still beside.
    bool commit();

    /// Closes it; false, with errno, when something did not reach the file.
    bool close();

    /// Takes it back.
    void drop();

  private:
    std::string mTarget;  ///< without links
    std::string mPath;    ///< empty when it is not beside
    android::base::unique_fd mFd;
    std::optional<mode_t> mMode;
};

}  // namespace pemaro::frames
