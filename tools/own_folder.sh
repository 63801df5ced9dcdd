# For scripts that make a folder anew, as root perhaps: nothing but what they made themselves is erased.
#
#   make_own_folder FOLDER MARK   leaves an empty FOLDER with the file MARK in it; fails, with FOLDER
#                                 untouched, when something stands there that is neither empty nor bears
#                                 the mark
make_own_folder() {
  local folder=$1 mark=$2
  if [ -L "$folder" ] || { [ -e "$folder" ] && [ ! -d "$folder" ]; }; then
    echo "$folder is no folder; it is left alone" >&2
    return 1
  fi
  if [ -d "$folder" ] && [ ! -f "$folder/$mark" ] && [ -n "$(ls -A "$folder")" ]; then
    echo "$folder has files in it and no $mark, so it is left alone; choose another folder" >&2
    return 1
  fi
  rm -rf --one-file-system "$folder"
  mkdir -p "$folder"
  touch "$folder/$mark"
}
