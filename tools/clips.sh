# shellcheck shell=bash
# Real clips to play, from packages of Debian: speech and picture, five to eight seconds each.

# Fetches what is not there yet into build/clips; fails where there is no network.
fetch_clips() {
  local folder=build/clips
  [ -f "$folder/movie-hello.mp4" ] && [ -f "$folder/movie.mp4" ] && return
  command -v apt-get >/dev/null || return 1
  say "fetching clips"
  rm -rf "$folder/packages" && mkdir -p "$folder/packages" build/logs
  (cd "$folder/packages" && apt-get download forensics-samples-files python3-hug-doc) \
    >build/logs/clips.txt 2>&1 || return 1
  local package
  for package in "$folder"/packages/*.deb; do dpkg-deb -x "$package" "$folder/packages"; done
  find "$folder/packages" -type f \( -name 'movie-hello.*' -o -name movie.mp4 \) \
    -exec mv {} "$folder" \;
  rm -rf "$folder/packages"
  [ -f "$folder/movie-hello.mp4" ]
}
