#pragma once

#include <string>
#include <vector>

namespace obd {

// Texts of service 09 are filled up with zero bytes, in front, behind or, by some modules, in the middle. What remains
// is taken as it stands and may hold any byte.

// Without the zero bytes at both ends.
std::string trimmedText(std::vector<unsigned char> const& bytes);

// Without any zero byte.
std::string compactText(std::vector<unsigned char> const& bytes);

// Each byte as two upper-case hexadecimal digits.
std::string hexText(std::vector<unsigned char> const& bytes);

// `count` bytes from `offset` on, which must be there.
std::vector<unsigned char> slice(std::vector<unsigned char> const& bytes, std::size_t offset, std::size_t count);

} // namespace obd
