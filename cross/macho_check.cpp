// Checks what the macOS loader checks of a Mach-O library that can be
// checked without a Mac: every dylib it loads is libSystem, and an arm64
// slice carries an ad-hoc code signature whose page hashes are right for the
// whole file before the signature (recomputed with SHA-256, FIPS 180-4).
// Takes a thin Mach-O or a universal file; prints one line per slice and
// exits non-zero on the first fault.
//   macho_check <file>
#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdio>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

namespace {

using Bytes = std::vector<std::uint8_t>;

// --- SHA-256 ---------------------------------------------------------------
constexpr std::uint32_t kRound[64] = {
    0x428a2f98, 0x71374491, 0xb5c0fbcf, 0xe9b5dba5, 0x3956c25b, 0x59f111f1, 0x923f82a4, 0xab1c5ed5,
    0xd807aa98, 0x12835b01, 0x243185be, 0x550c7dc3, 0x72be5d74, 0x80deb1fe, 0x9bdc06a7, 0xc19bf174,
    0xe49b69c1, 0xefbe4786, 0x0fc19dc6, 0x240ca1cc, 0x2de92c6f, 0x4a7484aa, 0x5cb0a9dc, 0x76f988da,
    0x983e5152, 0xa831c66d, 0xb00327c8, 0xbf597fc7, 0xc6e00bf3, 0xd5a79147, 0x06ca6351, 0x14292967,
    0x27b70a85, 0x2e1b2138, 0x4d2c6dfc, 0x53380d13, 0x650a7354, 0x766a0abb, 0x81c2c92e, 0x92722c85,
    0xa2bfe8a1, 0xa81a664b, 0xc24b8b70, 0xc76c51a3, 0xd192e819, 0xd6990624, 0xf40e3585, 0x106aa070,
    0x19a4c116, 0x1e376c08, 0x2748774c, 0x34b0bcb5, 0x391c0cb3, 0x4ed8aa4a, 0x5b9cca4f, 0x682e6ff3,
    0x748f82ee, 0x78a5636f, 0x84c87814, 0x8cc70208, 0x90befffa, 0xa4506ceb, 0xbef9a3f7, 0xc67178f2};

std::uint32_t rotr(std::uint32_t x, int n) { return x >> n | x << (32 - n); }

std::array<std::uint8_t, 32> sha256(const std::uint8_t* data, std::size_t size) {
  std::uint32_t h[8] = {0x6a09e667, 0xbb67ae85, 0x3c6ef372, 0xa54ff53a,
                        0x510e527f, 0x9b05688c, 0x1f83d9ab, 0x5be0cd19};
  Bytes msg(data, data + size);
  msg.push_back(0x80);
  while (msg.size() % 64 != 56) msg.push_back(0);
  const std::uint64_t bits = static_cast<std::uint64_t>(size) * 8;
  for (int i = 7; i >= 0; --i) msg.push_back(static_cast<std::uint8_t>(bits >> (8 * i)));
  for (std::size_t at = 0; at < msg.size(); at += 64) {
    std::uint32_t w[64];
    for (int i = 0; i < 16; ++i) {
      w[i] = std::uint32_t{msg[at + 4 * i]} << 24 | std::uint32_t{msg[at + 4 * i + 1]} << 16 |
             std::uint32_t{msg[at + 4 * i + 2]} << 8 | msg[at + 4 * i + 3];
    }
    for (int i = 16; i < 64; ++i) {
      const std::uint32_t s0 = rotr(w[i - 15], 7) ^ rotr(w[i - 15], 18) ^ (w[i - 15] >> 3);
      const std::uint32_t s1 = rotr(w[i - 2], 17) ^ rotr(w[i - 2], 19) ^ (w[i - 2] >> 10);
      w[i] = w[i - 16] + s0 + w[i - 7] + s1;
    }
    std::uint32_t a = h[0], b = h[1], c = h[2], d = h[3], e = h[4], f = h[5], g = h[6], k = h[7];
    for (int i = 0; i < 64; ++i) {
      const std::uint32_t t1 =
          k + (rotr(e, 6) ^ rotr(e, 11) ^ rotr(e, 25)) + ((e & f) ^ (~e & g)) + kRound[i] + w[i];
      const std::uint32_t t2 =
          (rotr(a, 2) ^ rotr(a, 13) ^ rotr(a, 22)) + ((a & b) ^ (a & c) ^ (b & c));
      k = g, g = f, f = e, e = d + t1, d = c, c = b, b = a, a = t1 + t2;
    }
    h[0] += a, h[1] += b, h[2] += c, h[3] += d, h[4] += e, h[5] += f, h[6] += g, h[7] += k;
  }
  std::array<std::uint8_t, 32> out;
  for (int i = 0; i < 32; ++i) out[i] = static_cast<std::uint8_t>(h[i / 4] >> (24 - 8 * (i % 4)));
  return out;
}

// --- Reading ---------------------------------------------------------------
struct Fault {
  std::string what;
};

std::uint32_t le32(const Bytes& b, std::size_t at) {
  if (at + 4 > b.size()) throw Fault{"read past the end of the file"};
  return b[at] | b[at + 1] << 8 | b[at + 2] << 16 | std::uint32_t{b[at + 3]} << 24;
}
std::uint32_t be32(const Bytes& b, std::size_t at) {
  if (at + 4 > b.size()) throw Fault{"read past the end of the file"};
  return std::uint32_t{b[at]} << 24 | b[at + 1] << 16 | b[at + 2] << 8 | b[at + 3];
}

constexpr std::uint32_t kCpuArm64 = 0x0100000C;
constexpr std::uint32_t kLoadDylib[] = {0x0C, 0x18 | 0x80000000u, 0x1F | 0x80000000u, 0x20,
                                        0x23 | 0x80000000u};
constexpr std::uint32_t kCodeSignature = 0x1D;
constexpr char kSystem[] = "/usr/lib/libSystem.B.dylib";

// Verifies the code signature blob of one slice; returns the page count.
std::size_t check_signature(const Bytes& s, std::size_t dataoff, std::size_t datasize) {
  if (dataoff + datasize != s.size()) throw Fault{"the signature is not at the end of the file"};
  if (be32(s, dataoff) != 0xFADE0CC0) throw Fault{"no embedded signature blob"};
  const std::uint32_t count = be32(s, dataoff + 8);
  std::size_t cd = 0;
  for (std::uint32_t i = 0; i < count; ++i) {
    if (be32(s, dataoff + 12 + 8 * i) == 0) cd = dataoff + be32(s, dataoff + 16 + 8 * i);
  }
  if (cd == 0 || be32(s, cd) != 0xFADE0C02) throw Fault{"no code directory"};
  const std::uint32_t flags = be32(s, cd + 12);
  const std::uint32_t hash_offset = be32(s, cd + 16);
  const std::uint32_t code_slots = be32(s, cd + 28);
  const std::uint32_t code_limit = be32(s, cd + 32);
  const unsigned hash_size = s.at(cd + 36), hash_type = s.at(cd + 37), page_log2 = s.at(cd + 39);
  if ((flags & 0x2) == 0) throw Fault{"the signature is not ad hoc"};
  if (hash_type != 2 || hash_size != 32) throw Fault{"the code directory does not use SHA-256"};
  if (code_limit != dataoff) throw Fault{"the signature does not cover the whole file"};
  const std::size_t page = page_log2 == 0 ? code_limit : std::size_t{1} << page_log2;
  if (code_slots != (code_limit + page - 1) / page) throw Fault{"wrong number of page hashes"};
  for (std::size_t i = 0; i < code_slots; ++i) {
    const std::size_t begin = i * page, end = std::min<std::size_t>(begin + page, code_limit);
    const auto want = sha256(s.data() + begin, end - begin);
    const std::size_t at = cd + hash_offset + i * hash_size;
    if (at + hash_size > s.size() || !std::equal(want.begin(), want.end(), s.begin() + at))
      throw Fault{"page " + std::to_string(i) + " does not match its hash"};
  }
  return code_slots;
}

void check_slice(const Bytes& s, const std::string& label) {
  if (le32(s, 0) != 0xFEEDFACF) throw Fault{label + ": not a 64-bit Mach-O"};
  const std::uint32_t cpu = le32(s, 4), ncmds = le32(s, 16);
  std::size_t at = 32, signature_at = 0, signature_size = 0, dylibs = 0;
  for (std::uint32_t i = 0; i < ncmds; ++i) {
    const std::uint32_t cmd = le32(s, at), size = le32(s, at + 4);
    if (size < 8) throw Fault{label + ": malformed load command"};
    if (std::find(std::begin(kLoadDylib), std::end(kLoadDylib), cmd) != std::end(kLoadDylib)) {
      const std::size_t name = at + le32(s, at + 8);
      std::string path;
      for (std::size_t k = name; k < at + size && s.at(k) != 0; ++k)
        path += static_cast<char>(s[k]);
      if (path != kSystem) throw Fault{label + ": loads " + path + ", not libSystem"};
      ++dylibs;
    }
    if (cmd == kCodeSignature) signature_at = le32(s, at + 8), signature_size = le32(s, at + 12);
    at += size;
  }
  if (dylibs == 0) throw Fault{label + ": loads no libSystem"};
  std::string signed_text = "unsigned";
  if (signature_size != 0) {
    try {
      signed_text = "ad-hoc signature over " +
                    std::to_string(check_signature(s, signature_at, signature_size)) + " pages";
    } catch (const Fault& f) {
      throw Fault{label + ": " + f.what};
    }
  } else if (cpu == kCpuArm64) {
    throw Fault{label + ": arm64 without a code signature"};
  }
  std::printf("%s: loads only libSystem, %s\n", label.c_str(), signed_text.c_str());
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: macho_check <file>\n");
    return 2;
  }
  std::ifstream in(argv[1], std::ios::binary);
  const Bytes file((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  try {
    if (file.size() >= 8 && be32(file, 0) == 0xCAFEBABE) {
      const std::uint32_t count = be32(file, 4);
      for (std::uint32_t i = 0; i < count; ++i) {
        const std::size_t entry = 8 + 20 * i;
        const std::uint32_t cpu = be32(file, entry), offset = be32(file, entry + 8),
                            size = be32(file, entry + 12);
        if (std::size_t{offset} + size > file.size()) throw Fault{"slice past the end of the file"};
        const Bytes slice(file.begin() + offset, file.begin() + offset + size);
        check_slice(slice, cpu == kCpuArm64 ? "arm64 slice" : "x86_64 slice");
      }
    } else {
      check_slice(file, "thin file");
    }
  } catch (const Fault& f) {
    std::fprintf(stderr, "%s: %s\n", argv[1], f.what.c_str());
    return 1;
  }
  return 0;
}
