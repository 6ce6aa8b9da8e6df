#!/bin/sh
# The options of all scripts: with --no-install, a script prints the names of missing packages, installs nothing, and
# exits with 1; --help prints its first comment and runs nothing. Other arguments are not changed. Every script of the
# project that builds or installs answers --help at once.
#
#     check_options.sh SCRIPTS
set -eu

folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
cp "$1/need" "$1/options.sh" "$folder"
echo "nothing: tarn-has-no-such-package" > "$folder/packages.txt"
cat > "$folder/script" <<'END'
#!/bin/sh
# Does nothing.
#
#     script --now
set -eu
# Not part of the help.
. "$(dirname "$0")/options.sh"
printf '<%s>' "$@"
"$(dirname "$0")/need" nothing
END
chmod +x "$folder/script"
[ "$("$folder/script" "a b" --help --no-install)" = "Does nothing.

    script --now" ]

for script in "$1"/*; do
    case $(basename "$script") in
    # These are for the others, and have no options.
    *.sh | *.txt | foreign_headers | help | later_boost | need | version) continue ;;
    esac
    name=scripts/$(basename "$script")
    timeout 10 "$script" --help > "$folder/help" || { echo "$name --help fails"; exit 1; }
    grep -q "$name" "$folder/help" || { echo "$name --help does not say how to call it"; exit 1; }
done

status=0
"$folder/script" "a b" --no-install "" > "$folder/output" 2> "$folder/errors" || status=$?
command -v dpkg-query > /dev/null || exit 0  # Other systems have other packages.
[ $status = 1 ]
[ "$(cat "$folder/output")" = "<a b><>" ]
[ "$(cat "$folder/errors")" = "missing Debian packages: tarn-has-no-such-package" ]
