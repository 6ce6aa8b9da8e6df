#!/bin/sh
# With --no-install, a script prints the names of missing packages, installs nothing, and exits with 1; its other
# arguments are not changed.
#
#     check_no_install.sh SCRIPTS
set -eu

folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
cp "$1/need" "$1/no_install.sh" "$folder"
echo "nothing: tarn-has-no-such-package" > "$folder/packages.txt"
cat > "$folder/script" <<'END'
#!/bin/sh
set -eu
. "$(dirname "$0")/no_install.sh"
printf '<%s>' "$@"
"$(dirname "$0")/need" nothing
END
chmod +x "$folder/script"
status=0
"$folder/script" "a b" --no-install "" > "$folder/output" 2> "$folder/errors" || status=$?
command -v dpkg-query > /dev/null || exit 0  # Other systems have other packages.
[ $status = 1 ]
[ "$(cat "$folder/output")" = "<a b><>" ]
[ "$(cat "$folder/errors")" = "missing Debian packages: tarn-has-no-such-package" ]
