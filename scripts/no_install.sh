# Sourced by scripts that install packages: removes --no-install from their arguments. With that option, missing
# packages are printed and the script fails.
for argument in "$@"; do
    shift
    if [ "$argument" = --no-install ]; then
        export TARN_NO_INSTALL=1
    else
        set -- "$@" "$argument"
    fi
done
