# What the makers of example streams share; sourced, with the companion program as $velta.

# frame HEX: a frame around the bytes of a payload.
frame() {
  local hex crc=0 i bit
  hex=d3$(printf '%04x' $((${#1} / 2)))$1
  for ((i = 0; i < ${#hex}; i += 2)); do
    crc=$((crc ^ 16#${hex:i:2} << 16))
    for ((bit = 0; bit < 8; ++bit)); do
      crc=$((crc << 1))
      if ((crc & 0x1000000)); then crc=$((crc ^ 0x1864cfb)); fi  # CRC-24Q
    done
  done
  printf "$(sed 's/../\\x&/g' <<<"$hex$(printf '%06x' "$crc")")"
}

hex() {
  od -An -v -tx1 | tr -d ' \n'
}

# A JSON line as a frame.
frame_of() {
  "$velta" encode -
}

# A JSON line as a frame without the last byte of its payload.
cut_frame_of() {
  local bytes
  bytes=$(frame_of | hex)
  bytes=${bytes:6:-6}
  frame "${bytes%??}"
}

text() {  # a 1029
  frame "405000ea60$(printf '%06x%02x' "${#1}" "${#1}")$(printf '%s' "$1" | hex)"
}
