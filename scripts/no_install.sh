# Sourced by the scripts that install packages: takes --no-install out of their arguments. Then what is missing is named, and the
# script ends.
for argument in "$@"; do
    shift
    if [ "$argument" = --no-install ]; then
        export TARN_NO_INSTALL=1
    else
        set -- "$@" "$argument"
    fi
done
